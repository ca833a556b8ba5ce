// SPDX-License-Identifier: Apache-2.0
//
// Carrier aggregation (3GPP TS 36.331, 5.3.10.3a and 5.3.10.3b).
#include <algorithm>

#include "scenario/lte_modem.h"

namespace probeview::scenario {

// A download gets the co-located cells of the other carriers as secondary ones, which are put to sleep when it ends.
void LteModem::aggregate(const Circumstances& c) {
  constexpr std::size_t mostSecondaries = 2;
  const Cell& primary = network_.cells[*state_.serving];
  std::vector<SecondaryCarrier>& secondaries = state_.secondaries;
  bool changed = false;
  if (c.demand.download) {
    if (downloadSince_ < 0) downloadSince_ = c.now;
    const bool configured = !secondaries.empty() && secondaries.front().state != SecondaryState::SCC_STATE_DECONFIGURED;
    if (!configured) {
      changed = !secondaries.empty();
      secondaries.clear();
      for (const CellIndex cell : c.surroundings.heard(Technology::Lte)) {
        const Cell& other = network_.cells[cell];
        if (other.site != primary.site || other.carrier == primary.carrier || dot(other.facing, primary.facing) < 0.9 ||
            c.surroundings.strength(cell) < -112) {
          continue;
        }
        if (secondaries.size() == mostSecondaries) break;
        secondaries.push_back({cell, static_cast<std::uint32_t>(secondaries.size()) + 1,
                               SecondaryState::SCC_STATE_CONFIGURED_DEACTIVATED, c.surroundings.strength(cell),
                               c.surroundings.quality(cell), c.surroundings.interferenceRatio(cell),
                               std::min(c.surroundings.carrierPower(cell), 0.0)});
        changed = true;
      }
      if (changed) c.facts.learn(Fact::LteComponentCarriers, c.now);
    } else if (c.now - downloadSince_ >= measurementPeriod) {
      for (SecondaryCarrier& carrier : secondaries) {
        changed |= carrier.state != SecondaryState::SCC_STATE_ACTIVATED;
        carrier.state = SecondaryState::SCC_STATE_ACTIVATED;
      }
    }
  } else {
    downloadSince_ = -1;
    for (SecondaryCarrier& carrier : secondaries) {
      if (carrier.state != SecondaryState::SCC_STATE_ACTIVATED) continue;
      carrier.state = SecondaryState::SCC_STATE_CONFIGURED_DEACTIVATED;
      changed = true;
    }
  }
  if (changed) c.facts.learn(Fact::LteAggregation, c.now);
}

void LteModem::endAggregation(const Circumstances& c) {
  bool changed = false;
  for (SecondaryCarrier& carrier : state_.secondaries) {
    changed |= carrier.state != SecondaryState::SCC_STATE_DECONFIGURED;
    carrier.state = SecondaryState::SCC_STATE_DECONFIGURED;
  }
  downloadSince_ = -1;
  if (!changed) return;
  c.facts.learn(Fact::LteAggregation, c.now);
  c.facts.learn(Fact::LteComponentCarriers, c.now);
}

// Told once, a deconfigured carrier is nothing to the next connection.
void LteModem::forgetDeconfigured(const Circumstances& c) {
  if (state_.secondaries.empty()) return;
  state_.secondaries.clear();
  c.facts.learn(Fact::LteAggregation, c.now);
}

}  // namespace probeview::scenario
