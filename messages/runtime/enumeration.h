// SPDX-License-Identifier: Apache-2.0
//
// Enumerations of messages: the constants to set a field to, and the names that its dictionary form shows.
//
//   PB_ENUMERATION(State, IDLE = 1, CONNECTED = 3);
//
// makes the constants State::IDLE and State::CONNECTED, and a table in which the value 3 has the name "CONNECTED". Each
// entry names its value, the values ascend. What is written is listed once: the names come from the constants' own
// text.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string_view>

namespace probeview {

struct EnumerationEntry {
  std::int32_t value = 0;
  std::string_view name;
};

// The named values in ascending order.
class EnumerationTable {
 public:
  constexpr explicit EnumerationTable(std::span<const EnumerationEntry> entries) noexcept : entries_(entries) {}

  constexpr std::span<const EnumerationEntry> entries() const noexcept { return entries_; }

  // The name of the value, a view of a constant; empty when it has none.
  constexpr std::string_view name(std::int32_t value) const noexcept {
    // Most tables have no gap: a value stands at its own distance from the first.
    const std::int64_t distance = std::int64_t{value} - entries_.front().value;
    if (distance < 0) return {};
    std::size_t low = 0;
    std::size_t high = entries_.size();
    if (static_cast<std::uint64_t>(distance) < high) {
      const auto index = static_cast<std::size_t>(distance);
      if (entries_[index].value == value) return entries_[index].name;
      high = index;  // a gap only moves the value towards the front
    }
    while (low < high) {
      const std::size_t middle = (low + high) / 2;
      if (entries_[middle].value == value) return entries_[middle].name;
      if (entries_[middle].value < value) {
        low = middle + 1;
      } else {
        high = middle;
      }
    }
    return {};
  }

  constexpr std::optional<std::int32_t> value(std::string_view name) const noexcept {
    for (const EnumerationEntry& entry : entries_) {
      if (entry.name == name) return entry.value;
    }
    return std::nullopt;
  }

 private:
  std::span<const EnumerationEntry> entries_;
};

namespace detail {

consteval std::size_t countEntries(std::string_view list) {
  std::size_t count = 1;
  for (const char character : list) count += character == ',' ? 1 : 0;
  return count;
}

// Reads "IDLE = 1, CONNECTED = 3"; what is anything else does not compile.
template <std::size_t Count>
consteval std::array<EnumerationEntry, Count> readEntries(std::string_view list) {
  std::array<EnumerationEntry, Count> entries;
  for (std::size_t index = 0; index < Count; ++index) {
    const std::size_t comma = list.find(',');
    std::string_view entry = list.substr(0, comma);
    list.remove_prefix(comma == std::string_view::npos ? list.size() : comma + 1);
    while (entry.front() == ' ') entry.remove_prefix(1);
    const std::size_t equals = entry.find(" = ");
    if (equals == std::string_view::npos) throw "each entry is written NAME = value";
    std::int32_t value = 0;
    for (const char digit : entry.substr(equals + 3)) {
      if (digit < '0' || digit > '9') throw "a value is a plain decimal number";
      value = 10 * value + (digit - '0');
    }
    if (index > 0 && entries[index - 1].value >= value) throw "the values ascend";
    entries[index] = {value, entry.substr(0, equals)};
  }
  return entries;
}

}  // namespace detail

// A macro, because only the preprocessor can turn the constants' names into text.
#define PB_ENUMERATION(Name, ...)                                                                \
  struct Name {                                                                                  \
    enum Value : std::int32_t { __VA_ARGS__ };                                                   \
    static constexpr std::string_view list = #__VA_ARGS__;                                       \
    static constexpr auto entries =                                                              \
        ::probeview::detail::readEntries<::probeview::detail::countEntries(#__VA_ARGS__)>(list); \
    static constexpr ::probeview::EnumerationTable table{entries};                               \
  }

}  // namespace probeview
