// SPDX-License-Identifier: Apache-2.0
#include "service/payload_check.h"

#include "messages/metric_identifiers.h"
#include "messages/runtime/codable.h"
#include "messages/runtime/data_reader.h"
#include "values/plain_text.h"

namespace probeview {

bool payloadDecodes(std::int64_t metricId, std::span<const std::uint8_t> payload) {
  const MetricIdentifier* metric = metricWithId(metricId);
  if (metric == nullptr || metric->message == nullptr) return true;
  const auto message = metric->message->make();
  PBDataReader reader(payload);
  return message->readFrom(reader);
}

std::string metricText(std::int64_t metricId) {
  const MetricIdentifier* metric = metricWithId(metricId);
  if (metric == nullptr) return hexText(metricId);
  return std::string(metric->name) + " (" + hexText(metricId) + ")";
}

}  // namespace probeview
