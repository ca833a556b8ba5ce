// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "platform/task_queue.h"

namespace probeview {

// The main thread's queue and timers. Everything of the store and the pages runs there. Each front brings its own event
// loop and names it here before anything else runs; asking before that stops the program.
TaskQueue& mainQueue();
Scheduler& mainScheduler();

// Both must live as long as they are used. Main thread, at start-up.
void setMainQueue(TaskQueue& queue, Scheduler& scheduler);

}  // namespace probeview
