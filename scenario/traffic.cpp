// SPDX-License-Identifier: Apache-2.0
#include "scenario/traffic.h"

namespace probeview::scenario {
namespace {

Milliseconds fromSeconds(double seconds) { return static_cast<Milliseconds>(seconds * 1000.0); }

}  // namespace

Traffic::Traffic(const TrafficHabits& habits, std::uint64_t seed)
    : habits_(habits), random_(seed, 2), next_(fromSeconds(habits.secondsBetweenActivities)) {}

void Traffic::begin(Activity activity, Milliseconds now, double seconds) {
  activity_ = activity;
  ends_ = now + fromSeconds(seconds);
}

void Traffic::interrupt(Milliseconds now) {
  activity_ = Activity::None;
  next_ = now + fromSeconds(random_.exponential(habits_.secondsBetweenActivities));
}

void Traffic::fetch(Milliseconds now) {
  mobileTerminated_ = false;
  uplinkBlocks_ = 6;
  begin(Activity::Download, now, 6);
}

void Traffic::advance(Milliseconds now, bool inService) {
  if (!inService) {
    if (activity_ != Activity::None) interrupt(now);
    return;
  }
  if (activity_ != Activity::None) {
    if (now >= ends_) interrupt(now);
    return;
  }
  if (now < next_) return;
  const double kind = random_.unit();
  mobileTerminated_ = random_.chance(0.35);
  uplinkBlocks_ = static_cast<unsigned>(random_.integerBetween(1, 8));
  if (kind < habits_.voiceShare) {
    ++calls_;
    uplinkBlocks_ = 2;
    begin(Activity::Voice, now, random_.between(15, 70));
  } else if (kind < habits_.voiceShare + habits_.downloadShare) {
    begin(Activity::Download, now, random_.between(8, 45));
  } else {
    if (random_.chance(0.2)) uplinkBlocks_ = 40;  // pictures on their way up
    begin(Activity::Burst, now, random_.between(0.4, 5));
  }
}

void Traffic::addTo(Demand& demand) const {
  demand.voice = activity_ == Activity::Voice;
  demand.download = activity_ == Activity::Download;
  demand.data = demand.download || activity_ == Activity::Burst;
  if (activity_ == Activity::None) return;
  demand.mobileTerminated = mobileTerminated_;
  demand.uplinkBlocks = uplinkBlocks_;
}

}  // namespace probeview::scenario
