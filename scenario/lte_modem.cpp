// SPDX-License-Identifier: Apache-2.0
#include "scenario/lte_modem.h"

#include <utility>

#include "messages/quantities.h"
#include "scenario/decibel.h"
#include "scenario/selection.h"

namespace probeview::scenario {
namespace {

constexpr std::size_t mostSamples = 10;
constexpr std::size_t fewestSamples = 5;  // that are worth a report, just after a change of the cell

double bounded(double power) {
  constexpr Range possible = quantities::lteTxPower.numbers;
  return std::clamp(power, possible.lowest, possible.highest);
}

}  // namespace

void LteModem::change(LteConnection::Value to, LteCause::Value cause, const Circumstances& c) {
  state_.previous = state_.connection;
  state_.previousDuration = c.now - state_.since;
  state_.connection = to;
  state_.since = c.now;
  state_.cause = cause;
  c.facts.learn(Fact::LteConnection, c.now);
  c.facts.learn(Fact::LteDrx, c.now);  // it names the state
}

void LteModem::serve(CellIndex cell, const Circumstances& c) {
  state_.serving = cell;
  lost_ = false;
  failing_.clear();
  outOfSync_ = 0;
  t310Ends_ = -1;
  reselection_.clear();
  handover_.clear();
  outbound_.clear();
  // What was a secondary carrier is the primary one now.
  const CarrierIndex carrier = network_.cells[cell].carrier;
  if (std::erase_if(state_.secondaries, [&](const SecondaryCarrier& secondary) {
        return network_.cells[secondary.cell].carrier == carrier;
      }) > 0) {
    c.facts.learn(Fact::LteAggregation, c.now);
  }
  c.facts.beginAnew(Fact::LteSamples);
  c.facts.learn(Fact::LteServingCell, c.now);
  c.facts.learn(Fact::LteSelection, c.now);
  c.facts.learn(Fact::LteComponentCarriers, c.now);
  measure(c);
}

void LteModem::enter(CellIndex cell, Manner manner, const Circumstances& c) {
  samples_.clear();
  forgetDeconfigured(c);
  if (manner == Manner::Handover) {
    change(LteConnection::KLTE_RRC_STATE_ATMPT_INBND_MOBILITY, LteCause::KLTE_RRC_CAUSE_NA, c);
    deadline_ = c.now + 120;
  } else {
    change(LteConnection::KLTE_RRC_STATE_IDLE, LteCause::KLTE_RRC_CAUSE_NA, c);
    backOff_ = 0;
  }
  serve(cell, c);
}

void LteModem::leave(LteCause::Value cause, const Circumstances& c) {
  endAggregation(c);
  change(LteConnection::KLTE_RRC_STATE_NULL, cause, c);
  reestablishing_ = false;
  executing_.reset();
  leaving_.reset();
  for (const Fact fact : {Fact::LteServingCell, Fact::LteSamples, Fact::LteConnection, Fact::LteDrx,
                          Fact::LteTransmitPower, Fact::LteComponentCarriers, Fact::LteSelection, Fact::LteNeighbours,
                          Fact::LteInterRatNeighbours, Fact::LteAggregation}) {
    c.facts.leave(fact);
  }
}

void LteModem::measure(const Circumstances& c) {
  const CellIndex serving = *state_.serving;
  state_.rsrp = c.surroundings.strength(serving);
  state_.rsrq = c.surroundings.quality(serving);
  state_.sinr = c.surroundings.interferenceRatio(serving);
  listAllHeard(c, serving, state_.neighbours);
  c.facts.learn(Fact::LteNeighbours, c.now);
  c.facts.learn(Fact::LteInterRatNeighbours, c.now);
  for (SecondaryCarrier& carrier : state_.secondaries) {
    if (carrier.state == SecondaryState::SCC_STATE_DECONFIGURED) continue;
    carrier.rsrp = c.surroundings.strength(carrier.cell);
    carrier.rsrq = c.surroundings.quality(carrier.cell);
    carrier.sinr = c.surroundings.interferenceRatio(carrier.cell);
    carrier.rssi = std::min(c.surroundings.carrierPower(carrier.cell), 0.0);
  }
}

// Between two measurements the level wavers with the multipath around the phone.
void LteModem::sample(const Circumstances& c) {
  if (!samples_.empty() && samples_.back().cell != *state_.serving) samples_.clear();
  LteSample sample;
  sample.cell = *state_.serving;
  for (std::size_t antenna = 0; antenna < 2; ++antenna) {
    // The second antenna is the smaller one.
    const double waver = 1.2 * c.random.normal() - (antenna == 1 ? 1.8 : 0.0);
    sample.rsrp[antenna] = std::clamp(state_.rsrp + waver, weakestRsrp, strongestRsrp);
    sample.rsrq[antenna] = std::clamp(state_.rsrq + 0.4 * waver, worstRsrq, bestRsrq);
    sample.sinr[antenna] = std::clamp(state_.sinr + waver, worstSinr, bestSinr);
  }
  if (samples_.size() == mostSamples) samples_.erase(samples_.begin());
  samples_.push_back(sample);
  if (samples_.size() < fewestSamples || !c.measured) return;
  state_.samples = samples_;
  c.facts.learn(Fact::LteSamples, c.now);
}

// 3GPP TS 36.213, 5.1.1.1 and 5.1.2.1: what makes up for the path loss, within what the phone can do.
void LteModem::control(const Circumstances& c) {
  constexpr double antennaGain = 15;  // the broadcast reference signal power is without it
  const double pathLoss = network_.referenceDbm(*state_.serving) - antennaGain - state_.rsrp;
  constexpr double sharedTarget = -82, pathLossFactor = 0.8, controlTarget = -112;
  state_.transmitPowers.clear();
  for (unsigned i = 0; i < 4; ++i) {
    TransmitPower power;
    power.subframe = nextSubframe_;
    nextSubframe_ = (nextSubframe_ + 1) % 10;
    power.control = bounded(controlTarget + pathLoss + c.random.between(-1, 1));
    if (c.demand.uplinkBlocks > 0 || c.demand.signalling) {
      const double blocks = std::max(1U, c.demand.uplinkBlocks);
      power.shared = bounded(toDecibels(blocks) + sharedTarget + pathLossFactor * pathLoss + c.random.between(-1, 1));
    }
    state_.transmitPowers.push_back(power);
  }
  c.facts.learn(Fact::LteTransmitPower, c.now);
}

std::optional<Departure> LteModem::advance(const Circumstances& c) {
  if (!state_.camped()) return std::nullopt;
  if (c.measured) measure(c);
  sample(c);
  if (leaving_) {
    if (c.now < executesAt_) return std::nullopt;
    return std::exchange(leaving_, std::nullopt);
  }
  switch (state_.connection) {
    case LteConnection::KLTE_RRC_STATE_NULL:
      return std::nullopt;
    case LteConnection::KLTE_RRC_STATE_IDLE:
      return advanceIdle(c);
    case LteConnection::KLTE_RRC_STATE_ATMPT_CONNECTION:
      if (reestablishing_) {
        advanceReestablishment(c);
      } else if (c.now >= deadline_) {
        // The random access is heard where the downlink is; now and then the network is too busy.
        if (state_.sinr > -8 && (c.random.chance(0.98) || c.firstSearch)) {
          becomeConnected(state_.cause, c);
        } else {
          change(LteConnection::KLTE_RRC_STATE_IDLE, LteCause::KLTE_RRC_CAUSE_EST_FAIL_NO_RESP_FROM_CELL, c);
          backOff_ = c.now + 1000;
        }
      }
      return std::nullopt;
    case LteConnection::KLTE_RRC_STATE_CONNECTED:
      return advanceConnected(c);
    case LteConnection::KLTE_RRC_STATE_ENDING:
      if (c.now >= deadline_) change(LteConnection::KLTE_RRC_STATE_IDLE, state_.cause, c);
      return std::nullopt;
    case LteConnection::KLTE_RRC_STATE_ATMPT_OUTBND_MOBILITY:
      return std::nullopt;
    case LteConnection::KLTE_RRC_STATE_ATMPT_INBND_MOBILITY:
      if (c.now >= deadline_) becomeConnected(LteCause::KLTE_RRC_CAUSE_EST_SUCC_MOB_TO_EUTRAN, c);
      return std::nullopt;
  }
  return std::nullopt;
}

void LteModem::becomeConnected(LteCause::Value cause, const Circumstances& c) {
  change(LteConnection::KLTE_RRC_STATE_CONNECTED, cause, c);
  lastActivity_ = c.now;
  downloadSince_ = -1;
  outOfSync_ = 0;
  t310Ends_ = -1;
  reestablishing_ = false;
  state_.transmissionMode = state_.sinr > 8 ? 4 : state_.sinr > 0 ? 3 : 2;  // 3GPP TS 36.213, 7.1
  forgetDeconfigured(c);
  c.facts.learn(Fact::LteAggregation, c.now);
  control(c);
}

// The candidate that the rules of 3GPP TS 36.304, 5.2.4.5 and 5.2.4.6 prefer to the serving cell.
std::optional<CellIndex> LteModem::reselectionCandidate(const Circumstances& c) const {
  const CellIndex serving = *state_.serving;
  const Carrier& carrier = network_.carrierOf(serving);
  const bool unsuitable = c.forbidden.knownForbidden(serving);
  const bool servingLow = unsuitable || state_.rsrp - LteSelection::qRxLevMin < LteSelection::servingLowP;
  std::optional<CellIndex> best;
  std::uint32_t bestPriority = 0;
  const auto consider = [&](CellIndex cell, std::uint32_t priority) {
    if (best && priority <= bestPriority) return;
    best = cell;
    bestPriority = priority;
  };
  for (const CellIndex cell : c.surroundings.heard(Technology::Lte)) {
    if (cell == serving || c.forbidden.knownForbidden(cell)) continue;
    const Carrier& other = network_.carrierOf(cell);
    const double strength = c.surroundings.strength(cell);
    const double level = strength - LteSelection::qRxLevMin;
    if (other.priority > carrier.priority) {
      if (level > LteSelection::candidateHighP && c.surroundings.quality(cell) > -16) consider(cell, other.priority);
    } else if (other.priority == carrier.priority) {
      if (unsuitable || strength > state_.rsrp + LteSelection::hysteresis) consider(cell, other.priority);
    } else if (servingLow && level > LteSelection::candidateLowP) {
      consider(cell, other.priority);
    }
  }
  if (best || !servingLow) return best;
  if (const auto cell = strongestAllowed(c, Technology::Umts, UmtsSelection::qRxLevMin + 6)) return cell;
  return strongestAllowed(c, Technology::Gsm, GsmSelection::rxLevAccessMin + 6);
}

std::optional<Departure> LteModem::advanceIdle(const Circumstances& c) {
  if (c.measured) {
    // 3GPP TS 36.304, 5.2.3.2: the serving cell has to stay suitable.
    failing_.note(state_.rsrp <= LteSelection::qRxLevMin || state_.sinr < -12, c.now);
    std::optional<CellIndex> target;
    Milliseconds patience = LteSelection::reselectionTime;
    if (failing_.hasFailedFor(searchAfter, c.now)) {
      target = selectionCandidate(c);
      patience = 0;
      lost_ = !target && failing_.hasFailedFor(lostAfter, c.now);
      if (target == state_.serving) target.reset();
    } else if (c.mayLeave) {
      target = reselectionCandidate(c);
      if (c.forbidden.knownForbidden(*state_.serving)) patience = 0;
    }
    if (reselection_.holds(target, c.now, patience)) {
      if (network_.technologyOf(*target) != Technology::Lte) return Departure{*target, Manner::Reselection};
      serve(*target, c);
      return std::nullopt;
    }
  }
  if (!c.demand.any() || c.now < backOff_ || state_.rsrp <= LteSelection::qRxLevMin) return std::nullopt;
  if (c.forbidden.knownForbidden(*state_.serving)) return std::nullopt;
  const LteCause::Value cause = c.demand.registering        ? LteCause::KLTE_RRC_CAUSE_EST_MO_SIGNAL
                                : c.demand.mobileTerminated ? LteCause::KLTE_RRC_CAUSE_EST_MT_ACC
                                                            : LteCause::KLTE_RRC_CAUSE_EST_MO_DATA;
  change(LteConnection::KLTE_RRC_STATE_ATMPT_CONNECTION, cause, c);
  deadline_ = c.now + stepTime * c.random.integerBetween(2, 4);
  return std::nullopt;
}

}  // namespace probeview::scenario
