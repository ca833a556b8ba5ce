// SPDX-License-Identifier: Apache-2.0
//
// The names that a command line may use, and what to say of one that nobody knows.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "tools/subcommand.h"

namespace probeview {

// In the order of the registry. The views live as long as the process.
std::vector<std::string_view> metricNames();
std::vector<std::string_view> classNames();

// Why a text names no metric, with the names that are near.
std::string unknownMetric(std::string_view text);

// probectl names: metrics, classes or pages, one a line, for the completion of command lines.
void addNamesCommand(Command program, Tool& tool);

}  // namespace probeview
