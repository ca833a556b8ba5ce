// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/subcommand.h"

namespace probeview {

// probectl pages: the viewer's pages as text, live in a terminal.
void addPagesCommand(Command program, Tool& tool);

}  // namespace probeview
