// SPDX-License-Identifier: Apache-2.0
#include "ui/qt/qt_main_queue.h"

#include <gtest/gtest.h>

#include <QCoreApplication>
#include <QElapsedTimer>
#include <QTest>
#include <QThread>
#include <memory>
#include <optional>
#include <thread>
#include <vector>

namespace probeview::qt {
namespace {

using namespace std::chrono_literals;

bool waitUntil(const std::function<bool()>& condition) { return QTest::qWaitFor(condition, 20000); }

TEST(QtMainQueueTest, RunsTasksOfOtherThreadsOnTheMainThreadInTheirOrder) {
  QtMainQueue queue;
  std::vector<int> order;
  bool onMain = true;
  std::thread poster([&] {
    for (int task = 0; task < 1000; ++task) {
      queue.post([&, task] {
        onMain = onMain && QThread::currentThread() == QCoreApplication::instance()->thread();
        order.push_back(task);
      });
    }
  });
  poster.join();
  EXPECT_TRUE(order.empty());
  ASSERT_TRUE(waitUntil([&] { return order.size() == 1000; }));
  EXPECT_TRUE(onMain);
  EXPECT_TRUE(std::is_sorted(order.begin(), order.end()));
}

TEST(QtMainQueueTest, NeverRunsATaskBeforePostReturns) {
  QtMainQueue queue;
  bool inside = false;
  bool ran = false;
  queue.post([&] {
    inside = true;
    queue.post([&] {
      EXPECT_FALSE(inside);
      ran = true;
    });
    inside = false;
  });
  ASSERT_TRUE(waitUntil([&] { return ran; }));
}

TEST(QtMainQueueTest, TasksThatStillWaitWhenTheQueueGoesNeverRun) {
  bool ran = false;
  {
    QtMainQueue queue;
    queue.post([&] { ran = true; });
  }
  QCoreApplication::sendPostedEvents();
  QCoreApplication::processEvents();
  EXPECT_FALSE(ran);
}

TEST(QtSchedulerTest, RunsATaskOnceAfterTheDelayAndNotEarlier) {
  QtScheduler scheduler;
  int runs = 0;
  QElapsedTimer watch;
  watch.start();
  qint64 after = 0;
  const auto handle = scheduler.after(20ms, [&] {
    ++runs;
    after = watch.nsecsElapsed();
  });
  bool later = false;
  const auto end = scheduler.after(80ms, [&] { later = true; });
  ASSERT_TRUE(waitUntil([&] { return later; }));
  EXPECT_EQ(runs, 1);
  EXPECT_GE(after, 19'000'000) << "Qt's precise timers may be early by less than a millisecond";
}

TEST(QtSchedulerTest, RepeatsATaskUntilItsHandleIsDestroyed) {
  QtScheduler scheduler;
  int runs = 0;
  auto handle = scheduler.every(5ms, [&] { ++runs; });
  ASSERT_TRUE(waitUntil([&] { return runs >= 3; }));
  handle.reset();
  const int before = runs;
  bool later = false;
  const auto end = scheduler.after(30ms, [&] { later = true; });
  ASSERT_TRUE(waitUntil([&] { return later; }));
  EXPECT_EQ(runs, before);
}

TEST(QtSchedulerTest, ATaskMayDestroyItsOwnHandle) {
  QtScheduler scheduler;
  auto alive = std::make_shared<int>(0);
  ScheduledTaskHandle handle;
  handle = scheduler.every(1ms, [&handle, alive] {
    ++*alive;
    handle.reset();
    ++*alive;
  });
  ASSERT_TRUE(waitUntil([&] { return *alive > 0; }));
  EXPECT_EQ(*alive, 2);
  EXPECT_EQ(handle, nullptr);
}

TEST(QtSchedulerTest, ADelayOfNothingStillTakesATurnOfTheLoop) {
  QtScheduler scheduler;
  bool ran = false;
  const auto handle = scheduler.after(0ns, [&] { ran = true; });
  EXPECT_FALSE(ran);
  ASSERT_TRUE(waitUntil([&] { return ran; }));
}

}  // namespace
}  // namespace probeview::qt
