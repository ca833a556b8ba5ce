// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/subcommand.h"

namespace probeview {

// probectl store --batch: one store fed by hand, without a service; its answers are JSON.
void addStoreCommand(Command program, Tool& tool);

}  // namespace probeview
