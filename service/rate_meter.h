// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <algorithm>
#include <array>
#include <chrono>
#include <cstdint>

namespace probeview {

// How many things happened per second lately. Counts as it is told and needs no timer.
class RateMeter {
 public:
  void add(std::chrono::nanoseconds now, std::uint64_t count = 1) {
    const std::int64_t second = secondOf(now);
    Bucket& bucket = buckets_[index(second)];
    if (bucket.second != second) bucket = {second, 0};
    bucket.count += count;
  }

  // The mean over the last whole seconds, up to ten of them; of what there is when it is younger.
  double perSecond(std::chrono::nanoseconds now, std::chrono::nanoseconds since) const {
    const std::int64_t present = secondOf(now);
    const std::int64_t first = std::max(present - window, secondOf(since));
    if (first >= present) return 0.0;
    std::uint64_t total = 0;
    for (const Bucket& bucket : buckets_) {
      if (bucket.second >= first && bucket.second < present) total += bucket.count;
    }
    return static_cast<double>(total) / static_cast<double>(present - first);
  }

 private:
  static constexpr std::int64_t window = 10;
  struct Bucket {
    std::int64_t second = -1;
    std::uint64_t count = 0;
  };
  static std::int64_t secondOf(std::chrono::nanoseconds time) {
    return std::chrono::duration_cast<std::chrono::seconds>(time).count();
  }
  static std::size_t index(std::int64_t second) { return static_cast<std::size_t>(second % (window + 1)); }

  std::array<Bucket, window + 1> buckets_{};
};

}  // namespace probeview
