// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/subcommand.h"

namespace probeview {

// probectl metrics: what each metric is, and what its fields mean. Asks no service.
void addMetricsCommand(Command program, Tool& tool);

}  // namespace probeview
