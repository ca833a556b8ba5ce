// SPDX-License-Identifier: Apache-2.0
#include "tools/subcommand.h"

namespace probeview {

namespace {

// One line for each file; nothing else knows which subcommands there are.
constexpr AddSubcommand subcommands[] = {
    nullptr,
};

}  // namespace

void addSubcommands(CLI::App& program, Tool& tool) {
  for (const AddSubcommand add : subcommands) {
    if (add != nullptr) add(program, tool);
  }
}

}  // namespace probeview
