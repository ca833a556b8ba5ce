// SPDX-License-Identifier: Apache-2.0
#include "bench/measure.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <ctime>
#include <iomanip>
#include <random>
#include <sstream>

#include "bench/case.h"
#include "bench/count.h"

namespace probeview::bench {

std::vector<Contender> allContenders() {
  std::vector<Contender> all;
  for (auto part :
       {ourContenders, unpredictedContenders, libprotobufContenders, protozeroContenders, nanopbContenders}) {
    const std::vector<Contender> contenders = part();
    all.insert(all.end(), contenders.begin(), contenders.end());
  }
  return all;
}

namespace {

constexpr std::array tasks = {Task::Decode, Task::Encode, Task::Print};
constexpr std::string_view ours = "ours";

std::string_view titleOf(Task task) {
  return task == Task::Print ? "payload → dictionary → printed line" : nameOf(task);
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

double median(std::vector<double> values) {
  std::nth_element(values.begin(), values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2), values.end());
  return values[values.size() / 2];
}

std::string number(double value, int digits) {
  std::ostringstream text;
  text << std::fixed << std::setprecision(digits) << value;
  return text.str();
}

struct Spread {
  double minimum;
  double median;
  double maximum;
};

Spread spreadOf(const std::vector<double>& values) {
  return {*std::min_element(values.begin(), values.end()), median(values),
          *std::max_element(values.begin(), values.end())};
}

// Peer over ours, round by round: what disturbs the machine disturbs both.
std::vector<double> ratiosOf(const Measured& peer, const Measured& own) {
  std::vector<double> ratios;
  for (std::size_t round = 0; round < own.times.size(); ++round) ratios.push_back(peer.times[round] / own.times[round]);
  return ratios;
}

// The sets that the geometric mean is over.
bool isInMean(const PayloadSet& set) { return set.name != "r"; }

// One contender at one task.
struct Row {
  std::string_view contender;
  std::vector<const Measured*> sets;  // in the order of payloadSets()
};

// Ours first.
std::vector<Row> rowsOf(Task task, const std::vector<Measured>& all) {
  std::vector<Row> rows;
  for (const Measured& measured : all) {
    if (measured.contender.task != task) continue;
    if (rows.empty() || rows.back().contender != measured.contender.name) rows.push_back({measured.contender.name, {}});
    rows.back().sets.push_back(&measured);
  }
  return rows;
}

struct Comparison {
  std::vector<Spread> sets;
  Spread mean;  // of the geometric means of each round
};

Comparison compare(const Row& peer, const Row& own) {
  Comparison comparison;
  std::vector<double> logarithms(own.sets.front()->times.size());
  double count = 0;
  for (std::size_t index = 0; index < own.sets.size(); ++index) {
    const std::vector<double> ratios = ratiosOf(*peer.sets[index], *own.sets[index]);
    comparison.sets.push_back(spreadOf(ratios));
    if (!isInMean(*own.sets[index]->set)) continue;
    ++count;
    for (std::size_t round = 0; round < ratios.size(); ++round) logarithms[round] += std::log(ratios[round]);
  }
  for (double& value : logarithms) value = std::exp(value / count);
  comparison.mean = spreadOf(logarithms);
  return comparison;
}

std::string textOf(const Spread& spread) {
  return number(spread.minimum, 2) + " **" + number(spread.median, 2) + "** " + number(spread.maximum, 2);
}

void writeTables(Task task, const std::vector<Row>& rows, std::ostream& out) {
  out << "\n### " << titleOf(task)
      << "\n\nTime per message in ns, median of all rounds; in brackets the allocations.\n\n| |";
  for (const PayloadSet& set : payloadSets()) out << " " << set.name << " |";
  out << "\n|---|";
  for (std::size_t index = 0; index < payloadSets().size(); ++index) out << "---:|";
  out << "\n";
  for (const Row& row : rows) {
    out << "| " << row.contender << " |";
    for (const Measured* measured : row.sets) {
      out << " " << number(median(measured->times), 0) << " (" << number(measured->allocations, 1) << ") |";
    }
    out << "\n";
  }
  out << "\nHow many times the peer takes longer than ours: minimum, **median** and maximum over the rounds.\n\n| |";
  for (const PayloadSet& set : payloadSets()) out << " " << set.name << " |";
  out << " geometric mean a to f |\n|---|";
  for (std::size_t index = 0; index <= payloadSets().size(); ++index) out << "---:|";
  out << "\n";
  for (const Row& row : rows) {
    if (row.contender == ours) continue;
    const Comparison comparison = compare(row, rows.front());
    out << "| " << row.contender << " |";
    for (const Spread& spread : comparison.sets) out << " " << textOf(spread) << " |";
    out << " " << textOf(comparison.mean) << " |\n";
  }
}

void writeFigures(Task task, const std::vector<Row>& rows, std::ostream& out) {
  const auto write = [&](const Row& row, std::string_view set, const Spread& spread) {
    out << "ratio\t" << nameOf(task) << "\t" << row.contender << "\t" << set << "\t" << spread.minimum << "\t"
        << spread.median << "\t" << spread.maximum << "\n";
  };
  for (const Row& row : rows) {
    for (const Measured* measured : row.sets) {
      out << "time\t" << nameOf(task) << "\t" << row.contender << "\t" << measured->set->name << "\t"
          << median(measured->times) << "\t" << measured->allocations << "\n";
    }
    if (row.contender == ours) continue;
    const Comparison comparison = compare(row, rows.front());
    for (std::size_t index = 0; index < row.sets.size(); ++index) {
      write(row, row.sets[index]->set->name, comparison.sets[index]);
    }
    write(row, "mean", comparison.mean);
  }
}

}  // namespace

void measureAll(int rounds, std::ostream& out, std::ostream& figures) {
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
  for (const Task task : tasks) {
    const std::vector<Row> rows = rowsOf(task, all);
    writeTables(task, rows, out);
    writeFigures(task, rows, figures);
  }
}

void countInstructions(std::ostream& out) {
  for (const Contender& contender : allContenders()) {
    for (const PayloadSet& set : payloadSets()) countCase(contender, set, out);
  }
}

}  // namespace probeview::bench
