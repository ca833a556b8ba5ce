// SPDX-License-Identifier: Apache-2.0
#include "platform/loop_thread.h"

#include <utility>

#include "platform/threads.h"

namespace probeview {

LoopThread::LoopThread(std::string_view label) : thread_(startThread(label, [this] { loop_.run(); })) {}

LoopThread::~LoopThread() {
  loop_.stop();
  thread_.join();
}

void LoopThread::runAndWait(Task task) {
  const auto gate = makeThreadGate();
  loop_.post([&task, gate] {
    task();
    gate->open();
  });
  gate->wait(std::chrono::hours(24));
}

}  // namespace probeview
