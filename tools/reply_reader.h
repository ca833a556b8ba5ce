// SPDX-License-Identifier: Apache-2.0
//
// What a service answers, looked at as a file would be: it is another program, and perhaps not the one that we know. A
// value that is missing, of another kind, or that cannot be meant (a rate that is no number, a time of no calendar) is
// absent and shows as "?".
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "values/dictionary.h"

namespace probeview {

class ReplyReader {
 public:
  // More entries than these are not looked at: more than a service has clients and sources.
  static constexpr std::size_t mostEntries = 1000;
  static constexpr std::size_t longestText = 1024;
  // A year 9999 has 253402300799999 ms; nothing runs as long.
  static constexpr std::int64_t latestTime = 253'402'300'799'999;

  // The reply must outlive it.
  explicit ReplyReader(const Dictionary& reply) : reply_(&reply) {}

  bool contains(std::string_view key) const { return reply_->contains(key); }
  // On one line, at most so many bytes of it; a number as its digits.
  std::string text(std::string_view key) const;
  // False where it is not said.
  bool truth(std::string_view key) const;
  // A number of things: an integer of any kind, not negative.
  std::optional<std::uint64_t> count(std::string_view key) const;
  // Things in a second: finite, 0 to a billion.
  std::optional<double> rate(std::string_view key) const;
  // Not negative, and not after latestTime; a point in time since 1970-01-01 UTC, too.
  std::optional<std::chrono::milliseconds> duration(std::string_view key) const;
  // The dictionaries of a list, at most mostEntries of them.
  std::vector<ReplyReader> entries(std::string_view key) const;
  // How many entries of the list are not among entries().
  std::size_t entriesLeftOut(std::string_view key) const;

 private:
  const Dictionary* reply_;
};

// As they stand in a report; "?" for what is absent.
std::string countText(std::optional<std::uint64_t> count);
std::string rateText(std::optional<double> perSecond);
std::string durationText(std::optional<std::chrono::milliseconds> duration);

}  // namespace probeview
