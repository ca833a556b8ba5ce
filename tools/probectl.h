// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <iosfwd>
#include <span>
#include <string>

#include "tools/subcommand.h"

namespace probeview {

// The whole program but for its process: understands the command line (without the program's name), runs the
// subcommand and returns the exit status.
int runProbectl(std::span<const std::string> arguments, std::istream& input, std::ostream& output,
                std::ostream& errors);

// The command line's grammar alone, for the help, the shell completion and the check of the manual page.
CommandLine makeProbectlGrammar(Tool& tool);

}  // namespace probeview
