// SPDX-License-Identifier: Apache-2.0
//
// Clients that go while events still wait for their handlers.
#include <gtest/gtest.h>

#include <memory>
#include <vector>

#include "platform/event_loop.h"
#include "platform/manual_loop.h"
#include "radix/connection_manager.h"
#include "radix/frames.h"
#include "radix/in_process_link.h"
#include "radix/service_commands.h"
#include "tests/support/frames.h"

namespace radix::client {
namespace {

using probeview::EventLoop;
using probeview::ManualLoop;
using probeview::TaskQueue;

// Says hello and then whatever it is told to.
class Speaker final : LinkListener {
 public:
  explicit Speaker(std::unique_ptr<Link> link) : link_(std::move(link)) { link_->start(*this); }
  template <typename Sentence>
  void say(const Sentence& sentence) {
    EXPECT_TRUE(link_->sendOne(encode(sentence)));
  }

 private:
  void onFrame(std::span<const std::uint8_t>) override {}
  void onOverlongFrame(std::size_t) override {}
  void onBatchEnd() override {}
  void onWritable() override {}
  void onClosed() override {}

  std::unique_ptr<Link> link_;
};

class SpeakingConnector final : public Connector {
 public:
  SpeakingConnector(ManualLoop& loop, std::unique_ptr<Speaker>& speaker) : loop_(loop), speaker_(speaker) {}
  ConnectResult connect() override {
    auto [near, far] = makeInProcessLinks(loop_);
    speaker_ = std::make_unique<Speaker>(std::move(far));
    return {std::move(near), false, {}};
  }

 private:
  ManualLoop& loop_;
  std::unique_ptr<Speaker>& speaker_;
};

template <typename Queue>
class EndingTest : public ::testing::Test {};
using Queues = ::testing::Types<EventLoop, ManualLoop>;
TYPED_TEST_SUITE(EndingTest, Queues);

// The handler owns the queue on which it runs, and the manager goes before its queue or after it.
TYPED_TEST(EndingTest, AClientThatGoesWhileEventsWaitLeavesNothingBehind) {
  ManualLoop loop;
  std::unique_ptr<Speaker> speaker;
  for (int round = 0; round < 1000; ++round) {
    auto queue = std::make_shared<TypeParam>();
    const std::weak_ptr<TaskQueue> queueSeen = queue;
    ManagerHandle manager =
        makeConnectionManager(loop, std::make_unique<SpeakingConnector>(loop, speaker), {.clientName = "short"}, queue);
    const std::weak_ptr<Manager> managerSeen = manager;
    int handled = 0;
    RegisterEventHandler(manager, kEventMetric, [queue, &handled](const ObjectHandle&, Group) { ++handled; });
    EventsOn(manager);
    loop.run();
    ASSERT_TRUE(speaker);
    speaker->say(Hello("speaker"));
    loop.run();
    for (std::int64_t number = 0; number < 50; ++number) {
      speaker->say(metricEvent({.metricId = number, .payload = std::vector<std::uint8_t>(100), .origin = "speaker"}));
      if (number % 10 == 9) loop.run();
    }
    if (round % 2 == 0) {
      manager.reset();
      loop.run();
      queue.reset();
    } else {
      queue.reset();
      manager.reset();
      loop.run();
    }
    EXPECT_EQ(handled, 0);
    ASSERT_TRUE(queueSeen.expired()) << "after round " << round;
    ASSERT_TRUE(managerSeen.expired());
    speaker.reset();
    loop.run();
  }
}

}  // namespace
}  // namespace radix::client
