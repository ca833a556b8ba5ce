// SPDX-License-Identifier: Apache-2.0
#include "scenario/lte_modem.h"

#include <utility>

#include "scenario/decibel.h"
#include "scenario/selection.h"

namespace probeview::scenario {
namespace {

constexpr Milliseconds inactivity = 5000;         // the network releases a connection without data after this
constexpr Milliseconds handoverPreparation = 80;  // from the measurement report to the new cell
constexpr std::size_t mostSamples = 10;
constexpr std::size_t fewestSamples = 5;                  // that are worth a report, just after a change of the cell
constexpr double largestPower = 23, smallestPower = -40;  // 3GPP TS 36.101, 6.2.2 and 6.3.2

double bounded(double power) { return std::clamp(power, smallestPower, largestPower); }

}  // namespace

void LteModem::change(LteConnection to, LteCause cause, const Circumstances& c) {
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
  cellFailingSince_ = -1;
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
    change(LteConnection::AttemptingInboundMobility, LteCause::NotApplicable, c);
    deadline_ = c.now + 120;
  } else {
    change(LteConnection::Idle, LteCause::NotApplicable, c);
    backOff_ = 0;
  }
  serve(cell, c);
}

void LteModem::leave(LteCause cause, const Circumstances& c) {
  endAggregation(c);
  change(LteConnection::Null, cause, c);
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
    if (carrier.state == SecondaryState::Deconfigured) continue;
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
    case LteConnection::Null:
      return std::nullopt;
    case LteConnection::Idle:
      return advanceIdle(c);
    case LteConnection::AttemptingConnection:
      if (reestablishing_) {
        advanceReestablishment(c);
      } else if (c.now >= deadline_) {
        // The random access is heard where the downlink is; now and then the network is too busy.
        if (state_.sinr > -8 && (c.random.chance(0.98) || c.firstSearch)) {
          becomeConnected(state_.cause, c);
        } else {
          change(LteConnection::Idle, LteCause::EstablishNoResponse, c);
          backOff_ = c.now + 1000;
        }
      }
      return std::nullopt;
    case LteConnection::Connected:
      return advanceConnected(c);
    case LteConnection::Ending:
      if (c.now >= deadline_) change(LteConnection::Idle, state_.cause, c);
      return std::nullopt;
    case LteConnection::AttemptingOutboundMobility:
      return std::nullopt;
    case LteConnection::AttemptingInboundMobility:
      if (c.now >= deadline_) becomeConnected(LteCause::EstablishMobilityToEutran, c);
      return std::nullopt;
  }
  return std::nullopt;
}

void LteModem::becomeConnected(LteCause cause, const Circumstances& c) {
  change(LteConnection::Connected, cause, c);
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

std::optional<CellIndex> LteModem::selectionCandidate(const Circumstances& c) const {
  if (const auto cell = strongestAllowed(c, Technology::Lte, LteSelection::qRxLevMin)) return cell;
  if (const auto cell = strongestAllowed(c, Technology::Umts, UmtsSelection::qRxLevMin)) return cell;
  return strongestAllowed(c, Technology::Gsm, GsmSelection::rxLevAccessMin);
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
    const bool failing = state_.rsrp <= LteSelection::qRxLevMin || state_.sinr < -12;
    if (!failing) {
      cellFailingSince_ = -1;
    } else if (cellFailingSince_ < 0) {
      cellFailingSince_ = c.now;
    }
    std::optional<CellIndex> target;
    Milliseconds patience = LteSelection::reselectionTime;
    if (cellFailingSince_ >= 0 && c.now - cellFailingSince_ >= 1200) {
      target = selectionCandidate(c);
      patience = 0;
      if (!target || *target == state_.serving) {
        lost_ = !target && c.now - cellFailingSince_ >= 3000;
        target.reset();
      }
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
  const LteCause cause = c.demand.registering        ? LteCause::EstablishSignalling
                         : c.demand.mobileTerminated ? LteCause::EstablishMobileTerminated
                                                     : LteCause::EstablishData;
  change(LteConnection::AttemptingConnection, cause, c);
  deadline_ = c.now + stepTime * c.random.integerBetween(2, 4);
  return std::nullopt;
}

// Event A3 towards cells of the same carrier and, with a larger offset, of others; A5 towards other carriers.
std::optional<CellIndex> LteModem::handoverCandidate(const Circumstances& c) const {
  const CellIndex serving = *state_.serving;
  const CarrierIndex carrier = network_.cells[serving].carrier;
  for (const CellIndex cell : c.surroundings.heard(Technology::Lte)) {
    // The network hands nobody over to where he may not be (3GPP TS 36.413, handover restriction list).
    if (cell == serving || network_.cells[cell].areaCode == network_.forbiddenAreaCode) continue;
    const double strength = c.surroundings.strength(cell);
    if (network_.cells[cell].carrier == carrier) {
      if (strength - LteMobility::hysteresis > state_.rsrp + LteMobility::a3Offset) return cell;
    } else if (state_.rsrp + LteMobility::hysteresis < LteMobility::a5Serving &&
               strength - LteMobility::hysteresis > LteMobility::a5Candidate) {
      return cell;
    }
  }
  return std::nullopt;
}

std::optional<CellIndex> LteModem::outboundCandidate(const Circumstances& c) const {
  if (state_.rsrp + LteMobility::hysteresis >= LteMobility::b2Serving) return std::nullopt;
  if (const auto cell = strongestAllowed(c, Technology::Umts, LteMobility::b2Umts)) return cell;
  return strongestAllowed(c, Technology::Gsm, LteMobility::b2Gsm);
}

std::optional<Departure> LteModem::advanceConnected(const Circumstances& c) {
  if (executing_) {
    if (c.now < executesAt_) return std::nullopt;
    const CellIndex target = *executing_;
    executing_.reset();
    // The target has to answer the random access before T304 runs out.
    if (c.surroundings.interferenceRatio(target) < -9) {
      beginReestablishment(LteCause::ReestablishHandoverFailure, c);
      return std::nullopt;
    }
    serve(target, c);
    c.facts.learn(Fact::LteDrx, c.now);  // the new cell configures it anew
    return std::nullopt;
  }
  if (c.demand.any()) lastActivity_ = c.now;
  if (c.measured) {
    control(c);
    superviseLink(c);
    if (reestablishing_) return std::nullopt;
    if (!c.demand.signalling && c.now - lastActivity_ >= inactivity) {
      endAggregation(c);
      c.facts.end(Fact::LteTransmitPower);
      change(LteConnection::Ending, c.random.chance(0.04) ? LteCause::ReleaseLoadBalancing : LteCause::ReleaseOther, c);
      deadline_ = c.now + stepTime;
      return std::nullopt;
    }
    // 3GPP TS 23.272: without voice over IMS a call is made on UMTS or GSM.
    if (c.demand.voice && !c.voiceOverIms) {
      std::optional<CellIndex> target = strongestAllowed(c, Technology::Umts, UmtsSelection::qRxLevMin + 6);
      if (!target) target = strongestAllowed(c, Technology::Gsm, GsmSelection::rxLevAccessMin + 6);
      if (target) {
        leaving_ = Departure{*target, Manner::FallbackForVoice};
        executesAt_ = c.now + handoverPreparation;
        return std::nullopt;
      }
    }
    if (const auto target = handoverCandidate(c); handover_.holds(target, c.now, LteMobility::timeToTrigger)) {
      endAggregation(c);  // by the very command, while the primary cell is still the old one
      executing_ = target;
      executesAt_ = c.now + handoverPreparation;
      return std::nullopt;
    }
    if (const auto target = outboundCandidate(c);
        c.mayLeave && outbound_.holds(target, c.now, LteMobility::timeToTrigger)) {
      // A call is handed over (3GPP TS 23.216); data is redirected, which is easier on the network.
      const bool handover = c.demand.voice;
      leaving_ = Departure{*target, handover ? Manner::Handover : Manner::Redirection};
      executesAt_ = c.now + (handover ? 160 : handoverPreparation);
      if (handover) {
        endAggregation(c);
        change(LteConnection::AttemptingOutboundMobility, LteCause::NotApplicable, c);
      }
      return std::nullopt;
    }
    aggregate(c);
  }
  return std::nullopt;
}

void LteModem::superviseLink(const Circumstances& c) {
  if (t310Ends_ >= 0) {
    if (state_.sinr > LteSupervision::inSync) {
      t310Ends_ = -1;
      outOfSync_ = 0;
    } else if (c.now >= t310Ends_) {
      beginReestablishment(LteCause::ReestablishT310Expired, c);
    }
    return;
  }
  outOfSync_ = state_.sinr < LteSupervision::outOfSync ? outOfSync_ + 1 : 0;
  if (outOfSync_ >= LteSupervision::n310) t310Ends_ = c.now + LteSupervision::t310;
}

void LteModem::beginReestablishment(LteCause cause, const Circumstances& c) {
  endAggregation(c);
  change(LteConnection::AttemptingConnection, cause, c);
  c.facts.end(Fact::LteTransmitPower);
  reestablishing_ = true;
  t310Ends_ = -1;
  deadline_ = c.now + LteSupervision::t311;
}

// 3GPP TS 36.331, 5.3.7: the phone looks for any suitable cell and asks it to go on.
void LteModem::advanceReestablishment(const Circumstances& c) {
  if (c.measured && c.now - state_.since >= 160) {
    const std::optional<CellIndex> found = strongestAllowed(c, Technology::Lte, LteSelection::qRxLevMin);
    if (found && c.surroundings.interferenceRatio(*found) > LteSupervision::inSync) {
      if (*found != state_.serving) serve(*found, c);
      if (c.random.chance(0.9)) {
        becomeConnected(state_.cause, c);
      } else {
        reestablishing_ = false;
        change(LteConnection::Idle, LteCause::ReleaseReestablishmentRejected, c);
      }
      return;
    }
  }
  if (c.now < deadline_) return;
  reestablishing_ = false;
  change(LteConnection::Idle, LteCause::ReleaseT311Expired, c);
  // The search has been made already; the next look decides where to go.
  cellFailingSince_ = c.now - 1200;
}

}  // namespace probeview::scenario
