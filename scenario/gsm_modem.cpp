// SPDX-License-Identifier: Apache-2.0
#include "scenario/gsm_modem.h"

#include "scenario/selection.h"

namespace probeview::scenario {
namespace {

// RXQUAL by carrier to interference ratio: each step doubles the bit error rate (3GPP TS 45.008, 8.2.4).
unsigned qualityFor(double ratio) {
  constexpr double bestRatio = 16, decibelsPerStep = 2;
  return static_cast<unsigned>(std::clamp((bestRatio - ratio) / decibelsPerStep, 0.0, 7.0));
}

}  // namespace

void GsmModem::change(GsmConnection to, const Circumstances& c) {
  state_.connection = to;
  c.facts.learn(Fact::GsmServingCell, c.now);
  if (to == GsmConnection::Dedicated) {
    state_.transmitPowers.clear();
    powerStep_ = 0;
    measure(c);
    c.facts.end(Fact::GsmIdleMeasurement);
  } else {
    c.facts.end(Fact::GsmDedicatedMeasurement);
  }
}

void GsmModem::serve(CellIndex cell, const Circumstances& c) {
  state_.serving = cell;
  lost_ = false;
  failing_.clear();
  reselection_.clear();
  handover_.clear();
  c.facts.learn(Fact::GsmServingCell, c.now);
  c.facts.learn(Fact::GsmIdleConfiguration, c.now);
  c.facts.learn(Fact::GsmPacketConfiguration, c.now);
  measure(c);
}

void GsmModem::enter(CellIndex cell, Manner manner, const Circumstances& c) {
  state_.connection = manner == Manner::Handover ? GsmConnection::Dedicated : GsmConnection::Idle;
  state_.transmitPowers.clear();
  powerStep_ = 0;
  serve(cell, c);
}

void GsmModem::leave(const Circumstances& c) {
  change(GsmConnection::Inactive, c);
  for (const Fact fact : {Fact::GsmServingCell, Fact::GsmIdleConfiguration, Fact::GsmIdleMeasurement,
                          Fact::GsmDedicatedMeasurement, Fact::GsmNeighbours, Fact::GsmPacketConfiguration}) {
    c.facts.leave(fact);
  }
}

void GsmModem::measure(const Circumstances& c) {
  const CellIndex serving = *state_.serving;
  state_.rxLev = c.surroundings.strength(serving);
  listAllHeard(c, serving, state_.neighbours);
  c.facts.learn(Fact::GsmNeighbours, c.now);
  if (state_.connection != GsmConnection::Dedicated) {
    c.facts.learn(Fact::GsmIdleMeasurement, c.now);
    return;
  }
  state_.rxQual = qualityFor(c.surroundings.interferenceRatio(serving));
  state_.dedicatedCell = serving;
  state_.dedicatedRxLev = state_.rxLev;
  // The network steps the power towards a target level at its own receiver, 2 dB at a time (45.008, 4.7.1).
  const double wanted = std::clamp(-52.0 - state_.rxLev, 5.0, double{GsmSelection::maximumPower});
  const int wantedStep = (GsmSelection::maximumPower - static_cast<int>(wanted)) / 2;
  powerStep_ += wantedStep > powerStep_ ? 1 : wantedStep < powerStep_ ? -1 : 0;
  if (state_.transmitPowers.size() == 4) state_.transmitPowers.erase(state_.transmitPowers.begin());
  state_.transmitPowers.push_back(GsmSelection::maximumPower - 2 * powerStep_);
  state_.antenna = c.random.chance(0.1) ? 1U - state_.antenna : state_.antenna;
  c.facts.learn(Fact::GsmDedicatedMeasurement, c.now);
}

std::optional<CellIndex> GsmModem::reselectionCandidate(const Circumstances& c) const {
  const CellIndex serving = *state_.serving;
  const bool unsuitable = c.forbidden.knownForbidden(serving);
  if (!c.firstSearch) {
    if (const auto cell = strongestAllowed(c, Technology::Lte, GsmSelection::lteHigh)) return cell;
  }
  if (const auto cell = strongestAllowed(c, Technology::Umts, GsmSelection::umtsHigh)) return cell;
  if (const auto cell = strongestAllowed(c, Technology::Lte, GsmSelection::lteHigh)) return cell;
  for (const CellIndex cell : c.surroundings.heard(Technology::Gsm)) {
    if (cell == serving || c.forbidden.knownForbidden(cell)) continue;
    // Only a change of the location area has to overcome the hysteresis (45.008, 6.6.2).
    const bool sameArea = network_.cells[cell].areaCode == network_.cells[serving].areaCode;
    const double margin = sameArea ? 2 : GsmSelection::reselectHysteresis;
    if (unsuitable || c.surroundings.strength(cell) > state_.rxLev + margin) return cell;
    break;
  }
  return std::nullopt;
}

std::optional<Departure> GsmModem::advance(const Circumstances& c) {
  if (!state_.camped()) return std::nullopt;
  if (c.measured) {
    measure(c);
    failing_.note(state_.rxLev <= GsmSelection::rxLevAccessMin - 2, c.now);
  }
  const bool dedicated = c.demand.voice || c.demand.signalling;
  if (state_.connection == GsmConnection::Idle) {
    if (c.measured) {
      std::optional<CellIndex> target;
      Milliseconds patience = c.firstSearch ? 0 : GsmSelection::reselectionTime;
      if (failing_.hasFailedFor(searchAfter, c.now)) {
        patience = 0;
        target = selectionCandidate(c);
        lost_ = !target && failing_.hasFailedFor(lostAfter, c.now);
        if (target == state_.serving) target.reset();
      } else if (c.mayLeave) {
        target = reselectionCandidate(c);
      }
      if (reselection_.holds(target, c.now, patience)) {
        if (network_.technologyOf(*target) != Technology::Gsm) return Departure{*target, Manner::Reselection};
        serve(*target, c);
        return std::nullopt;
      }
    }
    if (dedicated && !c.forbidden.knownForbidden(*state_.serving)) change(GsmConnection::Dedicated, c);
    return std::nullopt;
  }
  if (!dedicated) {
    change(GsmConnection::Idle, c);
    return std::nullopt;
  }
  if (!c.measured) return std::nullopt;
  if (failing_.hasFailedFor(4000, c.now)) {  // the radio link timeout has run down
    change(GsmConnection::Idle, c);
    return std::nullopt;
  }
  const std::optional<CellIndex> better =
      strongerCell(c, Technology::Gsm, *state_.serving, state_.rxLev + GsmSelection::handoverMargin);
  if (handover_.holds(better, c.now, GsmSelection::handoverTime)) serve(*better, c);
  return std::nullopt;
}

}  // namespace probeview::scenario
