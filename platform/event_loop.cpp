// SPDX-License-Identifier: Apache-2.0
#include "platform/event_loop.h"

#include <pthread.h>
#include <signal.h>
#include <sys/epoll.h>
#include <sys/eventfd.h>
#include <sys/signalfd.h>
#include <sys/timerfd.h>

#include <array>
#include <cerrno>
#include <mutex>
#include <system_error>
#include <utility>

namespace probeview {

namespace {

FileDescriptor checked(int descriptor, const char* what) {
  if (descriptor < 0) throw std::system_error(errno, std::generic_category(), what);
  return FileDescriptor(descriptor);
}

std::uint32_t eventsOf(Readiness interest) {
  return (interest.readable ? static_cast<std::uint32_t>(EPOLLIN) : 0U) |
         (interest.writable ? static_cast<std::uint32_t>(EPOLLOUT) : 0U);
}

// Numbers below the first registration that mean the loop's own descriptors.
constexpr std::uint64_t wakeNumber = 0;
constexpr std::uint64_t timerNumber = 1;
constexpr std::uint64_t firstNumber = 2;

void addTo(const FileDescriptor& epoll, const FileDescriptor& descriptor, std::uint64_t number) {
  epoll_event event{};
  event.events = EPOLLIN;
  event.data.u64 = number;
  if (::epoll_ctl(epoll.number(), EPOLL_CTL_ADD, descriptor.number(), &event) != 0) {
    throw std::system_error(errno, std::generic_category(), "epoll_ctl");
  }
}

// Empties a counting descriptor; there is nothing to do about an error.
void drain(const FileDescriptor& descriptor) {
  std::uint64_t count;
  [[maybe_unused]] const ssize_t got = ::read(descriptor.number(), &count, sizeof count);
}

}  // namespace

struct EventLoop::Registration {
  std::function<void(Readiness)> handler;
};

struct EventLoop::Inbox {
  std::mutex mutex;
  std::deque<Task> tasks;
};

class EventLoop::Watch final : public DescriptorWatch {
 public:
  Watch(std::weak_ptr<std::map<std::uint64_t, std::shared_ptr<Registration>>> registrations, int epoll, int descriptor,
        std::uint64_t number, Readiness interest)
      : registrations_(std::move(registrations)),
        epoll_(epoll),
        descriptor_(descriptor),
        number_(number),
        interest_(eventsOf(interest)) {}
  ~Watch() override {
    const auto registrations = registrations_.lock();
    if (!registrations) return;
    ::epoll_ctl(epoll_, EPOLL_CTL_DEL, descriptor_, nullptr);
    registrations->erase(number_);
  }
  void setInterest(Readiness interest) override {
    const std::uint32_t events = eventsOf(interest);
    if (events == interest_ || registrations_.expired()) return;
    interest_ = events;
    epoll_event event{};
    event.events = events;
    event.data.u64 = number_;
    ::epoll_ctl(epoll_, EPOLL_CTL_MOD, descriptor_, &event);
  }

 private:
  std::weak_ptr<std::map<std::uint64_t, std::shared_ptr<Registration>>> registrations_;
  int epoll_;
  int descriptor_;
  std::uint64_t number_;
  std::uint32_t interest_;
};

EventLoop::EventLoop()
    : epoll_(checked(::epoll_create1(EPOLL_CLOEXEC), "epoll_create1")),
      wake_(checked(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK), "eventfd")),
      timer_(checked(::timerfd_create(CLOCK_MONOTONIC, TFD_CLOEXEC | TFD_NONBLOCK), "timerfd_create")),
      registrations_(std::make_shared<std::map<std::uint64_t, std::shared_ptr<Registration>>>()),
      registered_(firstNumber),
      inbox_(std::make_unique<Inbox>()) {
  addTo(epoll_, wake_, wakeNumber);
  addTo(epoll_, timer_, timerNumber);
}

EventLoop::~EventLoop() {
  // Tasks that never ran may own watches and timers of this loop, and post more as they go: all that while it is whole.
  std::deque<Task> left;
  left.swap(running_);
  do {
    left.clear();
    const std::lock_guard lock(inbox_->mutex);
    left.swap(inbox_->tasks);
  } while (!left.empty());
  signalWatch_.reset();
}

void EventLoop::post(Task task) {
  // Woken under the lock: once it is free, the task may run and end this loop, and its descriptors with it.
  const std::lock_guard lock(inbox_->mutex);
  const bool wasEmpty = inbox_->tasks.empty();
  inbox_->tasks.push_back(std::move(task));
  // One wake-up for all that gathers until the loop looks; the loop itself looks before it sleeps.
  if (wasEmpty && runner_.load(std::memory_order_relaxed) != std::this_thread::get_id()) {
    const std::uint64_t one = 1;
    [[maybe_unused]] const ssize_t put = ::write(wake_.number(), &one, sizeof one);
  }
}

ScheduledTaskHandle EventLoop::after(std::chrono::nanoseconds delay, Task task) {
  return timers_.add(clock().monotonicTime() + delay, std::nullopt, std::move(task));
}

ScheduledTaskHandle EventLoop::every(std::chrono::nanoseconds interval, Task task) {
  return timers_.add(clock().monotonicTime() + interval, interval, std::move(task));
}

std::unique_ptr<DescriptorWatch> EventLoop::watch(int descriptor, Readiness interest,
                                                  std::function<void(Readiness)> handler) {
  const std::uint64_t number = registered_++;
  epoll_event event{};
  event.events = eventsOf(interest);
  event.data.u64 = number;
  if (::epoll_ctl(epoll_.number(), EPOLL_CTL_ADD, descriptor, &event) != 0) return nullptr;
  registrations_->emplace(number, std::make_shared<Registration>(Registration{std::move(handler)}));
  return std::make_unique<Watch>(registrations_, epoll_.number(), descriptor, number, interest);
}

void EventLoop::onSignals(std::initializer_list<int> signals, std::function<void(int)> handler) {
  sigset_t set;
  sigemptyset(&set);
  for (const int number : signals) sigaddset(&set, number);
  pthread_sigmask(SIG_BLOCK, &set, nullptr);
  signals_ = checked(::signalfd(-1, &set, SFD_CLOEXEC | SFD_NONBLOCK), "signalfd");
  signalWatch_ = watch(signals_.number(), {.readable = true},
                       [descriptor = signals_.number(), handle = std::move(handler)](Readiness) {
                         signalfd_siginfo information;
                         while (::read(descriptor, &information, sizeof information) == sizeof information) {
                           handle(static_cast<int>(information.ssi_signo));
                         }
                       });
  if (!signalWatch_) throw std::system_error(errno, std::generic_category(), "epoll_ctl");
}

void EventLoop::run() {
  runner_ = std::this_thread::get_id();
  while (!stopping_) turn(true);
  runner_ = std::thread::id();
}

bool EventLoop::runUntil(const std::function<bool()>& condition, std::chrono::nanoseconds atMost) {
  runner_ = std::this_thread::get_id();
  bool late = false;
  const auto deadline = after(atMost, [&late] { late = true; });
  bool holds = condition();
  while (!holds && !late) {
    turn(true);
    holds = condition();
  }
  runner_ = std::thread::id();
  return holds;
}

void EventLoop::stop() {
  post([this] { stopping_ = true; });
}

bool EventLoop::runPosted() {
  {
    const std::lock_guard lock(inbox_->mutex);
    if (running_.empty()) {
      running_.swap(inbox_->tasks);
    } else {
      for (Task& task : inbox_->tasks) running_.push_back(std::move(task));
      inbox_->tasks.clear();
    }
  }
  if (running_.empty()) return false;
  // Taken out before it runs: a task that throws is gone, those after it stay.
  while (!running_.empty()) {
    const Task task = std::move(running_.front());
    running_.pop_front();
    task();
  }
  return true;
}

void EventLoop::setAlarm() {
  const auto next = timers_.nextDue().value_or(std::chrono::nanoseconds::zero());
  if (next == alarm_) return;
  alarm_ = next;
  const auto seconds = std::chrono::duration_cast<std::chrono::seconds>(next);
  itimerspec setting{};
  setting.it_value.tv_sec = static_cast<time_t>(seconds.count());
  setting.it_value.tv_nsec = static_cast<long>((next - seconds).count());
  ::timerfd_settime(timer_.number(), TFD_TIMER_ABSTIME, &setting, nullptr);
}

void EventLoop::turn(bool maySleep) {
  setAlarm();
  {
    const std::lock_guard lock(inbox_->mutex);
    if (!inbox_->tasks.empty() || !running_.empty()) maySleep = false;
  }
  std::array<epoll_event, 64> ready;
  const int count = ::epoll_wait(epoll_.number(), ready.data(), static_cast<int>(ready.size()), maySleep ? -1 : 0);
  for (int index = 0; index < count; ++index) {
    const epoll_event& event = ready[static_cast<std::size_t>(index)];
    if (event.data.u64 == wakeNumber) {
      drain(wake_);
    } else if (event.data.u64 == timerNumber) {
      drain(timer_);
      // The alarm has gone off; whatever is next must be set anew.
      alarm_ = std::chrono::nanoseconds::zero();
    } else {
      // A handler before this one may have ended this watch.
      const auto found = registrations_->find(event.data.u64);
      if (found == registrations_->end()) continue;
      const auto registration = found->second;
      registration->handler({.readable = (event.events & (EPOLLIN | EPOLLERR | EPOLLHUP)) != 0,
                             .writable = (event.events & EPOLLOUT) != 0});
    }
  }
  timers_.runDue(clock().monotonicTime());
  runPosted();
}

}  // namespace probeview
