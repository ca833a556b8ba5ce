// SPDX-License-Identifier: Apache-2.0
#include "bench/road/events.h"

#include <string_view>

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

std::vector<MetricSample> streamOf(const char* message) {
  std::vector<MetricSample> stream;
  for (const MetricSample& sample : mixedStream()) {
    if (metricWithId(sample.metricId)->message->name == std::string_view(message)) stream.push_back(sample);
  }
  return stream;
}

}  // namespace probeview::bench
