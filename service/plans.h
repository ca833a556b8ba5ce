// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>
#include <span>

#include "source/metric_source.h"

namespace probeview {

// What all plans together ask for, each metric at the shortest period; "on every change" is more than any period, as it
// leaves nothing out. Absent when there is no plan at all, observed or not: then sources run at their own periods.
std::optional<MetricPlan> unite(std::span<const MetricPlan* const> plans, bool observed);

}  // namespace probeview
