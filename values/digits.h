// SPDX-License-Identifier: Apache-2.0
//
// Numbers as digits, at a place in memory that has room for them; each function returns the position behind the last
// digit.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string_view>

namespace probeview {

// What must be free for any integer: 20 digits or 19 and a minus, and one character more that is written over.
inline constexpr std::size_t roomForInteger = 21;
// The largest double has 309 digits before the point, the smallest 1074 behind it.
inline constexpr std::size_t roomForReal = 1100;

namespace detail {

// A number below 1000, as it begins a longer number and as it stands inside one.
struct DigitGroup {
  char leading[3];
  std::uint8_t length;  // of the leading digits
  char following[4];    // with all zeros; the last is padding
};
inline constexpr auto digitGroups = [] {
  std::array<DigitGroup, 1000> groups{};
  for (std::size_t number = 0; number < groups.size(); ++number) {
    DigitGroup& group = groups[number];
    std::size_t power = 100;
    for (int place = 0; place < 3; ++place, power /= 10) {
      const auto digit = static_cast<char>('0' + number / power % 10);
      group.following[place] = digit;
      if (number >= power || power == 1) group.leading[group.length++] = digit;
    }
  }
  return groups;
}();

// Four bytes are copied whatever the length, which costs less than to ask for it.
[[gnu::always_inline]] inline char* writeLeading(char* to, std::uint32_t below1000) noexcept {
  const DigitGroup& group = digitGroups[below1000];
  std::memcpy(to, &group, 4);
  return to + group.length;
}
[[gnu::always_inline]] inline char* writeFollowing(char* to, std::uint32_t below1000) noexcept {
  std::memcpy(to, digitGroups[below1000].following, 4);
  return to + 3;
}

// Of seven digits at least.
char* writeLongInteger(char* to, std::uint64_t number) noexcept;

}  // namespace detail

inline char* writeInteger(char* to, std::uint32_t number) noexcept {
  if (number < 1000) return detail::writeLeading(to, number);
  if (number >= 1'000'000) return detail::writeLongInteger(to, number);
  to = detail::writeLeading(to, number / 1000);
  return detail::writeFollowing(to, number % 1000);
}
inline char* writeInteger(char* to, std::int32_t number) noexcept {
  if (number >= 0) return writeInteger(to, static_cast<std::uint32_t>(number));
  *to = '-';
  // Negated as an unsigned number, so that the least one has its magnitude too.
  return writeInteger(to + 1, 0 - static_cast<std::uint32_t>(number));
}
inline char* writeInteger(char* to, std::uint64_t number) noexcept {
  if (number < 1'000'000) return writeInteger(to, static_cast<std::uint32_t>(number));
  return detail::writeLongInteger(to, number);
}
inline char* writeInteger(char* to, std::int64_t number) noexcept {
  if (number >= 0) return writeInteger(to, static_cast<std::uint64_t>(number));
  *to = '-';
  return writeInteger(to + 1, 0 - static_cast<std::uint64_t>(number));
}

// The shortest decimal that reads back, in fixed notation and with a point.
char* writeReal(char* to, float number) noexcept;
char* writeReal(char* to, double number) noexcept;

// Two lower-case hexadecimal digits for each byte.
char* writeHex(char* to, std::string_view bytes) noexcept;

}  // namespace probeview
