// SPDX-License-Identifier: Apache-2.0
//
// From the phone's state to messages: one function per metric, each of which reads the state and writes the fields that
// the phone of the scenario can know. Fields that it cannot know stay unset.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <vector>

#include "scenario/facts.h"

namespace probeview::scenario {

class Phone;

// A measurement is news each time that it is made; a state is news when it changes, and stays true in between.
enum class Nature : std::uint8_t { State, Measurement };

struct Report {
  Fact fact;
  std::int64_t metricId;
  Nature nature;
  // How often, in ms, while nobody asks for anything else; none: on every change.
  std::optional<Milliseconds> ownPeriod;
  // The encoded message of the fact, which has been learnt, with the timestamp, in ms since 1970-01-01 UTC.
  std::vector<std::uint8_t> (*payload)(const Phone& phone, std::uint64_t timestamp);
};

// One report for each fact, in the facts' order.
std::span<const Report> reports();
const Report& reportOf(Fact fact);

}  // namespace probeview::scenario
