// SPDX-License-Identifier: Apache-2.0
//
// whole_road [ROUNDS]         how many metric events a second the store takes on one core: payload, message, display
//                             dictionary, handler, log line, over the mixed stream of all kinds; with the log
//                             discarded, and with it written to a file. One JSON object.
// whole_road --instructions   under callgrind with --collect-atstart=no: the same with the log discarded, one dump;
//                             says how many events that were and how many allocations each took
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "bench/road/events.h"
#include "bench/road/road_measures.h"
#include "platform/console_log.h"
#include "store/metric_validator.h"

namespace {

using namespace probeview;

// A store of its own, and the events that it takes again and again.
class Road {
 public:
  explicit Road(LineSink& console) : store_({.console = console, .systemLog = systemLog_, .timeZone = zone_}) {
    for (const bench::MetricSample& sample : bench::mixedStream()) {
      events_.push_back({{"kKeyMetricID", sample.metricId},
                         {"kKeyPayload", Value::bytes(sample.payload)},
                         {"kKeyProfileID", std::int64_t{0}},
                         {"kKeyTime", std::int64_t{1700000000000}},
                         {"kKeyOrigin", Value::text("bench")}});
    }
  }

  // All kinds so many times; how many events.
  std::size_t run(int turns) {
    for (int turn = 0; turn < turns; ++turn) {
      for (const Dictionary& event : events_) {
        if (!store_.metricsDidUpdate(event)) std::abort();
      }
    }
    return static_cast<std::size_t>(turns) * events_.size();
  }

 private:
  FixedTimeZone zone_{0, "UTC"};
  DiscardingSink systemLog_;
  MetricValidator store_;
  std::vector<Dictionary> events_;
};

void writeRates(const char* name, LineSink& console, int rounds) {
  Road road(console);
  std::printf("\"%s\": ", name);
  bench::printRates(road, rounds);
}

int measureRates(int rounds) {
  char path[] = "/tmp/whole_road_XXXXXX";
  const int file = ::mkstemp(path);
  if (rounds < 1 || file < 0) {
    std::fprintf(stderr, "whole_road: expected a number of rounds, and a place for a file in /tmp\n");
    return 2;
  }
  ::unlink(path);
  DiscardingSink nowhere;
  ConsoleLog log(file);
  std::printf("{");
  writeRates("discarded", nowhere, rounds);
  std::printf(", ");
  writeRates("file", log, rounds);
  std::printf("}\n");
  return 0;
}

int countInstructions() {
  DiscardingSink nowhere;
  Road road(nowhere);
  bench::countInstructions(road);
  return 0;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc > 1 && std::strcmp(argv[1], "--instructions") == 0) return countInstructions();
  return measureRates(argc > 1 ? std::atoi(argv[1]) : 31);
}
