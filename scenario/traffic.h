// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

#include "scenario/facts.h"
#include "scenario/random.h"
#include "scenario/world.h"

namespace probeview::scenario {

enum class Activity : std::uint8_t { None, Burst, Download, Voice };

// What is asked of the radio at this moment.
struct Demand {
  bool signalling = false;   // a mobility procedure waits for a connection
  bool registering = false;  // and it is an attach or an area update
  bool data = false;
  bool download = false;  // data, and much of it
  bool voice = false;
  bool mobileTerminated = false;  // somebody else began it
  unsigned uplinkBlocks = 0;      // resource blocks' worth of uplink, 0 to 50

  bool any() const { return signalling || data || voice; }
};

// What the phone's owner, and those who call, do: bursts of data, downloads, calls.
class Traffic {
 public:
  Traffic(const TrafficHabits& habits, std::uint64_t seed);

  void advance(Milliseconds now, bool inService);
  // The service went away; whatever was going on has ended.
  void interrupt(Milliseconds now);
  // Data begins at once, as when the phone has just attached.
  void fetch(Milliseconds now);

  Activity activity() const { return activity_; }
  // Calls, counted from 1; the current or the last one.
  unsigned calls() const { return calls_; }
  void addTo(Demand& demand) const;

 private:
  void begin(Activity activity, Milliseconds now, double seconds);

  TrafficHabits habits_;
  Random random_;
  Activity activity_ = Activity::None;
  bool mobileTerminated_ = false;
  unsigned uplinkBlocks_ = 0;
  unsigned calls_ = 0;
  Milliseconds ends_ = 0;
  Milliseconds next_;
};

}  // namespace probeview::scenario
