// SPDX-License-Identifier: Apache-2.0
#include "values/digits.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>

namespace probeview {

namespace {

char* writeText(char* to, std::string_view text) noexcept { return std::copy(text.begin(), text.end(), to); }

template <typename Real>
char* writeShortest(char* to, Real number) noexcept {
  // No radio quantity is infinite; should one ever be, it must not print as a plausible number.
  if (std::isnan(number)) return writeText(to, "nan");
  if (std::isinf(number)) return writeText(to, number < 0 ? "-inf" : "inf");
  char* const end = std::to_chars(to, to + roomForReal, number, std::chars_format::fixed).ptr;
  return std::find(to, end, '.') == end ? writeText(end, ".0") : end;
}

// Sixteen bytes at once: the compilers make one vector instruction of each operation, or several where there is none.
using Bytes = std::uint8_t __attribute__((vector_size(16)));

// The hexadecimal digits of numbers below 16.
inline Bytes hexDigits(Bytes numbers) noexcept {
  constexpr std::uint8_t fromTenOn = 'a' - '0' - 10;
  return numbers + '0' + (reinterpret_cast<Bytes>(numbers > 9) & fromTenOn);
}

// The two digits of each byte, for what is left.
constexpr auto hexPairs = [] {
  constexpr std::string_view digits = "0123456789abcdef";
  std::array<std::array<char, 2>, 256> pairs{};
  for (std::size_t byte = 0; byte < pairs.size(); ++byte) pairs[byte] = {digits[byte >> 4], digits[byte & 15]};
  return pairs;
}();

}  // namespace

char* detail::writeLongInteger(char* to, std::uint64_t number) noexcept {
  if (number < 1'000'000'000) {
    to = writeInteger(to, static_cast<std::uint32_t>(number / 1000));
    return writeFollowing(to, static_cast<std::uint32_t>(number % 1000));
  }
  to = writeInteger(to, number / 1'000'000'000);
  const auto nine = static_cast<std::uint32_t>(number % 1'000'000'000);
  to = writeFollowing(to, nine / 1'000'000);
  to = writeFollowing(to, nine / 1000 % 1000);
  return writeFollowing(to, nine % 1000);
}

char* writeReal(char* to, float number) noexcept { return writeShortest(to, number); }
char* writeReal(char* to, double number) noexcept { return writeShortest(to, number); }

char* writeHex(char* to, std::string_view bytes) noexcept {
  for (; bytes.size() >= sizeof(Bytes); bytes.remove_prefix(sizeof(Bytes))) {
    Bytes sixteen;
    std::memcpy(&sixteen, bytes.data(), sizeof sixteen);
    const Bytes high = hexDigits(sixteen >> 4);
    const Bytes low = hexDigits(sixteen & 15);
    const std::array digits = {
        __builtin_shufflevector(high, low, 0, 16, 1, 17, 2, 18, 3, 19, 4, 20, 5, 21, 6, 22, 7, 23),
        __builtin_shufflevector(high, low, 8, 24, 9, 25, 10, 26, 11, 27, 12, 28, 13, 29, 14, 30, 15, 31)};
    std::memcpy(to, &digits, sizeof digits);
    to += sizeof digits;
  }
  for (const char character : bytes) {
    std::memcpy(to, &hexPairs[static_cast<unsigned char>(character)], 2);
    to += 2;
  }
  return to;
}

}  // namespace probeview
