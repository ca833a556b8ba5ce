// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <ostream>
#include <string_view>

namespace probeview::bench {

// Measures everything in one run, cases interleaved in random order, and writes the tables (Markdown).
void measureAll(int rounds, std::ostream& out);

// Under callgrind (started with --collect-atstart=no): instructions of each case, one dump per case, named
// "task/contender/set"; also allocations per message on standard output.
void countInstructions(std::ostream& out);

}  // namespace probeview::bench
