// SPDX-License-Identifier: Apache-2.0
#include "platform/repeating_timer.h"

#include <gtest/gtest.h>

#include <stdexcept>

#include "platform/fatal_error.h"
#include "platform/main_queue.h"
#include "platform/manual_loop.h"

namespace probeview {
namespace {

using namespace std::chrono_literals;

TEST(RepeatingTimer, FiresAfterEachIntervalUntilItIsDestroyed) {
  ManualLoop loop;
  int fired = 0;
  {
    const RepeatingTimer timer(loop, 5s, [&fired] { ++fired; });
    loop.advance(4999ms);
    EXPECT_EQ(fired, 0);
    loop.advance(1ms);
    EXPECT_EQ(fired, 1);
    loop.advance(10s);
    EXPECT_EQ(fired, 3);
  }
  loop.advance(1h);
  EXPECT_EQ(fired, 3);
}

TEST(MainQueue, StopsTheProgramUntilTheProgramHasNamedIt) {
  setFatalErrorObserver([](std::string_view reason) { throw std::runtime_error(std::string(reason)); });
  EXPECT_THROW(mainQueue(), std::runtime_error);
  EXPECT_THROW(mainScheduler(), std::runtime_error);
  setFatalErrorObserver({});
  static ManualLoop loop;
  setMainQueue(loop, loop);
  EXPECT_EQ(&mainQueue(), static_cast<TaskQueue*>(&loop));
  EXPECT_EQ(&mainScheduler(), static_cast<Scheduler*>(&loop));
}

}  // namespace
}  // namespace probeview
