// SPDX-License-Identifier: Apache-2.0
//
// What a number is a measure of: its unit and range, how it travels, and how a person reads it. The runtime gives the
// form alone; which quantities there are is said beside the messages.
#pragma once

#include <cstdint>
#include <limits>
#include <optional>
#include <span>
#include <string_view>

namespace probeview {

struct Range {
  double lowest = -std::numeric_limits<double>::infinity();
  double highest = std::numeric_limits<double>::infinity();

  constexpr bool isKnown() const { return lowest > -std::numeric_limits<double>::infinity(); }
  // Never of not-a-number.
  constexpr bool contains(double value) const { return value >= lowest && value <= highest; }
};

// Where people begin to call a value by that name; it reaches up to the next band's.
struct QualityBand {
  double lowest;
  std::string_view name;
};

//   number on the wire = round((value + offset) × scale)        value = number ÷ scale − offset
//
// or, with a table, the number is an index into it.
struct Quantity {
  std::string_view name = {};
  std::string_view unit = {};    // of the value: "dBm", "ms"; empty for what has none
  std::string_view clause = {};  // where the standard defines the quantity and its range
  double offset = 0;
  double scale = 1;
  std::span<const double> table = {};
  Range numbers = {};     // those that the standard lets travel
  Range values = {};      // what they stand for where that is not what the conversion makes of them
  Range measurable = {};  // the values that can be measured at all; a source leaves out others
  std::uint8_t bits = 0;  // of a number that is as wide as that; else 0
  // For people.
  std::uint8_t decimals = 0;
  bool isHexadecimal = false;  // an identity that people know in hexadecimal, too
  std::span<const QualityBand> bands = {};
  std::string_view bandsSource = {};

  constexpr bool isConverted() const { return offset != 0 || scale != 1 || !table.empty(); }
  // What a number on the wire stands for, by the conversion.
  constexpr double toValue(double number) const { return number / scale - offset; }
  constexpr bool isMeasurable(double value) const { return measurable.contains(value); }
  // What the numbers stand for; not known where they are not.
  constexpr Range valueRange() const {
    if (values.isKnown() || !numbers.isKnown()) return values;
    return {toValue(numbers.lowest), toValue(numbers.highest)};
  }

  // For a signed field. Numbers that no 32 bits hold are cut at their ends; not-a-number is 0.
  std::int32_t toSigned(double value) const;
  // For an unsigned field: what would be negative is 0, the weakest step.
  std::uint32_t toUnsigned(double value) const;
  // Where the value stands in the table, right to a hundredth; absent when it does not.
  std::optional<std::uint32_t> indexOf(double value) const;
};

}  // namespace probeview
