// SPDX-License-Identifier: Apache-2.0
#include "tools/subcommand.h"

#include "tools/config_command.h"
#include "tools/decode_command.h"
#include "tools/metrics_command.h"
#include "tools/names.h"
#include "tools/pages_command.h"
#include "tools/query_command.h"
#include "tools/status_command.h"
#include "tools/store_command.h"
#include "tools/watch_command.h"

namespace probeview {

namespace {

// One line for each file; nothing else knows which subcommands there are.
constexpr AddSubcommand subcommands[] = {
    addStatusCommand, addWatchCommand,  addPagesCommand, addQueryCommand, addMetricsCommand,
    addConfigCommand, addDecodeCommand, addStoreCommand, addNamesCommand,
};

}  // namespace

void addSubcommands(Command program, Tool& tool) {
  for (const AddSubcommand add : subcommands) add(program, tool);
}

}  // namespace probeview
