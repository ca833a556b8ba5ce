// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/subcommand.h"

namespace probeview {

// probectl watch: every metric as it arrives.
void addWatchCommand(Command program, Tool& tool);

}  // namespace probeview
