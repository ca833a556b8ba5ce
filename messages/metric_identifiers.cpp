// SPDX-License-Identifier: Apache-2.0
#include "messages/metric_identifiers.h"

#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/nas_messages.h"
#include "messages/umts_messages.h"

namespace probeview {

namespace {

constexpr MetricIdentifier metrics[] = {
#define METRIC(constant, identifier, Class, ...) {constant, #constant, &Class::pbDescriptor, true},
#define METRIC_WITHOUT_HANDLER(constant, ...) {constant, #constant, nullptr, false},
#define METRIC_WITHOUT_CLASS(constant, ...) {constant, #constant, nullptr, false},
#include "messages/metrics.inc"
};

}  // namespace

std::span<const MetricIdentifier> metricIdentifiers() noexcept { return metrics; }

const MetricIdentifier* metricWithId(std::int64_t id) noexcept {
  for (const MetricIdentifier& metric : metrics) {
    if (metric.id == id) return &metric;
  }
  return nullptr;
}

const MetricIdentifier* metricNamed(std::string_view name) noexcept {
  for (const MetricIdentifier& metric : metrics) {
    if (metric.name == name) return &metric;
  }
  return nullptr;
}

}  // namespace probeview
