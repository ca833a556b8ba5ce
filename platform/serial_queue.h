// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>
#include <string_view>

#include "platform/task_queue.h"

namespace probeview {

// A queue on a thread of its own. Destroying it runs all that was posted before and then ends the thread; destroyed
// from inside one of its own tasks, it leaves the rest to the thread, which ends by itself.
class SerialQueue final : public TaskQueue {
 public:
  // The label is for people who look at queues; the thread carries as much of its end as the system allows.
  explicit SerialQueue(std::string label);
  ~SerialQueue() override;
  SerialQueue(const SerialQueue&) = delete;
  SerialQueue& operator=(const SerialQueue&) = delete;

  void post(Task task) override;
  const std::string& label() const { return label_; }
  // Waits until all that was posted before this call has run. Not from inside a task of this queue.
  void waitUntilIdle();

 private:
  struct Shared;
  std::string label_;
  std::shared_ptr<Shared> shared_;
};

// The one queue of this label in the process, created at the first call and never destroyed. Any thread.
const std::shared_ptr<SerialQueue>& onceCreatedQueue(std::string_view label);

}  // namespace probeview
