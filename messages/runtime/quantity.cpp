// SPDX-License-Identifier: Apache-2.0
#include "messages/runtime/quantity.h"

#include <algorithm>
#include <cmath>

namespace probeview {

namespace {

double numberOf(const Quantity& quantity, double value, double lowestNumber) {
  const double number = std::round((value + quantity.offset) * quantity.scale);
  if (std::isnan(number)) return 0;
  return std::clamp(number, lowestNumber, double{std::numeric_limits<std::int32_t>::max()});
}

}  // namespace

std::int32_t Quantity::toSigned(double value) const {
  return static_cast<std::int32_t>(numberOf(*this, value, std::numeric_limits<std::int32_t>::min()));
}

std::uint32_t Quantity::toUnsigned(double value) const { return static_cast<std::uint32_t>(numberOf(*this, value, 0)); }

std::optional<std::uint32_t> Quantity::indexOf(double value) const {
  for (std::uint32_t index = 0; index < table.size(); ++index) {
    if (std::abs(table[index] - value) < 0.01) return index;
  }
  return std::nullopt;
}

}  // namespace probeview
