// SPDX-License-Identifier: Apache-2.0
//
// Where a scenario takes place: a network, a way through it, and what the phone's owner does on the way.
#pragma once

#include <cstdint>

#include "scenario/network.h"
#include "scenario/route.h"

namespace probeview::scenario {

// How busy the phone is. Waiting times between activities are those of independent events.
struct TrafficHabits {
  double secondsBetweenActivities = 14;
  double voiceShare = 0.15;     // of the activities
  double downloadShare = 0.25;  // of the activities; the rest are short bursts
};

struct World {
  Network network;
  Route route;
  TrafficHabits habits;
};

// Once around some blocks of a town in twelve minutes, stopping at lights: dense sites, an underpass that only UMTS and
// GSM reach, a ravine with nothing but GSM, tracking areas with and without voice over IMS.
World cityWorld(std::uint64_t seed);

// Sixty kilometres of highway there and back: large cells at 33 m/s, wide stretches without LTE, a few without any
// coverage.
World highwayWorld(std::uint64_t seed);

// About a large building on foot: rooms behind windows, a core where UMTS is weak, a basement that GSM barely reaches.
World indoorWorld(std::uint64_t seed);

}  // namespace probeview::scenario
