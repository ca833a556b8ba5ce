// SPDX-License-Identifier: Apache-2.0
#include "platform/timer_queue.h"

#include <vector>

#include "platform/fatal_error.h"

namespace probeview {

class TimerQueue::Handle final : public ScheduledTask {
 public:
  Handle(std::weak_ptr<State> state, std::shared_ptr<Timer> timer, std::uint64_t number)
      : state_(std::move(state)), timer_(std::move(timer)), number_(number) {}
  ~Handle() override {
    timer_->cancelled = true;
    if (const auto state = state_.lock()) state->timers.erase({timer_->due, number_});
  }

 private:
  std::weak_ptr<State> state_;
  std::shared_ptr<Timer> timer_;
  std::uint64_t number_;
};

ScheduledTaskHandle TimerQueue::add(std::chrono::nanoseconds due, std::optional<std::chrono::nanoseconds> interval,
                                    Task task) {
  if (interval && *interval <= std::chrono::nanoseconds::zero()) fatalError("a timer's interval must be positive");
  const auto timer = std::make_shared<Timer>(Timer{due, interval, std::move(task)});
  const std::uint64_t number = state_->added++;
  state_->timers.emplace(Place{due, number}, timer);
  return std::make_unique<Handle>(state_, timer, number);
}

std::optional<std::chrono::nanoseconds> TimerQueue::nextDue() const {
  if (state_->timers.empty()) return std::nullopt;
  return state_->timers.begin()->first.first;
}

void TimerQueue::runDue(std::chrono::nanoseconds now) {
  if (state_->timers.empty() || state_->timers.begin()->first.first > now) return;
  // A task may add, cancel and even end the loop that owns this queue.
  const auto state = state_;
  std::vector<std::pair<Place, std::shared_ptr<Timer>>> due;
  for (const auto& entry : state->timers) {
    if (entry.first.first > now) break;
    due.emplace_back(entry);
  }
  for (auto& [place, timer] : due) {
    if (timer->cancelled) continue;
    state->timers.erase(place);
    if (timer->interval) {
      // The phase is kept; turns that were missed are not made up for.
      const auto missed = (now - timer->due) / *timer->interval;
      timer->due += (missed + 1) * *timer->interval;
      state->timers.emplace(Place{timer->due, place.second}, timer);
    }
    timer->task();
  }
}

}  // namespace probeview
