// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/subcommand.h"

namespace probeview {

// probectl decode: payloads by hand, one for a person or many for a program.
void addDecodeCommand(Command program, Tool& tool);

}  // namespace probeview
