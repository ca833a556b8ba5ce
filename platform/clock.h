// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>

namespace probeview {

// The time of day and the time that only goes forward. Injected wherever time matters, so that tests own it.
class Clock {
 public:
  virtual ~Clock() = default;
  // Since 1970-01-01 UTC; may jump.
  virtual std::chrono::milliseconds wallTime() const = 0;
  // Since some moment in the past; never goes back.
  virtual std::chrono::nanoseconds monotonicTime() const = 0;
};

// The machine's own clocks. Any thread.
const Clock& systemClock();

}  // namespace probeview
