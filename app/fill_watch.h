// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <optional>
#include <set>

#include "platform/clock.h"
#include "store/metric_validator.h"

namespace probeview {

// Tells when a store that fills from a service has got what there is to get: every metric that the service's sources
// can fill. Where the service does not say what they can: when something has come, and then no metric of another kind
// for a while. Main thread.
class FillWatch {
 public:
  static constexpr std::chrono::nanoseconds quiet = std::chrono::seconds(3);
  using FillableMetrics = std::function<std::optional<std::set<std::int64_t>>()>;

  // A service that has not said it is asked again after so long.
  static constexpr std::chrono::nanoseconds askAgainAfter = std::chrono::seconds(1);

  // Store and clock must outlive the watch. The service is asked when the first metric has come, until it says.
  FillWatch(const MetricValidator& store, const Clock& clock, FillableMetrics fillableMetrics)
      : store_(store), clock_(clock), fillableMetrics_(std::move(fillableMetrics)) {}

  // To be asked often: it sees a kind come when it is asked.
  bool isFilled();

 private:
  const MetricValidator& store_;
  const Clock& clock_;
  FillableMetrics fillableMetrics_;
  // The dictionaries of the metrics that can be filled.
  std::optional<std::set<DisplayDictionary>> expected_;
  std::chrono::nanoseconds nextQuestion_{};
  std::size_t kinds_ = 0;
  std::chrono::nanoseconds lastChange_{};
};

}  // namespace probeview
