// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <vector>

namespace probeview::bench {

// One metric as a source would report it.
struct MetricSample {
  std::int64_t metricId;
  std::vector<std::uint8_t> payload;
};

// The mixed stream: one of each of the 29 kinds that the viewer takes.
std::vector<MetricSample> mixedStream();
// Of one class alone; empty when there is no such class in the mixed stream.
std::vector<MetricSample> streamOf(const char* message);

}  // namespace probeview::bench
