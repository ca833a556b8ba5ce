// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <iosfwd>

#include "tools/subcommand.h"
#include "values/dictionary.h"

namespace probeview {

// probectl status: sources, clients, rates, losses.
void addStatusCommand(Command program, Tool& tool);

// The report for a person, whatever the service has answered.
void showReport(const Dictionary& report, std::ostream& output);

}  // namespace probeview
