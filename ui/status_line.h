// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <string_view>

#include "client/radix_wrapper.h"
#include "platform/clock.h"
#include "platform/time_zone.h"
#include "ui/list_page.h"
#include "ui/status.h"

namespace probeview {

// What the line is about.
struct StatusFacts {
  const ServiceStatus& service;
  // What fills the page above the line (feedOfTopPage); absent on the lists, whose line speaks of all records.
  std::optional<PageFeed> feed{};
  // Whether the configuration that the session was to push is not among the program's resources.
  bool isConfigurationMissing = false;
};

// Puts into one line why the page above it moves or stands still: whether the service is there and has taken the
// configuration, which source fills the page, how old its values are and whether more are to come. The youngest record
// of the page's metrics counts. Times of day are local; a record's age is how old it was when it left the service and
// what has gone by since, asleep or awake; where the service does not say, when it was received is told instead. Of a
// service that does not tell all its sources the line concludes nothing from what it does not tell. Main thread.
//
//   scenario:city · 0.4 s ago
//   nothing received yet from scenario:city
//   scenario:city · source silent for 2 min
//   trace:drive.csv · 3 min ago · trace ended
//   trace:drive.csv cannot fill this page
//   Baseband service away since 12:03:10, showing what was last known
class StatusLine {
 public:
  // How often a front asks for the line anew: seconds count, tenths need not be followed.
  static constexpr std::chrono::nanoseconds refreshInterval = std::chrono::seconds(1);
  // A record that comes at a period is stale when it is older than both: so long, and so many periods. One that comes
  // on change, or because it was asked for, never is while its source runs; nor one of a service that names no period.
  static constexpr std::chrono::nanoseconds leastStaleAge = std::chrono::seconds(10);
  static constexpr int stalePeriods = 3;

  // Both must outlive the line.
  explicit StatusLine(const Clock& clock = systemClock(), const TimeZone& zone = deviceTimeZone())
      : clock_(clock), zone_(zone) {}

  Status status(const StatusFacts& facts) const;

 private:
  using Record = ServiceStatus::LastRecord;

  Status away(const StatusFacts& facts) const;
  Status filled(const ServiceStatus& service, const Record& record) const;
  std::chrono::nanoseconds ageOf(const Record& record) const;
  // Whether it comes again and again, so that it may be missed.
  static bool isPeriodic(const Record& record);
  bool isStale(const Record& record) const;
  // For how long nothing has come from that origin. Absent while it is not silent: something came within leastStaleAge,
  // or one of its metrics still keeps to its period, however long that is. Others may stop all the same: a phone that
  // has left a cell no longer measures it.
  std::optional<std::chrono::nanoseconds> silenceOf(const ServiceStatus& service, const std::string& origin) const;
  const Record* youngestOf(const StatusFacts& facts) const;
  std::string localTime(std::chrono::milliseconds wallTime) const;

  const Clock& clock_;
  const TimeZone& zone_;
};

// An age in the unit that suits it: "0.4 s", "42 s", "3 min", "5 h", "2 d". Rounded down; a negative age is none.
std::string ageText(std::chrono::nanoseconds age);

}  // namespace probeview
