// SPDX-License-Identifier: Apache-2.0
//
// Carrier aggregation (3GPP TS 36.331, 5.3.10.3a and 5.3.10.3b).
#include <algorithm>

#include "scenario/lte_modem.h"

namespace probeview::scenario {

// A download gets the co-located cells of the other carriers as secondary ones, which are put to sleep when it ends.
void LteModem::aggregate(const Circumstances& c) {
  constexpr std::size_t kMostSecondaries = 2;
  const Cell& primary = network_.cells[*state_.serving];
  auto& secondaries = state_.secondaries;
  bool changed = false;
  if (c.demand.download) {
    if (downloadSince_ < 0) downloadSince_ = c.now;
    const bool configured = !secondaries.empty() && secondaries.front().state != SecondaryState::kDeconfigured;
    if (!configured) {
      changed = !secondaries.empty();
      secondaries.clear();
      for (const CellIndex cell : c.surroundings.heard(Technology::kLte)) {
        const Cell& other = network_.cells[cell];
        if (other.site != primary.site || other.carrier == primary.carrier || dot(other.facing, primary.facing) < 0.9 ||
            c.surroundings.strength(cell) < -112) {
          continue;
        }
        if (secondaries.size() == kMostSecondaries) break;
        secondaries.push_back({cell, static_cast<std::uint32_t>(secondaries.size()) + 1, SecondaryState::kDeactivated,
                               c.surroundings.strength(cell), c.surroundings.quality(cell),
                               c.surroundings.interferenceRatio(cell),
                               std::min(c.surroundings.carrierPower(cell), 0.0)});
        changed = true;
      }
      if (changed) c.facts.learn(Fact::kLteComponentCarriers, c.now);
    } else if (c.now - downloadSince_ >= kMeasurementPeriod) {
      for (SecondaryCarrier& carrier : secondaries) {
        changed |= carrier.state != SecondaryState::kActivated;
        carrier.state = SecondaryState::kActivated;
      }
    }
  } else {
    downloadSince_ = -1;
    for (SecondaryCarrier& carrier : secondaries) {
      if (carrier.state != SecondaryState::kActivated) continue;
      carrier.state = SecondaryState::kDeactivated;
      changed = true;
    }
  }
  if (changed) c.facts.learn(Fact::kLteAggregation, c.now);
}

void LteModem::endAggregation(const Circumstances& c) {
  bool changed = false;
  for (SecondaryCarrier& carrier : state_.secondaries) {
    changed |= carrier.state != SecondaryState::kDeconfigured;
    carrier.state = SecondaryState::kDeconfigured;
  }
  downloadSince_ = -1;
  if (!changed) return;
  c.facts.learn(Fact::kLteAggregation, c.now);
  c.facts.learn(Fact::kLteComponentCarriers, c.now);
}

// Told once, a deconfigured carrier is nothing to the next connection.
void LteModem::forgetDeconfigured(const Circumstances& c) {
  if (state_.secondaries.empty()) return;
  state_.secondaries.clear();
  c.facts.learn(Fact::kLteAggregation, c.now);
}

}  // namespace probeview::scenario
