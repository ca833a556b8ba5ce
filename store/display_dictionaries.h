// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

#include "messages/placed.h"

namespace probeview {

// The display dictionaries of the metric store, one per metric kind, in the order in which they are declared there:
// such as DisplayDictionary::myLTERRCStateDict.
enum class DisplayDictionary : std::uint8_t {
#define METRIC(constant, identifier, Class, dictionary, place, ...) dictionary = place,
#define METRIC_WITHOUT_HANDLER METRIC
#include "messages/metrics.inc"
};

// Their names, in the order of the enumeration; for tools that list or find them by name.
inline constexpr auto displayDictionaryNames = arranged<std::string_view>({
#define METRIC(constant, identifier, Class, dictionary, place, ...) {place, #dictionary},
#define METRIC_WITHOUT_HANDLER METRIC
#include "messages/metrics.inc"
});
inline constexpr std::size_t displayDictionaryCount = displayDictionaryNames.size();

constexpr std::string_view displayDictionaryName(DisplayDictionary dictionary) {
  return displayDictionaryNames[static_cast<std::size_t>(dictionary)];
}

// Absent when no display dictionary has that name.
constexpr std::optional<DisplayDictionary> displayDictionaryNamed(std::string_view name) {
  for (std::size_t index = 0; index < displayDictionaryCount; ++index) {
    if (displayDictionaryNames[index] == name) return static_cast<DisplayDictionary>(index);
  }
  return std::nullopt;
}

struct StoredMetric {
  std::int64_t metricID;
  DisplayDictionary dictionary;  // holds the metric's latest message
};

// The metrics that the store takes.
inline constexpr StoredMetric storedMetrics[] = {
#define METRIC(constant, identifier, Class, dictionary, ...) {identifier, DisplayDictionary::dictionary},
#include "messages/metrics.inc"
};

// Absent for a metric that the store does not take.
constexpr std::optional<DisplayDictionary> displayDictionaryOf(std::int64_t metricID) {
  for (const StoredMetric& metric : storedMetrics) {
    if (metric.metricID == metricID) return metric.dictionary;
  }
  return std::nullopt;
}

// Absent for the dictionary that nothing is stored into.
constexpr std::optional<std::int64_t> metricOf(DisplayDictionary dictionary) {
  for (const StoredMetric& metric : storedMetrics) {
    if (metric.dictionary == dictionary) return metric.metricID;
  }
  return std::nullopt;
}

}  // namespace probeview
