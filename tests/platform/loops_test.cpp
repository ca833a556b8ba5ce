// SPDX-License-Identifier: Apache-2.0
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/socket.h>
#include <time.h>
#include <unistd.h>

#include <atomic>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "platform/detachable_queue.h"
#include "platform/event_loop.h"
#include "platform/loop_thread.h"
#include "platform/manual_loop.h"
#include "platform/serial_queue.h"

namespace probeview {
namespace {

using std::chrono::hours;
using std::chrono::milliseconds;
using std::chrono::nanoseconds;
using std::chrono::seconds;

constexpr seconds deadline{20};

// Tasks that never run own something that posts to the loop when it goes, as a client leaves its connection there.
void expectThatWhatIsDroppedMayPost(std::unique_ptr<Worker> loop) {
  const auto kept = std::make_shared<int>(0);
  std::shared_ptr<void> poster(nullptr, [there = loop.get(), kept](void*) {
    there->post([there, again = std::shared_ptr<void>(nullptr, [there, kept](void*) { there->post([kept] {}); })] {});
  });
  loop->post([owned = std::move(poster)] {});
  loop.reset();
  EXPECT_EQ(kept.use_count(), 1);
}

TEST(ManualLoop, TasksRunInTheOrderOfPostingAndNeverInsidePost) {
  ManualLoop loop;
  std::string order;
  loop.post([&] {
    order += 'a';
    loop.post([&] { order += 'c'; });
  });
  loop.post([&] { order += 'b'; });
  EXPECT_EQ(order, "");
  EXPECT_EQ(loop.run(), 3U);
  EXPECT_EQ(order, "abc");
}

TEST(ManualLoop, TimersRunAtTheirOwnMomentAsTheClockMoves) {
  ManualLoop loop;
  const auto start = loop.monotonicTime();
  std::vector<nanoseconds> moments;
  const auto once = loop.after(milliseconds(30), [&] { moments.push_back(loop.monotonicTime() - start); });
  auto again = loop.every(milliseconds(20), [&] { moments.push_back(loop.monotonicTime() - start); });
  loop.advance(milliseconds(50));
  EXPECT_EQ(moments, (std::vector<nanoseconds>{milliseconds(20), milliseconds(30), milliseconds(40)}));
  EXPECT_EQ(loop.wallTime(), ManualLoop::defaultWallTime + milliseconds(50));
  EXPECT_EQ(loop.untilNextTimer(), milliseconds(10));
  again.reset();
  EXPECT_EQ(loop.untilNextTimer(), std::nullopt);
  loop.advance(seconds(1));
  EXPECT_EQ(moments.size(), 3U);
}

TEST(ManualLoop, ATimerMayCancelItselfAndOthersWhileItRuns) {
  ManualLoop loop;
  int ran = 0;
  ScheduledTaskHandle self;
  ScheduledTaskHandle other;
  self = loop.every(milliseconds(10), [&] {
    ++ran;
    self.reset();
    other.reset();
  });
  other = loop.every(milliseconds(10), [&] { ran += 100; });
  loop.advance(seconds(1));
  EXPECT_EQ(ran, 1);
}

TEST(ManualLoop, ATimerWithoutDelayRunsOneTurnLater) {
  ManualLoop loop;
  bool inside = false;
  bool ranInside = false;
  ScheduledTaskHandle later;
  const auto first = loop.after(milliseconds(1), [&] {
    inside = true;
    later = loop.after(nanoseconds(0), [&] { ranInside = inside; });
    inside = false;
  });
  loop.advance(milliseconds(1));
  EXPECT_FALSE(ranInside);
}

TEST(ManualLoop, TheTimeOfDayMayJumpWhileTheMonotonicTimeGoesOn) {
  ManualLoop loop;
  const auto before = loop.monotonicTime();
  loop.setWallTime(milliseconds(5));
  EXPECT_EQ(loop.wallTime(), milliseconds(5));
  EXPECT_EQ(loop.monotonicTime(), before);
}

TEST(ManualLoop, WhileTheDeviceSleepsTheTimeOfDayAndAgesGoOnAndTimersWait) {
  ManualLoop loop;
  bool ran = false;
  const auto timer = loop.after(milliseconds(5), [&] { ran = true; });
  const auto monotonic = loop.monotonicTime();
  const auto age = loop.ageTime();
  const auto wall = loop.wallTime();
  loop.sleep(hours(8));
  loop.advance(milliseconds(4));
  EXPECT_FALSE(ran);
  EXPECT_EQ(loop.monotonicTime() - monotonic, milliseconds(4));
  EXPECT_EQ(loop.ageTime() - age, hours(8) + milliseconds(4));
  EXPECT_EQ(loop.wallTime() - wall, hours(8) + milliseconds(4));
  loop.advance(milliseconds(1));
  EXPECT_TRUE(ran);
}

// On a machine that has never slept since it was started all clocks of this kind agree.
TEST(SystemClock, AgesGoByTheClockThatCountsTheTimeAsleep) {
  const auto sinceBoot = [] {
    timespec now{};
    ::clock_gettime(CLOCK_BOOTTIME, &now);
    return seconds(now.tv_sec) + nanoseconds(now.tv_nsec);
  };
  const auto before = sinceBoot();
  const auto age = systemClock().ageTime();
  EXPECT_LE(before, age);
  EXPECT_LE(age, sinceBoot());
}

TEST(ManualLoop, WaitingAtItsGateRunsTheLoopAndMovesTheClockNoFurtherThanTheDeadline) {
  ManualLoop loop;
  const auto start = loop.monotonicTime();
  const auto opened = loop.makeGate();
  const auto timer = loop.after(milliseconds(7), [&] { opened->open(); });
  EXPECT_TRUE(opened->wait(seconds(2)));
  EXPECT_EQ(loop.monotonicTime() - start, milliseconds(7));
  EXPECT_FALSE(loop.makeGate()->wait(seconds(2)));
  EXPECT_EQ(loop.monotonicTime() - start, seconds(2) + milliseconds(7));
}

TEST(ManualLoop, TasksThatOtherThreadsPostAreWaitedFor) {
  ManualLoop loop;
  bool ran = false;
  std::thread other([&] { loop.post([&] { ran = true; }); });
  EXPECT_TRUE(loop.runUntil([&] { return ran; }, deadline));
  other.join();
}

// Whoever posts may still be inside post() when the task has run. Seen by the thread sanitizer in any run, by others
// only when the moment is right.
TEST(ManualLoop, MayGoAsSoonAsAPostedTaskHasRun) {
  for (int round = 0; round < 300; ++round) {
    auto loop = std::make_unique<ManualLoop>();
    bool ran = false;
    std::thread other([there = loop.get(), &ran] { there->post([&ran] { ran = true; }); });
    EXPECT_TRUE(loop->runUntil([&] { return ran; }, deadline));
    loop.reset();
    other.join();
  }
}

TEST(ManualLoop, DropsWhatNeverRanAndWhatThatPostsAsItGoes) {
  expectThatWhatIsDroppedMayPost(std::make_unique<ManualLoop>());
}

TEST(SerialQueue, TasksOfOneThreadRunInOrderOnOneOtherThread) {
  std::vector<int> order;
  std::thread::id runner;
  {
    SerialQueue queue("org.probeview.test.serialQ.queue");
    for (int number = 0; number < 1000; ++number) {
      queue.post([&, number] {
        order.push_back(number);
        runner = std::this_thread::get_id();
      });
    }
    queue.waitUntilIdle();
    EXPECT_EQ(queue.label(), "org.probeview.test.serialQ.queue");
  }
  ASSERT_EQ(order.size(), 1000U);
  for (int number = 0; number < 1000; ++number) EXPECT_EQ(order[static_cast<std::size_t>(number)], number);
  EXPECT_NE(runner, std::this_thread::get_id());
}

TEST(SerialQueue, DestroyingItRunsWhatWasPostedBefore) {
  int ran = 0;
  {
    SerialQueue queue("drain");
    for (int number = 0; number < 100; ++number) queue.post([&ran] { ++ran; });
  }
  EXPECT_EQ(ran, 100);
}

TEST(SerialQueue, ItMayBeDestroyedFromInsideOneOfItsTasks) {
  const auto ended = makeThreadGate();
  auto queue = std::make_shared<SerialQueue>("self");
  auto* raw = queue.get();
  raw->post([queue = std::move(queue), ended]() mutable {
    queue->post([ended] { ended->open(); });
    queue.reset();
  });
  EXPECT_TRUE(ended->wait(deadline));
}

TEST(SerialQueue, TheQueueOfALabelIsCreatedOnceHoweverManyThreadsAsk) {
  std::vector<const SerialQueue*> seen(4);
  std::vector<std::thread> threads;
  for (auto& place : seen) threads.emplace_back([&place] { place = onceCreatedQueue("once.serialQ.queue").get(); });
  for (auto& thread : threads) thread.join();
  for (const auto* queue : seen) EXPECT_EQ(queue, seen[0]);
  EXPECT_NE(onceCreatedQueue("other.serialQ.queue").get(), seen[0]);
}

TEST(EventLoop, TasksPostedFromManyThreadsAllRunEachThreadsInOrder) {
  EventLoop loop;
  constexpr int each = 500;
  std::vector<std::vector<int>> seen(4);
  std::vector<std::thread> threads;
  for (std::size_t number = 0; number < seen.size(); ++number) {
    threads.emplace_back([&, number] {
      for (int count = 0; count < each; ++count) loop.post([&, number, count] { seen[number].push_back(count); });
    });
  }
  const auto done = [&] {
    for (const auto& one : seen) {
      if (one.size() != each) return false;
    }
    return true;
  };
  EXPECT_TRUE(loop.runUntil(done, deadline));
  for (auto& thread : threads) thread.join();
  for (const auto& one : seen) EXPECT_TRUE(std::is_sorted(one.begin(), one.end()));
}

TEST(EventLoop, TimersFireInOrderAndCancelledOnesDoNot) {
  EventLoop loop;
  std::string order;
  const auto second = loop.after(milliseconds(20), [&] { order += 'b'; });
  const auto first = loop.after(milliseconds(5), [&] { order += 'a'; });
  auto never = loop.after(milliseconds(10), [&] { order += 'x'; });
  never.reset();
  int turns = 0;
  const auto again = loop.every(milliseconds(1), [&] { ++turns; });
  EXPECT_TRUE(loop.runUntil([&] { return order.size() == 2 && turns >= 3; }, deadline));
  EXPECT_EQ(order, "ab");
}

TEST(EventLoop, ADescriptorsHandlerRunsWhileItIsReadyAndItMayEndItsOwnWatch) {
  EventLoop loop;
  int ends[2];
  ASSERT_EQ(::socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_NONBLOCK, 0, ends), 0);
  const FileDescriptor near(ends[0]);
  const FileDescriptor far(ends[1]);
  std::string got;
  std::unique_ptr<DescriptorWatch> watch;
  watch = loop.watch(near.number(), {.readable = true}, [&](Readiness ready) {
    EXPECT_TRUE(ready.readable);
    char byte;
    ASSERT_EQ(::read(near.number(), &byte, 1), 1);
    got += byte;
    if (byte == 'c') watch.reset();
  });
  ASSERT_TRUE(watch);
  for (const char byte : {'a', 'b', 'c', 'd'}) ASSERT_EQ(::write(far.number(), &byte, 1), 1);
  EXPECT_TRUE(loop.runUntil([&] { return got == "abc"; }, deadline));
  bool later = false;
  const auto timer = loop.after(milliseconds(5), [&] { later = true; });
  EXPECT_TRUE(loop.runUntil([&] { return later; }, deadline));
  EXPECT_EQ(got, "abc");
}

TEST(EventLoop, InterestInWritingCanBeSwitched) {
  EventLoop loop;
  int ends[2];
  ASSERT_EQ(::socketpair(AF_UNIX, SOCK_STREAM | SOCK_NONBLOCK, 0, ends), 0);
  const FileDescriptor near(ends[0]);
  const FileDescriptor far(ends[1]);
  int writable = 0;
  const auto watch = loop.watch(near.number(), {}, [&](Readiness ready) { writable += ready.writable ? 1 : 0; });
  bool waited = false;
  const auto timer = loop.after(milliseconds(5), [&] { waited = true; });
  EXPECT_TRUE(loop.runUntil([&] { return waited; }, deadline));
  EXPECT_EQ(writable, 0);
  watch->setInterest({.writable = true});
  EXPECT_TRUE(loop.runUntil([&] { return writable > 0; }, deadline));
}

TEST(EventLoop, ASignalBecomesACallOnTheLoop) {
  EventLoop loop;
  int seen = 0;
  loop.onSignals({SIGUSR1}, [&](int number) { seen = number; });
  ASSERT_EQ(::kill(::getpid(), SIGUSR1), 0);
  EXPECT_TRUE(loop.runUntil([&] { return seen != 0; }, deadline));
  EXPECT_EQ(seen, SIGUSR1);
}

TEST(EventLoop, ItSleepsWhileThereIsNothingToDo) {
  EventLoop loop;
  int turns = 0;
  bool late = false;
  const auto timer = loop.after(milliseconds(100), [&] { late = true; });
  EXPECT_TRUE(loop.runUntil(
      [&] {
        ++turns;
        return late;
      },
      deadline));
  EXPECT_LE(turns, 4);
}

TEST(EventLoop, AWatchAndATimerMayOutliveTheirLoop) {
  int ends[2];
  ASSERT_EQ(::socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_NONBLOCK, 0, ends), 0);
  const FileDescriptor near(ends[0]);
  const FileDescriptor far(ends[1]);
  auto loop = std::make_unique<EventLoop>();
  auto watch = loop->watch(near.number(), {.readable = true}, [](Readiness) {});
  auto timer = loop->after(seconds(1), [] {});
  loop.reset();
  watch->setInterest({.writable = true});
  watch.reset();
  timer.reset();
}

TEST(EventLoop, MayGoAsSoonAsAPostedTaskHasRun) {
  for (int round = 0; round < 300; ++round) {
    auto loop = std::make_unique<EventLoop>();
    bool ran = false;
    std::thread other([there = loop.get(), &ran] { there->post([&ran] { ran = true; }); });
    EXPECT_TRUE(loop->runUntil([&] { return ran; }, deadline));
    loop.reset();
    other.join();
  }
}

TEST(EventLoop, DropsWhatNeverRanAndWhatThatPostsAsItGoes) {
  expectThatWhatIsDroppedMayPost(std::make_unique<EventLoop>());
}

TEST(ThreadGate, MayGoAsSoonAsItHasOpened) {
  for (int round = 0; round < 300; ++round) {
    auto gate = makeThreadGate();
    std::thread other([there = gate.get()] { there->open(); });
    EXPECT_TRUE(gate->wait(deadline));
    gate.reset();
    other.join();
  }
}

TEST(LoopThread, ATaskIsWaitedFor) {
  LoopThread thread("loop");
  std::thread::id runner;
  thread.runAndWait([&] { runner = std::this_thread::get_id(); });
  EXPECT_NE(runner, std::thread::id());
  EXPECT_NE(runner, std::this_thread::get_id());
}

TEST(ThreadGate, WaitingEndsAtTheDeadlineWhenNobodyOpens) {
  const auto gate = makeThreadGate();
  EXPECT_FALSE(gate->wait(milliseconds(1)));
  gate->open();
  EXPECT_TRUE(gate->wait(hours(1)));
}

TEST(DetachableQueue, TasksAreHandedOnUntilItIsDetachedAndDroppedFromThenOn) {
  ManualLoop loop;
  DetachableQueue queue(loop);
  int ran = 0;
  queue.post([&] { ++ran; });
  queue.detach();
  queue.post([&] { ++ran; });
  loop.run();
  EXPECT_EQ(ran, 1);
}

}  // namespace
}  // namespace probeview
