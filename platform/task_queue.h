// SPDX-License-Identifier: Apache-2.0
//
// Where work runs. Everything of the store and the pages runs on the main queue; the client library's callbacks run on
// one serial queue. No other room starts threads or takes locks.
#pragma once

#include <chrono>
#include <functional>
#include <memory>

namespace probeview {

using Task = std::function<void()>;

// Runs tasks one at a time, in the order in which they were posted. post() may be called from any thread and never runs
// the task before it returns.
class TaskQueue {
 public:
  virtual ~TaskQueue() = default;
  virtual void post(Task task) = 0;
};

// Keeps a scheduled task alive; destroying it cancels the task. To be destroyed on the scheduler's own thread.
class ScheduledTask {
 public:
  virtual ~ScheduledTask() = default;
};
using ScheduledTaskHandle = std::unique_ptr<ScheduledTask>;

// Runs tasks later, on its own thread. Called on that thread only.
class Scheduler {
 public:
  virtual ~Scheduler() = default;
  // Runs the task once after the delay (at least one turn of the loop later). Cancelled when the handle is destroyed.
  [[nodiscard]] virtual ScheduledTaskHandle after(std::chrono::nanoseconds delay, Task task) = 0;
  // Runs the task every interval, first after one interval, until the handle is destroyed. Missed turns are not
  // made up for.
  [[nodiscard]] virtual ScheduledTaskHandle every(std::chrono::nanoseconds interval, Task task) = 0;
};

}  // namespace probeview
