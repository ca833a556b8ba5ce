// SPDX-License-Identifier: Apache-2.0
//
// What local time is, and when it changes. Injected wherever a time of day is shown, so that tests own it.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace probeview {

// A stretch of time in which one offset and one abbreviation hold. Seconds since 1970-01-01 UTC; from is included,
// until is not. It may be shorter than the zone's own period: it only promises that nothing changes in between.
struct ZonePeriod {
  std::int64_t from = 0;
  std::int64_t until = 0;
  std::int64_t offset = 0;   // seconds to add to UTC, positive east of Greenwich
  std::string abbreviation;  // such as "CET"
};

class TimeZone {
 public:
  virtual ~TimeZone() = default;
  // A period that holds at the moment, which may be any.
  virtual ZonePeriod periodAt(std::int64_t utcSeconds) const = 0;
};

// One offset for all times.
class FixedTimeZone final : public TimeZone {
 public:
  FixedTimeZone(std::int64_t offset, std::string abbreviation);
  ZonePeriod periodAt(std::int64_t utcSeconds) const override;

 private:
  ZonePeriod period_;
};

// The zone that the machine is set to (TZ, else /etc/localtime). A change of the setting, as by a traveller, is noticed
// when a new period is asked for; periods are at most a minute long. Any thread.
const TimeZone& deviceTimeZone();

// Looks at what TZ names before the system's library reads it: a file that is no regular one, such as a pipe, could
// keep the program for ever. Then TZ becomes UTC, and the answer says so in a line for people. At start-up, before
// other threads.
std::optional<std::string> settleTimeZone();

}  // namespace probeview
