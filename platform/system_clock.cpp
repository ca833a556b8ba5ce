// SPDX-License-Identifier: Apache-2.0
#include "platform/clock.h"

#include <time.h>

namespace probeview {

namespace {

class SystemClock final : public Clock {
 public:
  std::chrono::milliseconds wallTime() const override {
    return std::chrono::duration_cast<std::chrono::milliseconds>(std::chrono::system_clock::now().time_since_epoch());
  }
  std::chrono::nanoseconds monotonicTime() const override {
    return std::chrono::duration_cast<std::chrono::nanoseconds>(std::chrono::steady_clock::now().time_since_epoch());
  }
  std::chrono::nanoseconds ageTime() const override {
    // std::chrono knows no clock that counts a suspended machine's time.
    timespec now{};
    ::clock_gettime(CLOCK_BOOTTIME, &now);
    return std::chrono::seconds(now.tv_sec) + std::chrono::nanoseconds(now.tv_nsec);
  }
};

}  // namespace

const Clock& systemClock() {
  // Never destroyed: a loop on another thread may still ask for the time while the process ends.
  static const auto* clock = new SystemClock;
  return *clock;
}

}  // namespace probeview
