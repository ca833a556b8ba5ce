// SPDX-License-Identifier: Apache-2.0
//
// How a road is measured: a class whose run(turns) sends the mixed stream so often and says how many events that were.
#pragma once

#include <valgrind/callgrind.h>

#include <cstdio>

#include "bench/allocations.h"
#include "bench/road/processor_time.h"

namespace probeview::bench {

// Prints the events a second of each round as a JSON list.
template <typename Road>
void printRates(Road& road, int rounds) {
  constexpr int turns = 500;
  road.run(1);
  std::printf("[");
  for (int round = 0; round < rounds; ++round) {
    const double begin = threadSeconds();
    const auto events = static_cast<double>(road.run(turns));
    std::printf("%s%.0f", round == 0 ? "" : ", ", events / (threadSeconds() - begin));
  }
  std::printf("]");
}

// Dumps callgrind's counts of some turns, and prints how many events those were and what each allocated.
template <typename Road>
void countInstructions(Road& road) {
  constexpr int turns = 50;
  road.run(2);
  const std::size_t before = allocationCount();
  CALLGRIND_TOGGLE_COLLECT;
  const std::size_t events = road.run(turns);
  CALLGRIND_TOGGLE_COLLECT;
  CALLGRIND_DUMP_STATS_AT("road");
  const auto allocations = static_cast<double>(allocationCount() - before);
  std::printf("road\t%zu\t%.4f\n", events, allocations / static_cast<double>(events));
}

}  // namespace probeview::bench
