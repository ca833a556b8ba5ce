// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>
#include <thread>

#include "platform/event_loop.h"

namespace probeview {

// A loop on a thread of its own. Destroying it stops the loop and waits for the thread; not from that thread.
class LoopThread {
 public:
  // Throws std::system_error when the system gives no more descriptors or threads.
  explicit LoopThread(std::string_view label);
  ~LoopThread();
  LoopThread(const LoopThread&) = delete;
  LoopThread& operator=(const LoopThread&) = delete;

  EventLoop& loop() { return loop_; }
  // Runs the task on the loop and waits until it has run. Not from the loop's own thread.
  void runAndWait(Task task);

 private:
  EventLoop loop_;
  std::thread thread_;
};

}  // namespace probeview
