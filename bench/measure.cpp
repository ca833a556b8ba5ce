// SPDX-License-Identifier: Apache-2.0
#include "bench/measure.h"

#include <valgrind/callgrind.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <ctime>
#include <iomanip>
#include <map>
#include <random>
#include <sstream>

#include "bench/allocations.h"
#include "bench/case.h"

namespace probeview::bench {

std::vector<Contender> allContenders() {
  std::vector<Contender> all;
  for (auto part : {ourContenders, libprotobufContenders, protozeroContenders, nanopbContenders}) {
    const std::vector<Contender> contenders = part();
    all.insert(all.end(), contenders.begin(), contenders.end());
  }
  return all;
}

namespace {

constexpr std::array tasks = {Task::Decode, Task::Encode, Task::Print};
constexpr std::string_view ours = "ours";

std::string_view nameOf(Task task) {
  switch (task) {
    case Task::Decode:
      return "decode";
    case Task::Encode:
      return "encode";
    case Task::Print:
      return "payload → dictionary → printed line";
  }
  return {};
}

struct Measured {
  Contender contender;
  const PayloadSet* set;
  std::unique_ptr<Case> test;
  std::size_t repetitions = 1;
  std::vector<double> times;  // ns per message, one per round
  double allocations = 0;     // per message
};

// Processor time of this thread: who else uses the machine does not count.
double processorTime() {
  timespec time{};
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
  return static_cast<double>(time.tv_sec) * 1e9 + static_cast<double>(time.tv_nsec);
}

// At a random depth of the stack: where a message lies relative to its payload makes a difference of a third, which
// must not depend on the luck of one run.
[[gnu::noinline]] double timeOnce(Measured& measured, std::size_t depth) {
  keep(*static_cast<char*>(__builtin_alloca(depth)));
  const double begin = processorTime();
  for (std::size_t index = 0; index < measured.repetitions; ++index) measured.test->run();
  const double time = processorTime() - begin;
  return time / static_cast<double>(measured.repetitions * measured.set->payloads.size());
}

double allocationsOf(Case& test, const PayloadSet& set) {
  constexpr std::size_t repetitions = 100;
  test.run();
  const std::size_t before = allocationCount();
  for (std::size_t index = 0; index < repetitions; ++index) test.run();
  return static_cast<double>(allocationCount() - before) / static_cast<double>(repetitions * set.payloads.size());
}

double median(std::vector<double> values) {
  std::nth_element(values.begin(), values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2), values.end());
  return values[values.size() / 2];
}

std::string number(double value, int digits) {
  std::ostringstream text;
  text << std::fixed << std::setprecision(digits) << value;
  return text.str();
}

struct Ratio {
  double minimum;
  double median;
  double maximum;
};

// Peer over ours, round by round: what disturbs the machine disturbs both.
Ratio ratioOf(const Measured& peer, const Measured& own) {
  std::vector<double> ratios;
  for (std::size_t round = 0; round < own.times.size(); ++round) ratios.push_back(peer.times[round] / own.times[round]);
  return {*std::min_element(ratios.begin(), ratios.end()), median(ratios),
          *std::max_element(ratios.begin(), ratios.end())};
}

using Table = std::map<std::pair<std::string_view, std::string_view>, const Measured*>;  // contender, set

void writeTask(Task task, const std::vector<Measured>& all, std::ostream& out) {
  Table table;
  std::vector<std::string_view> contenders;
  for (const Measured& measured : all) {
    if (measured.contender.task != task) continue;
    table[{measured.contender.name, measured.set->name}] = &measured;
    if (std::find(contenders.begin(), contenders.end(), measured.contender.name) == contenders.end()) {
      contenders.push_back(measured.contender.name);
    }
  }
  out << "\n## " << nameOf(task)
      << "\n\nTime per message in ns, median of all rounds; in brackets the allocations.\n\n| |";
  for (const PayloadSet& set : payloadSets()) out << " " << set.name << " |";
  out << "\n|---|";
  for (std::size_t index = 0; index < payloadSets().size(); ++index) out << "---:|";
  out << "\n";
  for (const std::string_view contender : contenders) {
    out << "| " << contender << " |";
    for (const PayloadSet& set : payloadSets()) {
      const Measured& measured = *table.at({contender, set.name});
      out << " " << number(median(measured.times), 0) << " (" << number(measured.allocations, 1) << ") |";
    }
    out << "\n";
  }
  out << "\nHow many times the peer takes longer than ours: minimum, **median** and maximum over the rounds.\n\n| |";
  for (const PayloadSet& set : payloadSets()) out << " " << set.name << " |";
  out << " geometric mean a to f |\n|---|";
  for (std::size_t index = 0; index <= payloadSets().size(); ++index) out << "---:|";
  out << "\n";
  for (const std::string_view contender : contenders) {
    if (contender == ours) continue;
    out << "| " << contender << " |";
    double logarithms = 0;
    int count = 0;
    for (const PayloadSet& set : payloadSets()) {
      const Ratio ratio = ratioOf(*table.at({contender, set.name}), *table.at({ours, set.name}));
      out << " " << number(ratio.minimum, 2) << " **" << number(ratio.median, 2) << "** " << number(ratio.maximum, 2)
          << " |";
      if (set.name == "r") continue;
      logarithms += std::log(ratio.median);
      ++count;
    }
    out << " **" << number(std::exp(logarithms / count), 2) << "** |\n";
  }
}

}  // namespace

void measureAll(int rounds, std::ostream& out) {
  std::vector<Measured> all;
  for (const Contender& contender : allContenders()) {
    for (const PayloadSet& set : payloadSets()) all.push_back({contender, &set, contender.make(set), 1, {}, 0});
  }
  for (Measured& measured : all) {
    measured.allocations = allocationsOf(*measured.test, *measured.set);
    // About 2 ms a round: long against the clock, short against what else the machine does.
    const double once = timeOnce(measured, 64) * static_cast<double>(measured.set->payloads.size());
    measured.repetitions = static_cast<std::size_t>(std::max(1.0, 2e6 / once));
  }
  std::mt19937 random(1);
  std::vector<std::size_t> order(all.size());
  for (std::size_t index = 0; index < order.size(); ++index) order[index] = index;
  for (int round = 0; round < rounds; ++round) {
    std::shuffle(order.begin(), order.end(), random);
    for (const std::size_t index : order) all[index].times.push_back(timeOnce(all[index], 64 + random() % 4096));
  }
  out << "Payloads:\n\n";
  for (const PayloadSet& set : payloadSets()) {
    std::size_t size = 0;
    for (const Payload& payload : set.payloads) size += payload.bytes.size();
    out << "- (" << set.name << ") " << set.title << ", " << size / set.payloads.size() << " bytes"
        << (set.payloads.size() > 1 ? " on average" : "") << "\n";
  }
  for (const Task task : tasks) writeTask(task, all, out);
}

void countInstructions(std::ostream& out) {
  constexpr std::size_t repetitions = 50;
  for (const Contender& contender : allContenders()) {
    for (const PayloadSet& set : payloadSets()) {
      const std::unique_ptr<Case> test = contender.make(set);
      const double allocations = allocationsOf(*test, set);
      CALLGRIND_TOGGLE_COLLECT;
      for (std::size_t index = 0; index < repetitions; ++index) test->run();
      CALLGRIND_TOGGLE_COLLECT;
      const std::string task(nameOf(contender.task).substr(0, 6));
      const std::string name = task + "/" + std::string(contender.name) + "/" + set.name;
      CALLGRIND_DUMP_STATS_AT(name.c_str());
      out << name << "\t" << repetitions * set.payloads.size() << "\t" << allocations << "\n";
    }
  }
}

}  // namespace probeview::bench
