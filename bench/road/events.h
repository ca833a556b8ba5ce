// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

namespace probeview::bench {

// One metric as a source would report it.
struct MetricSample {
  std::int64_t metricId;
  std::vector<std::uint8_t> payload;
};

// The mixed stream: one of each of the kinds that the viewer takes.
std::vector<MetricSample> mixedStream();
// One kind alone, a hundred times with other values; empty when the viewer takes no such class.
std::vector<MetricSample> streamOf(std::string_view message);

}  // namespace probeview::bench
