// SPDX-License-Identifier: Apache-2.0
//
// The scenario's own randomness. The standard's distributions differ from library to library; a scenario promises the
// same bytes for the same seed everywhere, so it brings its own generator and its own distributions.
#pragma once

#include <cstdint>

namespace probeview::scenario {

// Scrambles a number: equal in, equal out, and neighbouring numbers come out unrelated (the finaliser of SplitMix64).
constexpr std::uint64_t scramble(std::uint64_t number) {
  number += 0x9E3779B97F4A7C15U;
  number = (number ^ (number >> 30)) * 0xBF58476D1CE4E5B9U;
  number = (number ^ (number >> 27)) * 0x94D049BB133111EBU;
  return number ^ (number >> 31);
}

// Normally distributed with mean 0 and deviation 1, never beyond 3.5: the sum of the number's four 16-bit quarters.
constexpr double normalFrom(std::uint64_t bits) {
  const std::uint64_t sum = (bits & 0xFFFFU) + ((bits >> 16) & 0xFFFFU) + ((bits >> 32) & 0xFFFFU) + (bits >> 48);
  constexpr double mean = 2 * 65535.0;
  constexpr double deviation = 37837.227;  // 65536 / sqrt(12) * sqrt(4)
  return (static_cast<double>(sum) - mean) / deviation;
}

// A stream of random numbers. Everything that draws has a stream of its own, so that one more draw in one place does
// not change what happens in another.
class Random {
 public:
  Random(std::uint64_t seed, std::uint64_t stream) : state_(scramble(seed) ^ scramble(~stream)) {}

  std::uint64_t next() { return scramble(state_++); }
  // At least 0, below 1.
  double unit() { return static_cast<double>(next() >> 11) * 0x1.0p-53; }
  double between(double low, double high) { return low + (high - low) * unit(); }
  // At least low, at most high.
  std::int64_t integerBetween(std::int64_t low, std::int64_t high) {
    return low + static_cast<std::int64_t>(next() % static_cast<std::uint64_t>(high - low + 1));
  }
  bool chance(double probability) { return unit() < probability; }
  double normal() { return normalFrom(next()); }
  // The waiting time until the next of many independent events, never more than three times the mean.
  double exponential(double mean);

 private:
  std::uint64_t state_;
};

}  // namespace probeview::scenario
