// SPDX-License-Identifier: Apache-2.0
#include "bench/road/events.h"

#include "bench/payloads.h"
#include "messages/metric_identifiers.h"

namespace probeview::bench {

std::vector<MetricSample> mixedStream() {
  std::vector<MetricSample> stream;
  for (const Payload& payload : payloadSet("f").payloads) {
    for (const MetricIdentifier& metric : metricIdentifiers()) {
      if (metric.isHandled && metric.message->name == payload.message) stream.push_back({metric.id, payload.bytes});
    }
  }
  return stream;
}

std::vector<MetricSample> streamOf(std::string_view message) {
  std::vector<MetricSample> stream;
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    if (!metric.isHandled || metric.message->name != message) continue;
    for (std::uint64_t seed = 1; seed <= 100; ++seed) stream.push_back({metric.id, payloadOf(message, seed)});
  }
  return stream;
}

}  // namespace probeview::bench
