// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <utility>

#include "platform/task_queue.h"

namespace probeview {

// The timers of one loop, in the order in which they are due. Knows no clock: its loop says what time it is. One
// thread.
class TimerQueue {
 public:
  TimerQueue() : state_(std::make_shared<State>()) {}

  // With an interval (positive) the task runs again and again. The handle may outlive the queue.
  [[nodiscard]] ScheduledTaskHandle add(std::chrono::nanoseconds due, std::optional<std::chrono::nanoseconds> interval,
                                        Task task);
  // Absent when there is no timer.
  std::optional<std::chrono::nanoseconds> nextDue() const;
  // Runs once each timer that is due and was there when the call began.
  void runDue(std::chrono::nanoseconds now);

 private:
  class Handle;
  struct Timer {
    std::chrono::nanoseconds due;
    std::optional<std::chrono::nanoseconds> interval;
    Task task;
    bool cancelled = false;
  };
  using Place = std::pair<std::chrono::nanoseconds, std::uint64_t>;
  struct State {
    std::map<Place, std::shared_ptr<Timer>> timers;
    std::uint64_t added = 0;
  };

  std::shared_ptr<State> state_;
};

}  // namespace probeview
