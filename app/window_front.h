// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>

#include "ui/front.h"

namespace probeview {

// Whether this build has a window.
extern const bool hasWindowFront;

// The window, or null with the reason. See ui/qt/window.h.
std::unique_ptr<Front> makeWindowFront(int& argc, char** argv, std::string& error);

}  // namespace probeview
