// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <algorithm>
#include <array>
#include <cstdint>
#include <span>
#include <string_view>

#include "values/line_sink.h"

namespace probeview {

// The numbers of metrics, in their short form of 16 bits. A field that carries one of them as its number is no field:
// it is what remains of a metric's envelope, and decoding drops it.
class KBBMetricUtility {
 public:
  struct Row {
    std::uint16_t metricId;
    std::string_view name;
  };

  // Whether the number is that of a metric; says "valid metricId tag" to the log if so. The class plays no part.
  static constexpr bool isValidMetricIdTag(std::uint32_t tag, std::string_view /*forClass*/, LineSink* log = nullptr) {
    if (!isMetricId(tag)) return false;
    if (log != nullptr) log->line("valid metricId tag");
    return true;
  }

  // Fast, and silent: hardly a metric's number is as low as those of fields, which need two comparisons.
  static constexpr bool isMetricId(std::uint32_t number) noexcept {
    return number == sortedIds[0] ||
           (number >= sortedIds[1] && std::binary_search(sortedIds.begin(), sortedIds.end(), number));
  }

  static std::span<const Row> rows() noexcept;

 private:
  static constexpr auto sortedIds = [] {
    auto ids = std::to_array<std::uint16_t>({
#define METRIC(constant, identifier, ...) identifier & 0xFFFF,
#define METRIC_WITHOUT_HANDLER METRIC
#define METRIC_WITHOUT_CLASS METRIC
#include "messages/metrics.inc"
    });
    std::sort(ids.begin(), ids.end());
    return ids;
  }();
  static_assert(std::adjacent_find(sortedIds.begin(), sortedIds.end()) == sortedIds.end(),
                "two metrics share their low 16 bits");
};

}  // namespace probeview
