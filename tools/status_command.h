// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/subcommand.h"

namespace probeview {

// probectl status: sources, clients, rates, losses.
void addStatusCommand(CLI::App& program, Tool& tool);

}  // namespace probeview
