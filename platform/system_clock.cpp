// SPDX-License-Identifier: Apache-2.0
#include "platform/clock.h"

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
};

}  // namespace

const Clock& systemClock() {
  static const SystemClock clock;
  return clock;
}

}  // namespace probeview
