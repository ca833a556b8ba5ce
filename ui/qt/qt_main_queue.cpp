// SPDX-License-Identifier: Apache-2.0
#include "ui/qt/qt_main_queue.h"

#include <QMetaObject>
#include <QTimer>
#include <utility>

namespace probeview::qt {

namespace {

class QtScheduledTask final : public ScheduledTask {
 public:
  QtScheduledTask(std::chrono::nanoseconds interval, bool once, Task task) : task_(std::move(task)) {
    timer_.setTimerType(Qt::PreciseTimer);
    timer_.setSingleShot(once);
    // A task may drop its own handle, and with it this object: it runs from a copy.
    QObject::connect(&timer_, &QTimer::timeout, &timer_, [this] {
      const Task running = task_;
      running();
    });
    // Rounded up: never early.
    timer_.start(std::chrono::ceil<std::chrono::milliseconds>(interval));
  }

 private:
  Task task_;
  QTimer timer_;
};

}  // namespace

void QtMainQueue::post(Task task) { QMetaObject::invokeMethod(&receiver_, std::move(task), Qt::QueuedConnection); }

ScheduledTaskHandle QtScheduler::after(std::chrono::nanoseconds delay, Task task) {
  return std::make_unique<QtScheduledTask>(delay, true, std::move(task));
}

ScheduledTaskHandle QtScheduler::every(std::chrono::nanoseconds interval, Task task) {
  return std::make_unique<QtScheduledTask>(interval, false, std::move(task));
}

}  // namespace probeview::qt
