// SPDX-License-Identifier: Apache-2.0
#include "platform/timestamp_formatter.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <ctime>
#include <limits>
#include <stdexcept>
#include <string>

#include "platform/fatal_error.h"

namespace probeview {
namespace {

const FixedTimeZone utc(0, "UTC");

std::string formatted(double milliseconds, const TimeZone& zone = utc) {
  TimestampFormatter formatter(zone);
  return std::string(formatter.format(milliseconds));
}

// The device's zone under a setting of TZ, restored afterwards.
class DeviceZone {
 public:
  explicit DeviceZone(const char* setting) {
    if (const char* present = std::getenv("TZ")) before_ = present;
    ::setenv("TZ", setting, 1);
    ::tzset();
  }
  ~DeviceZone() {
    if (before_) {
      ::setenv("TZ", before_->c_str(), 1);
    } else {
      ::unsetenv("TZ");
    }
    ::tzset();
  }
  std::string formatted(double milliseconds) const { return probeview::formatted(milliseconds, deviceTimeZone()); }

 private:
  std::optional<std::string> before_;
};

TEST(TimestampFormatter, ATimestampOfZeroIsTheUnixEpochInTheDevicesTimeZone) {
  EXPECT_EQ(DeviceZone("UTC0").formatted(0), "1970-01-01 00:00:00 UTC");
  EXPECT_EQ(DeviceZone("Europe/Berlin").formatted(0), "1970-01-01 01:00:00 CET");
  EXPECT_EQ(DeviceZone("America/New_York").formatted(0), "1969-12-31 19:00:00 EST");
}

TEST(TimestampFormatter, MillisecondsAreDividedAndFlooredToSeconds) {
  EXPECT_EQ(formatted(1709640000999.0), "2024-03-05 12:00:00 UTC");
  EXPECT_EQ(formatted(1709640001000.0), "2024-03-05 12:00:01 UTC");
  EXPECT_EQ(formatted(-1.0), "1969-12-31 23:59:59 UTC");
  EXPECT_EQ(formatted(-1000.0), "1969-12-31 23:59:59 UTC");
  EXPECT_EQ(formatted(-1000.5), "1969-12-31 23:59:58 UTC");
}

TEST(TimestampFormatter, TheLargestTimestampShowsItsWholeYear) {
  // 2^64 - 1 milliseconds are 2^64 as a double; the quotient is one, too, and doubles are four seconds apart there.
  EXPECT_EQ(formatted(static_cast<double>(std::numeric_limits<std::uint64_t>::max())), "584556019-04-03 14:25:52 UTC");
}

TEST(TimestampFormatter, YearsHaveAtLeastFourDigitsAndAreNeverClamped) {
  EXPECT_EQ(formatted(253402300799000.0), "9999-12-31 23:59:59 UTC");
  EXPECT_EQ(formatted(253402300800000.0), "10000-01-01 00:00:00 UTC");
  EXPECT_EQ(formatted(-62135596800000.0), "0001-01-01 00:00:00 UTC");
  EXPECT_EQ(formatted(-30610224000000.0), "1000-01-01 00:00:00 UTC");
}

TEST(TimestampFormatter, LeapDaysAndCenturiesFollowTheGregorianCalendar) {
  EXPECT_EQ(formatted(951782400000.0), "2000-02-29 00:00:00 UTC");
  EXPECT_EQ(formatted(951868800000.0), "2000-03-01 00:00:00 UTC");
  EXPECT_EQ(formatted(4107542399000.0), "2100-02-28 23:59:59 UTC");
  EXPECT_EQ(formatted(4107542400000.0), "2100-03-01 00:00:00 UTC");
}

TEST(TimestampFormatter, AgreesWithTheCLibraryOnRandomMoments) {
  std::uint64_t state = 1;
  TimestampFormatter formatter(utc);
  for (int round = 0; round < 20000; ++round) {
    state = state * 6364136223846793005U + 1442695040888963407U;
    // About the years 1000 to 10000.
    const auto second =
        static_cast<std::time_t>(static_cast<std::int64_t>(state >> 16) % 284'000'000'000 - 30'610'224'000);
    std::tm broken{};
    ASSERT_NE(::gmtime_r(&second, &broken), nullptr);
    char expected[64];
    ASSERT_NE(std::strftime(expected, sizeof expected, "%Y-%m-%d %H:%M:%S UTC", &broken), 0u);
    ASSERT_EQ(formatter.format(static_cast<double>(second) * 1000.0), expected) << second;
  }
}

TEST(TimestampFormatter, OneFormatterFollowsSummerTimeForthAndBack) {
  const DeviceZone zone("Europe/Berlin");
  TimestampFormatter formatter;
  EXPECT_EQ(formatter.format(1711846799000.0), "2024-03-31 01:59:59 CET");
  EXPECT_EQ(formatter.format(1711846800000.0), "2024-03-31 03:00:00 CEST");
  EXPECT_EQ(formatter.format(1711846799999.0), "2024-03-31 01:59:59 CET");
  EXPECT_EQ(formatter.format(1729990799000.0), "2024-10-27 02:59:59 CEST");
  EXPECT_EQ(formatter.format(1729990800000.0), "2024-10-27 02:00:00 CET");
}

TEST(TimestampFormatter, ZonesThatOnceChangedAtOddSecondsAreRight) {
  // Berlin went from local mean time (53 min 28 s) to Central European Time on 1893-04-01.
  const DeviceZone zone("Europe/Berlin");
  TimestampFormatter formatter;
  EXPECT_EQ(formatter.format(-2422054409000.0), "1893-03-31 23:59:59 LMT");
  EXPECT_EQ(formatter.format(-2422054408000.0), "1893-04-01 00:06:32 CET");
  EXPECT_EQ(formatter.format(-2422054409000.0), "1893-03-31 23:59:59 LMT");
}

TEST(TimestampFormatter, SummerTimeIsKeptInYearsThatTheCLibraryCannotHold) {
  const DeviceZone zone("Europe/Berlin");
  // The same calendar day, 400 years times 1000000 later.
  constexpr double later = 12622780800.0 * 1e6 * 1000.0;
  EXPECT_EQ(zone.formatted(1709640000000.0 + later), "400002024-03-05 13:00:00 CET");
  EXPECT_EQ(zone.formatted(1720180800000.0 + later), "400002024-07-05 14:00:00 CEST");
  EXPECT_EQ(zone.formatted(-1e17), "-3166904-02-24 15:06:48 LMT");
}

TEST(TimestampFormatter, AZoneOfATestIsUsedAsItIs) {
  const FixedTimeZone nepal(5 * 3600 + 45 * 60, "+0545");
  EXPECT_EQ(formatted(0, nepal), "1970-01-01 05:45:00 +0545");
}

TEST(TimestampFormatter, AChangedZoneOfTheDeviceIsNoticed) {
  TimestampFormatter formatter;
  {
    const DeviceZone zone("Europe/Berlin");
    EXPECT_EQ(formatter.format(0), "1970-01-01 01:00:00 CET");
  }
  const DeviceZone zone("America/New_York");
  EXPECT_EQ(formatter.format(59'999), "1970-01-01 01:00:59 CET") << "a minute is looked up once";
  EXPECT_EQ(formatter.format(60'000), "1969-12-31 19:01:00 EST");
}

TEST(TimestampFormatter, WhatIsNoPointInTimeStopsTheProgram) {
  setFatalErrorObserver([](std::string_view reason) { throw std::runtime_error(std::string(reason)); });
  TimestampFormatter formatter(utc);
  for (const double none : {std::nan(""), HUGE_VAL, -HUGE_VAL, 1e23}) {
    EXPECT_THROW(formatter.format(none), std::runtime_error) << none;
  }
  setFatalErrorObserver({});
}

}  // namespace
}  // namespace probeview
