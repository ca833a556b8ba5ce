// SPDX-License-Identifier: Apache-2.0
//
// The metrics of the baseband manager service by their identifiers.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string_view>

#include "messages/runtime/field_descriptor.h"

namespace probeview {

// The constants, such as K_LTE_RRC_STATE.
#define METRIC(constant, identifier, ...) inline constexpr std::int64_t constant = identifier;
#define METRIC_WITHOUT_HANDLER METRIC
#define METRIC_WITHOUT_CLASS METRIC
#include "messages/metrics.inc"

struct MetricIdentifier {
  std::int64_t id;
  std::string_view name;  // of the constant, such as "K_LTE_RRC_STATE"
  // What its payload is decoded as; null for those that are left alone. For K_LTE_RLF there is no class;
  // K_LTE_SCELL_MEAS has one, KCellularLteServingCellMeasurement, which nothing uses.
  const MessageDescriptor* message;
  bool isHandled;  // whether the store takes it
};

// All metrics; the order is fixed.
std::span<const MetricIdentifier> metricIdentifiers() noexcept;

// Null when there is no such metric.
const MetricIdentifier* metricWithId(std::int64_t id) noexcept;
const MetricIdentifier* metricNamed(std::string_view name) noexcept;

// The identifier that a text names: a metric's, by the metric's name, or the number itself (decimal or 0x…), which need
// not be a metric's.
std::optional<std::int64_t> identifierNamed(std::string_view reference) noexcept;
// The metric that a text names, by its name or its identifier; null where there is none.
const MetricIdentifier* metricReferredTo(std::string_view reference) noexcept;

}  // namespace probeview
