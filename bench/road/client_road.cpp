// SPDX-License-Identifier: Apache-2.0
//
// client_road [ROUNDS]        how many events a second one core takes on their way through the client: from the frame
//                             as it has been received, over connection, wrapper and main queue, into the store, over
//                             the mixed stream of all kinds, both logs discarded. One JSON object.
// client_road --instructions  under callgrind with --collect-atstart=no: the same, one dump; says how many events that
//                             were and how many allocations each took
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <span>
#include <utility>
#include <vector>

#include "bench/road/events.h"
#include "bench/road/road_measures.h"
#include "client/radix_wrapper.h"
#include "platform/manual_loop.h"
#include "radix/connection_manager.h"
#include "radix/frames.h"
#include "store/metric_validator.h"

namespace {

using namespace probeview;

// A link over which comes what the benchmark hands over.
class HandedLink final : public radix::Link {
 public:
  explicit HandedLink(radix::LinkListener*& listener) : listener_(listener) {}
  void start(radix::LinkListener& listener) override { listener_ = &listener; }
  std::size_t send(std::span<const radix::OutgoingFrame> frames) override { return frames.size(); }
  void setReading(bool) override {}

 private:
  radix::LinkListener*& listener_;
};

class HandedConnector final : public radix::Connector {
 public:
  explicit HandedConnector(radix::LinkListener*& listener) : listener_(listener) {}
  radix::ConnectResult connect() override { return {std::make_unique<HandedLink>(listener_), false, {}}; }

 private:
  radix::LinkListener*& listener_;
};

// The event as a service sends it.
std::vector<std::uint8_t> frameOf(const bench::MetricSample& sample) {
  radix::Event event(radix::EventKind::Metric);
  event.setMetricId(radix::unsignedOf(sample.metricId));
  event.setPayload(sample.payload);
  event.setTime(1700000000000);
  event.setOrigin("bench");
  event.setPeriod(1000);
  std::vector<std::uint8_t> frame = *radix::encode(event);
  const radix::Trailer age = radix::ageTrailer(std::chrono::milliseconds(3));
  frame.insert(frame.end(), age.bytes.begin(), age.bytes.begin() + age.size);
  return frame;
}

class Road {
 public:
  Road() {
    for (const bench::MetricSample& sample : bench::mixedStream()) frames_.push_back(frameOf(sample));
    loop_.run();
    listener_->onFrame(*radix::encode(radix::Hello("bench")));
    if (!wrapper_.serviceStatus().connection.connected) std::abort();
  }
  ~Road() { loop_.run(); }

  // All kinds so many times, those of one turn in one batch; how many events.
  std::size_t run(int turns) {
    for (int turn = 0; turn < turns; ++turn) {
      for (const std::vector<std::uint8_t>& frame : frames_) listener_->onFrame(frame);
      listener_->onBatchEnd();
      loop_.run();
    }
    if (wrapper_.serviceStatus().lastRecords.size() != frames_.size()) std::abort();
    return static_cast<std::size_t>(turns) * frames_.size();
  }

 private:
  ManualLoop loop_;
  DiscardingSink nowhere_;
  radix::LinkListener* listener_ = nullptr;
  RadixWrapper wrapper_{
      radix::client::makeConnectionManager(loop_, std::make_unique<HandedConnector>(listener_), {.clientName = "bench"},
                                           {std::shared_ptr<void>(), &loop_}),
      {.mainQueue = loop_, .systemLog = nowhere_, .clock = loop_}};
  MetricValidator store_{{.wrapper = &wrapper_, .console = nowhere_, .systemLog = nowhere_}};
  std::vector<std::vector<std::uint8_t>> frames_;
};

int measureRates(int rounds) {
  if (rounds < 1) {
    std::fprintf(stderr, "client_road: expected a number of rounds\n");
    return 2;
  }
  Road road;
  std::printf("{\"events per second\": ");
  bench::printRates(road, rounds);
  std::printf("}\n");
  return 0;
}

int countInstructions() {
  Road road;
  bench::countInstructions(road);
  return 0;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc > 1 && std::strcmp(argv[1], "--instructions") == 0) return countInstructions();
  return measureRates(argc > 1 ? std::atoi(argv[1]) : 31);
}
