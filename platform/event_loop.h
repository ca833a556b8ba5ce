// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/types.h>

#include <atomic>
#include <chrono>
#include <cstdint>
#include <deque>
#include <functional>
#include <initializer_list>
#include <map>
#include <memory>
#include <thread>

#include "platform/file_descriptor.h"
#include "platform/timer_queue.h"
#include "platform/worker.h"

namespace probeview {

// What a watched descriptor is ready for. An error or a peer that has gone counts as readable: reading tells.
struct Readiness {
  bool readable = false;
  bool writable = false;
};

// A watched descriptor; destroying it ends the watch (before the descriptor is closed).
class DescriptorWatch {
 public:
  virtual ~DescriptorWatch() = default;
  virtual void setInterest(Readiness interest) = 0;
};

// A thread's loop: runs posted tasks, timers and the handlers of descriptors, and sleeps in the kernel while there is
// nothing to do. Everything but post() and stop() is called on the thread that runs the loop, or before it runs.
class EventLoop final : public Worker {
 public:
  // Throws std::system_error when the system gives no more descriptors.
  EventLoop();
  ~EventLoop() override;
  EventLoop(const EventLoop&) = delete;
  EventLoop& operator=(const EventLoop&) = delete;

  void post(Task task) override;
  [[nodiscard]] ScheduledTaskHandle after(std::chrono::nanoseconds delay, Task task) override;
  [[nodiscard]] ScheduledTaskHandle every(std::chrono::nanoseconds interval, Task task) override;
  const Clock& clock() const override { return systemClock(); }
  std::shared_ptr<Gate> makeGate() override { return makeThreadGate(); }

  // Calls the handler as long as the descriptor is ready for what is of interest (level, not edge). The descriptor
  // stays the caller's. Null when the system refuses, with the reason in errno.
  [[nodiscard]] std::unique_ptr<DescriptorWatch> watch(int descriptor, Readiness interest,
                                                       std::function<void(Readiness)> handler);
  // Turns the signals into calls of the handler; blocks them for the calling thread, so call it before other threads
  // start. Throws std::system_error.
  void onSignals(std::initializer_list<int> signals, std::function<void(int)> handler);

  // Runs until stop(), or until nothing is left to do if the loop has been stopped before.
  void run();
  // Runs until the condition, tested after each turn, holds; at most for the time given. Whether it holds.
  bool runUntil(const std::function<bool()>& condition, std::chrono::nanoseconds atMost);
  // Ends run() after the current turn. Any thread.
  void stop();

 private:
  struct Registration;
  struct Inbox;
  class Watch;

  void turn(bool maySleep);
  bool runPosted();
  void setAlarm();

  FileDescriptor epoll_;
  FileDescriptor wake_;
  FileDescriptor timer_;
  FileDescriptor signals_;
  std::unique_ptr<DescriptorWatch> signalWatch_;
  // Handlers that are registered; shared with their watches, which may outlive the loop.
  std::shared_ptr<std::map<std::uint64_t, std::shared_ptr<Registration>>> registrations_;
  std::uint64_t registered_ = 0;
  std::unique_ptr<Inbox> inbox_;
  std::deque<Task> running_;
  TimerQueue timers_;
  std::chrono::nanoseconds alarm_{0};
  std::atomic<bool> stopping_ = false;
  std::atomic<std::thread::id> runner_{};
};

}  // namespace probeview
