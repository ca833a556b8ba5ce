// SPDX-License-Identifier: Apache-2.0
#include "platform/threads.h"

#include <pthread.h>
#include <signal.h>

#include <condition_variable>
#include <mutex>
#include <string>
#include <utility>

#include "platform/worker.h"

namespace probeview {

namespace {

class ThreadGate final : public Gate {
 public:
  void open() override {
    // Signalled under the lock: once it is free, who waited may go, and take the gate along.
    const std::lock_guard lock(mutex_);
    open_ = true;
    opened_.notify_all();
  }
  bool wait(std::chrono::nanoseconds atMost) override {
    std::unique_lock lock(mutex_);
    return opened_.wait_for(lock, atMost, [this] { return open_; });
  }

 private:
  std::mutex mutex_;
  std::condition_variable opened_;
  bool open_ = false;
};

}  // namespace

std::shared_ptr<Gate> makeThreadGate() { return std::make_shared<ThreadGate>(); }

std::thread startThread(std::string_view label, std::function<void()> body) {
  // The mask is inherited, so that there is no moment in which the new thread could take a signal.
  sigset_t all;
  sigset_t before;
  sigfillset(&all);
  pthread_sigmask(SIG_SETMASK, &all, &before);
  std::thread thread(std::move(body));
  pthread_sigmask(SIG_SETMASK, &before, nullptr);
  constexpr std::size_t longestName = 15;
  const std::string name(label.size() > longestName ? label.substr(label.size() - longestName) : label);
  pthread_setname_np(thread.native_handle(), name.c_str());
  return thread;
}

}  // namespace probeview
