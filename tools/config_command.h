// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/subcommand.h"

namespace probeview {

// probectl config: the service's base configuration.
void addConfigCommand(Command program, Tool& tool);

}  // namespace probeview
