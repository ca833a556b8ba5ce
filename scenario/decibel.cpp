// SPDX-License-Identifier: Apache-2.0
#include "scenario/decibel.h"

#include <bit>
#include <cmath>
#include <cstdint>

namespace probeview::scenario {

double logarithmOfTwo(double number) {
  const auto bits = std::bit_cast<std::uint64_t>(number);
  const auto exponent = static_cast<int>((bits >> 52) & 0x7FFU) - 1023;
  const double mantissa = std::bit_cast<double>((bits & 0x000FFFFFFFFFFFFFU) | 0x3FF0000000000000U);
  // ln m = 2 artanh((m - 1) / (m + 1)), whose argument is at most a third.
  const double t = (mantissa - 1.0) / (mantissa + 1.0);
  const double square = t * t;
  const double natural =
      2.0 * t * (1.0 + square * (1.0 / 3 + square * (1.0 / 5 + square * (1.0 / 7 + square * (1.0 / 9)))));
  constexpr double twoOfNatural = 1.4426950408889634;
  return static_cast<double>(exponent) + natural * twoOfNatural;
}

double toDecibels(double ratio) {
  constexpr double decibelsPerOctave = 3.0102999566398120;
  return logarithmOfTwo(ratio) * decibelsPerOctave;
}

double fromDecibels(double decibels) {
  constexpr double octavesPerDecibel = 0.3321928094887362;
  const double octaves = decibels * octavesPerDecibel;
  const double whole = std::floor(octaves + 0.5);  // exact, as floor always is
  const double x = (octaves - whole) * 0.6931471805599453;
  const double fraction =
      1.0 + x * (1.0 + x * (0.5 + x * (1.0 / 6 + x * (1.0 / 24 + x * (1.0 / 120 + x * (1.0 / 720))))));
  const auto exponent = static_cast<std::uint64_t>(static_cast<std::int64_t>(whole) + 1023);
  return fraction * std::bit_cast<double>(exponent << 52);
}

double arcCosineDegrees(double cosine) {
  // Abramowitz and Stegun, Handbook of Mathematical Functions, 4.4.45: off by less than 0.004 degrees.
  const double x = cosine < 0 ? -cosine : cosine;
  const double bounded = x > 1.0 ? 1.0 : x;
  const double radians =
      std::sqrt(1.0 - bounded) * (1.5707288 + bounded * (-0.2121144 + bounded * (0.0742610 + bounded * -0.0187293)));
  constexpr double degreesPerRadian = 57.29577951308232;
  const double degrees = radians * degreesPerRadian;
  return cosine < 0 ? 180.0 - degrees : degrees;
}

}  // namespace probeview::scenario
