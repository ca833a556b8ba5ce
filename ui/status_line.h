// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <string>

#include "client/radix_wrapper.h"
#include "platform/clock.h"
#include "platform/time_zone.h"

namespace probeview {

// Puts into one line why the pages move or stand still: whether the service is there, what feeds it and how old the
// last record is. Times of day are local, ages count on the clock that only goes forward. Main thread.
//
//   scenario:city · 0.4 s ago
//   Connected to the baseband service, nothing received yet
//   Waiting for the baseband service · you may not connect to the baseband service at /run/radixd/radix.sock
//   Baseband service away since 12:03:10, showing what was last known
class StatusLine {
 public:
  // How often a front asks for the line anew: seconds count, tenths need not be followed.
  static constexpr std::chrono::nanoseconds refreshInterval = std::chrono::seconds(1);

  // Both must outlive the line.
  explicit StatusLine(const Clock& clock = systemClock(), const TimeZone& zone = deviceTimeZone())
      : clock_(clock), zone_(zone) {}

  std::string text(const ServiceStatus& status) const;

 private:
  std::string localTime(std::chrono::milliseconds wallTime) const;

  const Clock& clock_;
  const TimeZone& zone_;
};

// An age in the unit that suits it: "0.4 s", "42 s", "3 min", "5 h", "2 d". Rounded down; a negative age is none.
std::string ageText(std::chrono::nanoseconds age);

}  // namespace probeview
