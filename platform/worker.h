// SPDX-License-Identifier: Apache-2.0
//
// Where a component lives: one thread with its queue, its timers and its clock. A component that is written against
// this runs on a real loop in a program and on a manual one in a test, unchanged.
#pragma once

#include <chrono>
#include <memory>

#include "platform/clock.h"
#include "platform/task_queue.h"

namespace probeview {

// Lets one thread wait for what another one does. What was written before open() may be read after wait() returned
// true.
class Gate {
 public:
  virtual ~Gate() = default;
  // Lets everybody through, now and later. Any thread.
  virtual void open() = 0;
  // Waits until the gate is open, at most for the time given; whether it is open.
  virtual bool wait(std::chrono::nanoseconds atMost) = 0;
};

// A gate between real threads.
std::shared_ptr<Gate> makeThreadGate();

class Worker : public TaskQueue, public Scheduler {
 public:
  virtual const Clock& clock() const = 0;
  // A gate for a caller outside this worker who waits for something that this worker does.
  virtual std::shared_ptr<Gate> makeGate() = 0;
};

}  // namespace probeview
