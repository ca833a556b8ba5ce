// SPDX-License-Identifier: Apache-2.0
//
// Which window this build has: window.cpp or no_window.cpp is linked into the program.
#pragma once

#include "app/viewer.h"

namespace probeview {

// The program's name must live as long as the window.
MakeWindow windowMaker(char** argv);

}  // namespace probeview
