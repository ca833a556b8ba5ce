// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/subcommand.h"

namespace probeview {

// probectl query: one metric, now.
void addQueryCommand(Command program, Tool& tool);

}  // namespace probeview
