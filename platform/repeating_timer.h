// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>

#include "platform/task_queue.h"

namespace probeview {

// Does something every interval, first after one interval, until it is destroyed. On the scheduler's thread.
class RepeatingTimer {
 public:
  RepeatingTimer(Scheduler& scheduler, std::chrono::nanoseconds interval, Task action);

 private:
  ScheduledTaskHandle scheduled_;
};

}  // namespace probeview
