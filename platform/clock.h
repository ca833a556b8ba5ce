// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>

namespace probeview {

// The time of day and the times that only go forward. Injected wherever time matters, so that tests own it.
class Clock {
 public:
  virtual ~Clock() = default;
  // Since 1970-01-01 UTC; may jump.
  virtual std::chrono::milliseconds wallTime() const = 0;
  // Since some moment in the past; never goes back. It stands still while the device sleeps, so that timers, periods
  // and deadlines go on afterwards where they were.
  virtual std::chrono::nanoseconds monotonicTime() const = 0;
  // Since some moment in the past, never set, and going on while the device sleeps: how old something is goes by this
  // and nothing else does. Not to be compared with monotonicTime().
  virtual std::chrono::nanoseconds ageTime() const = 0;
};

// The machine's own clocks. Any thread.
const Clock& systemClock();

}  // namespace probeview
