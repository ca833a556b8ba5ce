// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstddef>

#include "platform/clock.h"
#include "store/metric_validator.h"

namespace probeview {

// Tells when a store that fills from a service has got what there is to get: when something has come, and then no
// metric of another kind for a while. Main thread.
class FillWatch {
 public:
  static constexpr std::chrono::nanoseconds quiet = std::chrono::seconds(3);

  // Both must outlive the watch.
  FillWatch(const MetricValidator& store, const Clock& clock) : store_(store), clock_(clock) {}

  // To be asked often: it sees a kind come when it is asked.
  bool isFilled();

 private:
  const MetricValidator& store_;
  const Clock& clock_;
  std::size_t kinds_ = 0;
  std::chrono::nanoseconds lastChange_{};
};

}  // namespace probeview
