// SPDX-License-Identifier: Apache-2.0
#include "service/plans.h"

#include <algorithm>

namespace probeview {

std::optional<MetricPlan> unite(std::span<const MetricPlan* const> plans, bool observed) {
  if (plans.empty()) return std::nullopt;
  MetricPlan all{.metrics = {}, .observed = observed};
  for (const MetricPlan* plan : plans) {
    for (const auto& [metric, period] : plan->metrics) {
      const auto [place, isNew] = all.metrics.try_emplace(metric, period);
      if (isNew) continue;
      // An absent period, on every change, counts as the least of all.
      place->second = std::min(place->second, period);
    }
  }
  return all;
}

}  // namespace probeview
