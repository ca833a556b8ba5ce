// SPDX-License-Identifier: Apache-2.0
#include "platform/manual_loop.h"

#include <algorithm>
#include <condition_variable>
#include <deque>
#include <mutex>
#include <optional>
#include <utility>

namespace probeview {

struct ManualLoop::Inbox {
  std::mutex mutex;
  std::condition_variable filled;
  std::deque<Task> tasks;
};

class ManualLoop::RunningGate final : public Gate {
 public:
  explicit RunningGate(ManualLoop& loop) : loop_(loop) {}
  void open() override { open_ = true; }
  bool wait(std::chrono::nanoseconds atMost) override {
    const auto deadline = loop_.now_ + atMost;
    while (!open_) {
      if (loop_.runOne()) continue;
      if (loop_.now_ >= deadline) return false;
      const auto left = deadline - loop_.now_;
      loop_.advance(std::min(loop_.untilNextTimer().value_or(left), left));
    }
    return true;
  }

 private:
  ManualLoop& loop_;
  bool open_ = false;
};

ManualLoop::ManualLoop(std::chrono::milliseconds wallTime)
    : inbox_(std::make_unique<Inbox>()), wallOffset_(wallTime - now_) {}

ManualLoop::~ManualLoop() {
  // Tasks that never ran may own timers of this loop, and post more as they go.
  std::deque<Task> left;
  do {
    left.clear();
    const std::lock_guard lock(inbox_->mutex);
    left.swap(inbox_->tasks);
  } while (!left.empty());
}

void ManualLoop::post(Task task) {
  // Signalled under the lock: once it is free, the task may run and end this loop, and the signal with it.
  const std::lock_guard lock(inbox_->mutex);
  inbox_->tasks.push_back(std::move(task));
  inbox_->filled.notify_one();
}

ScheduledTaskHandle ManualLoop::after(std::chrono::nanoseconds delay, Task task) {
  return timers_.add(now_ + delay, std::nullopt, std::move(task));
}

ScheduledTaskHandle ManualLoop::every(std::chrono::nanoseconds interval, Task task) {
  return timers_.add(now_ + interval, interval, std::move(task));
}

std::shared_ptr<Gate> ManualLoop::makeGate() { return std::make_shared<RunningGate>(*this); }

std::chrono::milliseconds ManualLoop::wallTime() const {
  return std::chrono::duration_cast<std::chrono::milliseconds>(now_ + wallOffset_);
}

void ManualLoop::setWallTime(std::chrono::milliseconds wallTime) { wallOffset_ = wallTime - now_; }

void ManualLoop::sleep(std::chrono::nanoseconds time) {
  slept_ += time;
  wallOffset_ += time;
}

bool ManualLoop::runOne() {
  Task task;
  {
    const std::lock_guard lock(inbox_->mutex);
    if (inbox_->tasks.empty()) return false;
    task = std::move(inbox_->tasks.front());
    inbox_->tasks.pop_front();
  }
  task();
  return true;
}

std::size_t ManualLoop::run() {
  std::size_t count = 0;
  while (runOne()) ++count;
  return count;
}

void ManualLoop::advance(std::chrono::nanoseconds time) {
  const auto target = now_ + time;
  run();
  while (const auto next = timers_.nextDue()) {
    if (*next > target) break;
    now_ = std::max(now_, *next);
    timers_.runDue(now_);
    run();
  }
  now_ = std::max(now_, target);
}

std::optional<std::chrono::nanoseconds> ManualLoop::untilNextTimer() const {
  const std::optional<std::chrono::nanoseconds> next = timers_.nextDue();
  if (!next) return std::nullopt;
  return std::max(*next - now_, std::chrono::nanoseconds::zero());
}

bool ManualLoop::waitForTask(std::chrono::nanoseconds atMost) {
  std::unique_lock lock(inbox_->mutex);
  return inbox_->filled.wait_for(lock, atMost, [this] { return !inbox_->tasks.empty(); });
}

bool ManualLoop::runUntil(const std::function<bool()>& condition, std::chrono::nanoseconds atMost) {
  const auto deadline = systemClock().monotonicTime() + atMost;
  while (!condition()) {
    if (runOne()) continue;
    const auto now = systemClock().monotonicTime();
    if (now >= deadline) return false;
    // The condition may also depend on what other threads do without posting; look again now and then.
    waitForTask(std::min<std::chrono::nanoseconds>(deadline - now, std::chrono::milliseconds(20)));
  }
  return true;
}

}  // namespace probeview
