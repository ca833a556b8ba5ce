// SPDX-License-Identifier: Apache-2.0
#include "platform/detachable_queue.h"

#include <utility>

namespace probeview {

void DetachableQueue::post(Task task) {
  const std::lock_guard lock(mutex_);
  if (queue_ != nullptr) queue_->post(std::move(task));
}

void DetachableQueue::detach() {
  const std::lock_guard lock(mutex_);
  queue_ = nullptr;
}

}  // namespace probeview
