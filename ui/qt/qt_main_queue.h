// SPDX-License-Identifier: Apache-2.0
//
// The main queue and its scheduler on Qt's event loop.
#pragma once

#include <QObject>

#include "platform/task_queue.h"

namespace probeview::qt {

// Tasks run on the thread that made the queue, one per turn of its event loop, in the order of post().
// Tasks that are still waiting when the queue goes never run.
class QtMainQueue final : public TaskQueue {
 public:
  void post(Task task) override;

 private:
  QObject receiver_;
};

// Runs tasks on the thread that made the scheduler. Timers are precise: a reload every five seconds stays one.
class QtScheduler final : public Scheduler {
 public:
  [[nodiscard]] ScheduledTaskHandle after(std::chrono::nanoseconds delay, Task task) override;
  [[nodiscard]] ScheduledTaskHandle every(std::chrono::nanoseconds interval, Task task) override;
};

}  // namespace probeview::qt
