// SPDX-License-Identifier: Apache-2.0
#include "platform/main_queue.h"

#include "platform/fatal_error.h"

namespace probeview {

namespace {

TaskQueue* theQueue = nullptr;
Scheduler* theScheduler = nullptr;

}  // namespace

TaskQueue& mainQueue() {
  if (theQueue == nullptr) fatalError("the program has named no main queue");
  return *theQueue;
}

Scheduler& mainScheduler() {
  if (theScheduler == nullptr) fatalError("the program has named no main queue");
  return *theScheduler;
}

void setMainQueue(TaskQueue& queue, Scheduler& scheduler) {
  theQueue = &queue;
  theScheduler = &scheduler;
}

}  // namespace probeview
