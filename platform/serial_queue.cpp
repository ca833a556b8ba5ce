// SPDX-License-Identifier: Apache-2.0
#include "platform/serial_queue.h"

#include <condition_variable>
#include <deque>
#include <map>
#include <mutex>
#include <thread>
#include <utility>

#include "platform/threads.h"
#include "platform/worker.h"

namespace probeview {

struct SerialQueue::Shared {
  std::mutex mutex;
  std::condition_variable changed;
  std::deque<Task> tasks;
  bool ending = false;
  std::thread thread;

  void run() {
    std::deque<Task> batch;
    std::unique_lock lock(mutex);
    while (true) {
      changed.wait(lock, [this] { return ending || !tasks.empty(); });
      if (tasks.empty()) return;
      // One lock for all that has gathered, not one for each task.
      batch.swap(tasks);
      lock.unlock();
      for (; !batch.empty(); batch.pop_front()) batch.front()();
      lock.lock();
    }
  }
};

SerialQueue::SerialQueue(std::string label) : label_(std::move(label)), shared_(std::make_shared<Shared>()) {
  shared_->thread = startThread(label_, [shared = shared_] { shared->run(); });
}

SerialQueue::~SerialQueue() {
  {
    const std::lock_guard lock(shared_->mutex);
    shared_->ending = true;
  }
  shared_->changed.notify_one();
  if (shared_->thread.get_id() == std::this_thread::get_id()) {
    shared_->thread.detach();
  } else {
    shared_->thread.join();
  }
}

void SerialQueue::post(Task task) {
  // The task may be the one that destroys this queue, and run before this call is over.
  const std::shared_ptr<Shared> shared = shared_;
  bool wasEmpty;
  {
    const std::lock_guard lock(shared->mutex);
    wasEmpty = shared->tasks.empty();
    shared->tasks.push_back(std::move(task));
  }
  if (wasEmpty) shared->changed.notify_one();
}

void SerialQueue::waitUntilIdle() {
  const auto gate = makeThreadGate();
  post([gate] { gate->open(); });
  gate->wait(std::chrono::hours(24));
}

const std::shared_ptr<SerialQueue>& onceCreatedQueue(std::string_view label) {
  static auto& mutex = *new std::mutex;
  static auto& queues = *new std::map<std::string, std::shared_ptr<SerialQueue>, std::less<>>;
  const std::lock_guard lock(mutex);
  auto found = queues.find(label);
  if (found == queues.end()) {
    found = queues.emplace(std::string(label), std::make_shared<SerialQueue>(std::string(label))).first;
  }
  return found->second;
}

}  // namespace probeview
