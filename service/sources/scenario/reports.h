// SPDX-License-Identifier: Apache-2.0
//
// From the phone's state to messages: one function per metric, each of which reads the state and writes the fields that
// the phone of the scenario can know. Fields that it cannot know stay unset.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <vector>

#include "service/sources/scenario/facts.h"
#include "service/sources/scenario/phone.h"

namespace probeview::scenario {

// A measurement is news each time that it is made; a state is news when it changes, and stays true in between.
enum class Nature : std::uint8_t { kState, kMeasurement };

struct Report {
  Fact fact;
  std::int64_t metricId;
  Nature nature;
  // How often, in ms, while nobody asks for anything else; none: on every change.
  std::optional<Milliseconds> ownPeriod;
};

// One report for each fact, in the facts' order.
std::span<const Report> reports();

// The encoded message of a fact that has been learnt.
std::vector<std::uint8_t> payloadOf(const Phone& phone, Fact fact, std::uint64_t timestamp);

}  // namespace probeview::scenario
