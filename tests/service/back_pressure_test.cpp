// SPDX-License-Identifier: Apache-2.0
//
// A viewer whose main thread stands still: what it holds is bounded, and the service feels it.
#include <gtest/gtest.h>
#include <malloc.h>

#include <fstream>
#include <memory>
#include <string>

#include "client/radix_wrapper.h"
#include "messages/metric_identifiers.h"
#include "platform/manual_loop.h"
#include "radix/connection_manager.h"
#include "radix/in_process_link.h"
#include "radix/service_commands.h"
#include "tests/service/harness/temporary_folder.h"
#include "tests/service/harness/test_service.h"
#include "tests/support/frames.h"

namespace probeview {
namespace {

class Counting final : public RadixWrapperDelegate {
 public:
  void eventsDidUpdate(const Dictionary*) override {}
  void metricsDidUpdate(const Dictionary* event) override {
    ++events;
    longestOrigin = std::max(longestOrigin, event->find(radix::kKeyOrigin)->text()->size());
  }
  std::uint64_t events = 0;
  std::size_t longestOrigin = 0;
};

// Says hello, and then sends as much as the other end takes.
class Flood final : radix::LinkListener {
 public:
  explicit Flood(std::unique_ptr<radix::Link> link) : link_(std::move(link)) {
    link_->start(*this);
    send(radix::encode(radix::Hello("flood")));
  }
  bool send(const radix::FrameBytes& frame) { return link_->sendOne(frame); }

 private:
  void onFrame(std::span<const std::uint8_t>) override {}
  void onOverlongFrame(std::size_t) override {}
  void onBatchEnd() override {}
  void onWritable() override {}
  void onClosed() override {}

  std::unique_ptr<radix::Link> link_;
};

class FloodConnector final : public radix::Connector {
 public:
  FloodConnector(ManualLoop& loop, std::unique_ptr<Flood>& flood) : loop_(loop), flood_(flood) {}
  radix::ConnectResult connect() override {
    auto [near, far] = radix::makeInProcessLinks(loop_);
    flood_ = std::make_unique<Flood>(std::move(far));
    return {std::move(near), false, {}};
  }

 private:
  ManualLoop& loop_;
  std::unique_ptr<Flood>& flood_;
};

TEST(BackPressure, AFloodOfLongOriginsIsCutAndLeftWithItsSenderWhileTheMainThreadStandsStill) {
  ManualLoop loop;
  ManualLoop main;
  DiscardingSink log;
  std::unique_ptr<Flood> flood;
  auto delegate = std::make_shared<Counting>();
  {
    RadixWrapper wrapper(
        radix::client::makeConnectionManager(loop, std::make_unique<FloodConnector>(loop, flood),
                                             {.clientName = "viewer"}, {std::shared_ptr<void>(), &loop}),
        {.mainQueue = main, .systemLog = log, .clock = main});
    wrapper.setDelegate(delegate);
    wrapper.listen();
    loop.run();
    const auto frame = radix::encode(radix::metricEvent({.metricId = 1, .origin = std::string(120'000, 'o')}));
    const std::size_t before = ::mallinfo2().uordblks + ::mallinfo2().hblkhd;
    std::uint64_t sent = 0;
    for (int round = 0; round < 1000; ++round) {
      while (flood->send(frame)) ++sent;
      loop.run();
    }
    // What may wait for the handlers, and what the connection itself holds; not the 256000 that would have gone.
    EXPECT_LE(sent, 4096U + 256 + 256);
    EXPECT_GE(sent, 4096U);
    EXPECT_LT(::mallinfo2().uordblks + ::mallinfo2().hblkhd - before, std::size_t{24} * 1024 * 1024);
    // When the main thread goes on, so does everything.
    while (main.run() + loop.run() > 0) {
    }
    EXPECT_EQ(delegate->events, sent);
    EXPECT_EQ(delegate->longestOrigin, 1024U);
    EXPECT_TRUE(flood->send(frame));
  }
  loop.run();
  flood.reset();
  loop.run();
}

TEST(BackPressure, WhatAViewerDoesNotTakeTheServiceDropsAndCounts) {
  const auto world = makeInProcessService();
  world->script().metrics = {K_LTE_RRC_STATE};
  world->kill();
  world->restart();
  ManualLoop main;
  DiscardingSink log;
  const TemporaryFolder folder;
  const std::string configuration = folder.path() + "/configuration";
  std::ofstream(configuration) << "[metrics]\nK_LTE_RRC_STATE = \"on change\"\n";
  auto delegate = std::make_shared<Counting>();
  constexpr std::uint64_t records = 20'000;
  {
    RadixWrapper wrapper(world->manager("viewer"), {.mainQueue = main, .systemLog = log, .clock = main});
    wrapper.setDelegate(delegate);
    ASSERT_TRUE(wrapper.addTelemConfigForAppId("probeview", configuration));
    wrapper.listen();
    world->settle();
    for (std::uint64_t number = 0; number < records; ++number) {
      world->emit(K_LTE_RRC_STATE, {0x10, 1});
      if (number % 100 == 0) world->settle();
    }
    world->settle();
    while (main.run() > 0) world->settle();
    const std::uint64_t lost = wrapper.serviceStatus().connection.lostEvents;
    EXPECT_EQ(delegate->events + lost, records);
    // Those that found room: 4096 in the viewer, as many in the service, and what the connection holds.
    EXPECT_GE(delegate->events, 2U * 4096);
    EXPECT_LE(delegate->events, 2U * 4096 + 1024);
  }
  world->settle();
}

}  // namespace
}  // namespace probeview
