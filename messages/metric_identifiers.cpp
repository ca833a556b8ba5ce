// SPDX-License-Identifier: Apache-2.0
#include "messages/metric_identifiers.h"

#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/nas_messages.h"
#include "messages/umts_messages.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

// Whether the message has a field of the number by which the metric's identifier is dropped. Two fields share that of
// the SIM files, as the service has it: they are written, but never read.
template <std::int64_t metric, typename Message>
consteval bool hidesAField() {
  constexpr unsigned number = metric & 0xFFFF;
  if constexpr (number < fieldNumberLimit && detail::hasField<Message, number>) {
    const std::string_view key = Message::pbField(FieldNumber<number>{}).name;
    return metric != K_SIM_FILE_INFO || (key != "Thresh_serving_lowQ" && key != "cr_offset");
  }
  return false;
}

#define OR_HIDES(Class) || hidesAField<metric, Class>()
template <std::int64_t metric>
constexpr bool hidesAnyField = false LTE_MESSAGES(OR_HIDES) UMTS_MESSAGES(OR_HIDES) GSM_MESSAGES(OR_HIDES)
    NAS_MESSAGES(OR_HIDES);
#undef OR_HIDES

#define METRIC(constant, ...) \
  static_assert(!hidesAnyField<constant>, "the low 16 bits of " #constant " are the number of a field");
#define METRIC_WITHOUT_HANDLER METRIC
#define METRIC_WITHOUT_CLASS METRIC
#include "messages/metrics.inc"

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

std::optional<std::int64_t> identifierNamed(std::string_view reference) noexcept {
  if (const MetricIdentifier* const metric = metricNamed(reference)) return metric->id;
  return parseInteger64(reference);
}

const MetricIdentifier* metricReferredTo(std::string_view reference) noexcept {
  const std::optional<std::int64_t> identifier = identifierNamed(reference);
  return identifier ? metricWithId(*identifier) : nullptr;
}

}  // namespace probeview
