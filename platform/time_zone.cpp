// SPDX-License-Identifier: Apache-2.0
#include "platform/time_zone.h"

#include <sys/stat.h>

#include <cstdlib>
#include <ctime>
#include <limits>
#include <utility>

namespace probeview {

namespace {

// How long a period is that is looked up at most, and with it how long a change of the setting goes unnoticed.
constexpr std::int64_t secondsPerMinute = 60;
// The Gregorian calendar, and with it each rule for summer time, repeats after 400 years.
constexpr std::int64_t secondsPer400Years = 146'097LL * 86'400;
// Where the C library's calendar is still sure of itself; years outside are mapped into it. Before the first time zones
// there is only one local time for ever, so how far back the mapping starts does not matter.
constexpr std::int64_t firstCertain = -secondsPer400Years;
constexpr std::int64_t lastCertain = 4 * secondsPer400Years;

std::int64_t floorDivide(std::int64_t dividend, std::int64_t divisor) {
  const std::int64_t quotient = dividend / divisor;
  return dividend % divisor < 0 ? quotient - 1 : quotient;
}

std::int64_t intoCertainRange(std::int64_t utcSeconds) {
  if (utcSeconds < firstCertain) return firstCertain;
  if (utcSeconds < lastCertain) return utcSeconds;
  return lastCertain - secondsPer400Years + (utcSeconds - lastCertain) % secondsPer400Years;
}

struct LocalTime {
  std::int64_t offset = 0;
  std::string abbreviation;
  friend bool operator==(const LocalTime&, const LocalTime&) = default;
};

LocalTime localTimeAt(std::int64_t utcSeconds) {
  const std::time_t moment = intoCertainRange(utcSeconds);
  std::tm broken{};
  if (::localtime_r(&moment, &broken) == nullptr) return {0, "UTC"};
  return {broken.tm_gmtoff, broken.tm_zone == nullptr ? "UTC" : broken.tm_zone};
}

class DeviceTimeZone final : public TimeZone {
 public:
  ZonePeriod periodAt(std::int64_t utcSeconds) const override {
    // Notices a changed setting; localtime_r alone looks only once.
    ::tzset();
    LocalTime here = localTimeAt(utcSeconds);
    // Modern zones change on whole minutes; where an old one does not, the two ends of the minute differ and only the
    // second itself is promised.
    constexpr auto latest = std::numeric_limits<std::int64_t>::max();
    constexpr auto earliest = std::numeric_limits<std::int64_t>::min();
    if (utcSeconds > earliest + secondsPerMinute && utcSeconds < latest - secondsPerMinute) {
      const std::int64_t from = floorDivide(utcSeconds, secondsPerMinute) * secondsPerMinute;
      const std::int64_t until = from + secondsPerMinute;
      if (localTimeAt(from) == here && localTimeAt(until - 1) == here) {
        return {from, until, here.offset, std::move(here.abbreviation)};
      }
    }
    const std::int64_t until = utcSeconds == latest ? latest : utcSeconds + 1;
    return {utcSeconds, until, here.offset, std::move(here.abbreviation)};
  }
};

}  // namespace

FixedTimeZone::FixedTimeZone(std::int64_t offset, std::string abbreviation)
    : period_{std::numeric_limits<std::int64_t>::min(), std::numeric_limits<std::int64_t>::max(), offset,
              std::move(abbreviation)} {}

ZonePeriod FixedTimeZone::periodAt(std::int64_t) const { return period_; }

const TimeZone& deviceTimeZone() {
  static const auto* zone = new DeviceTimeZone;
  return *zone;
}

std::optional<std::string> settleTimeZone() {
  const char* setting = std::getenv("TZ");
  if (setting == nullptr) return std::nullopt;
  std::string path = setting;
  if (path.starts_with(':')) path.erase(0, 1);
  if (path.empty()) return std::nullopt;
  if (!path.starts_with('/')) {
    const char* folder = std::getenv("TZDIR");
    path = std::string(folder != nullptr && *folder != '\0' ? folder : "/usr/share/zoneinfo") + "/" + path;
  }
  struct stat status;
  // What is not there is a rule, such as CET-1, or nothing; a folder cannot be read, but it keeps nobody.
  if (::stat(path.c_str(), &status) != 0 || S_ISREG(status.st_mode) || S_ISDIR(status.st_mode)) return std::nullopt;
  ::setenv("TZ", "UTC0", 1);
  return "TZ names " + path + ", which is no regular file; times are shown in UTC";
}

}  // namespace probeview
