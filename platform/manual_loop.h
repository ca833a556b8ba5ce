// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstddef>
#include <functional>
#include <memory>

#include "platform/timer_queue.h"
#include "platform/worker.h"

namespace probeview {

// A loop that only moves when it is told to, with a clock that only it moves: a test's main queue, scheduler and clock
// in one. Everything but post() is called on one thread.
class ManualLoop final : public Worker, public Clock {
 public:
  // 2024-03-05 12:00:00 UTC.
  static constexpr std::chrono::milliseconds defaultWallTime{1709640000000};

  explicit ManualLoop(std::chrono::milliseconds wallTime = defaultWallTime);
  ~ManualLoop() override;

  // Any thread.
  void post(Task task) override;
  [[nodiscard]] ScheduledTaskHandle after(std::chrono::nanoseconds delay, Task task) override;
  [[nodiscard]] ScheduledTaskHandle every(std::chrono::nanoseconds interval, Task task) override;
  const Clock& clock() const override { return *this; }
  // A gate whose wait() runs this loop and moves its clock, up to the time given, instead of blocking.
  std::shared_ptr<Gate> makeGate() override;

  std::chrono::milliseconds wallTime() const override;
  std::chrono::nanoseconds monotonicTime() const override { return now_; }
  std::chrono::nanoseconds ageTime() const override { return now_ + slept_; }
  // Lets the time of day jump; the monotonic time goes on as before.
  void setWallTime(std::chrono::milliseconds wallTime);
  // Lets the device sleep: the time of day and ages go on, the monotonic time and with it all timers stand still.
  void sleep(std::chrono::nanoseconds time);

  // Runs the next posted task; whether there was one.
  bool runOne();
  // Runs posted tasks, those that they post included, until none is left. How many ran.
  std::size_t run();
  // Moves the clock: runs posted tasks, then each timer at its own moment with the tasks that it posts.
  void advance(std::chrono::nanoseconds time);
  // When the next timer is due, counted from now; absent when there is none.
  std::optional<std::chrono::nanoseconds> untilNextTimer() const;
  // For tasks that other threads post: runs what is posted, sleeping in between, until the condition holds; at most for
  // the real time given. Whether it holds. The loop's own clock stands still.
  bool runUntil(const std::function<bool()>& condition, std::chrono::nanoseconds atMost);

 private:
  struct Inbox;
  class RunningGate;

  bool waitForTask(std::chrono::nanoseconds atMost);

  std::unique_ptr<Inbox> inbox_;
  TimerQueue timers_;
  std::chrono::nanoseconds now_{std::chrono::hours(1)};
  // More than nothing, so that whoever takes one clock for the other is found out.
  std::chrono::nanoseconds slept_{std::chrono::hours(1000)};
  std::chrono::nanoseconds wallOffset_;
};

}  // namespace probeview
