// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <ostream>
#include <string_view>

namespace probeview::bench {

// Measures everything in one run, cases interleaved in random order, and writes the tables (Markdown) and the same as
// figures, one a line and separated by tabs:
//   time   task  contender  set                   ns per message (median), allocations per message
//   ratio  task  peer       set or "mean" (a to f)  how many times longer than ours: minimum, median, maximum
void measureAll(int rounds, std::ostream& out, std::ostream& figures);

// countCase() for every contender and set.
void countInstructions(std::ostream& out);

}  // namespace probeview::bench
