// SPDX-License-Identifier: Apache-2.0
#pragma once

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
  static bool isValidMetricIdTag(std::uint32_t tag, std::string_view forClass, LineSink* log = nullptr);

  // Fast, and silent. Below 64 only one number is that of a metric, so that the fields of messages need one comparison.
  static constexpr bool isMetricId(std::uint32_t number) noexcept {
    return number == lowestMetricId || (number >= secondMetricId && isHighMetricId(number));
  }

  static std::span<const Row> rows() noexcept;

 private:
  static constexpr std::uint32_t lowestMetricId = 19;
  static constexpr std::uint32_t secondMetricId = 11788;
  static bool isHighMetricId(std::uint32_t number) noexcept;
};

}  // namespace probeview
