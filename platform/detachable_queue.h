// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <mutex>

#include "platform/task_queue.h"

namespace probeview {

// Hands tasks on to another queue until it is detached from it, and drops them from then on. For those who may still
// post while a program ends and its event loop goes.
class DetachableQueue final : public TaskQueue {
 public:
  // The queue must live until detach().
  explicit DetachableQueue(TaskQueue& queue) : queue_(&queue) {}

  void post(Task task) override;
  // When it returns nothing is handed on any more. Any thread.
  void detach();

 private:
  std::mutex mutex_;
  TaskQueue* queue_;
};

}  // namespace probeview
