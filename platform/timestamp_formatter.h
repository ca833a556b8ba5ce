// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "platform/time_zone.h"

namespace probeview {

// Shows points in time in the pattern "yyyy-MM-dd HH:mm:ss zzz", as "2024-03-31 03:00:00 CEST". One per thread.
//
// Metrics come many to a second: the same second again costs nothing, another second of the same day and zone period a
// few divisions.
class TimestampFormatter {
 public:
  // The zone must outlive the formatter.
  explicit TimestampFormatter(const TimeZone& zone = deviceTimeZone());

  // Milliseconds since 1970-01-01 UTC, floored to seconds. The year has at least four digits and is always whole, in
  // the Gregorian calendar without end in both directions. A number that is not finite, or further than 9.2e18 seconds
  // from 1970, is no time and stops the program. The text holds until the next call.
  std::string_view format(double milliseconds);

 private:
  void formatSecond(std::int64_t utcSeconds);

  const TimeZone& zone_;
  std::optional<ZonePeriod> period_;
  std::optional<std::int64_t> second_;
  std::optional<std::int64_t> day_;
  std::string text_;
  std::size_t dateSize_ = 0;
};

}  // namespace probeview
