// SPDX-License-Identifier: Apache-2.0
#include "bench/count.h"

#include <valgrind/callgrind.h>

#include "bench/allocations.h"

namespace probeview::bench {

std::string_view nameOf(Task task) {
  switch (task) {
    case Task::Decode:
      return "decode";
    case Task::Encode:
      return "encode";
    case Task::Print:
      return "print";
  }
  return {};
}

double allocationsOf(Case& test, const PayloadSet& set) {
  constexpr std::size_t repetitions = 100;
  test.run();
  const std::size_t before = allocationCount();
  for (std::size_t index = 0; index < repetitions; ++index) test.run();
  return static_cast<double>(allocationCount() - before) / static_cast<double>(repetitions * set.payloads.size());
}

void countCase(const Contender& contender, const PayloadSet& set, std::ostream& out) {
  constexpr std::size_t repetitions = 50;
  const std::unique_ptr<Case> test = contender.make(set);
  const double allocations = allocationsOf(*test, set);
  CALLGRIND_TOGGLE_COLLECT;
  for (std::size_t index = 0; index < repetitions; ++index) test->run();
  CALLGRIND_TOGGLE_COLLECT;
  const std::string name = std::string(nameOf(contender.task)) + "/" + std::string(contender.name) + "/" + set.name;
  CALLGRIND_DUMP_STATS_AT(name.c_str());
  out << name << "\t" << repetitions * set.payloads.size() << "\t" << allocations << "\n";
}

}  // namespace probeview::bench
