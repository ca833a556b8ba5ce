// SPDX-License-Identifier: Apache-2.0
#include "scenario/lte_modem.h"

#include <utility>

#include "scenario/decibel.h"
#include "scenario/selection.h"

namespace probeview::scenario {
namespace {

constexpr Milliseconds kInactivity = 5000;         // the network releases a connection without data after this
constexpr Milliseconds kHandoverPreparation = 80;  // from the measurement report to the new cell
constexpr std::size_t kSamples = 10;
constexpr std::size_t kFewestSamples = 5;                   // that are worth a report, just after a change of the cell
constexpr double kLargestPower = 23, kSmallestPower = -40;  // 3GPP TS 36.101, 6.2.2 and 6.3.2

double bounded(double power) { return std::clamp(power, kSmallestPower, kLargestPower); }

}  // namespace

void LteModem::change(LteConnection to, LteCause cause, const Circumstances& c) {
  state_.previous = state_.connection;
  state_.previousDuration = c.now - state_.since;
  state_.connection = to;
  state_.since = c.now;
  state_.cause = cause;
  c.facts.learn(Fact::kLteConnection, c.now);
  c.facts.learn(Fact::kLteDrx, c.now);  // it names the state
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
    c.facts.learn(Fact::kLteAggregation, c.now);
  }
  c.facts.beginAnew(Fact::kLteSamples);
  c.facts.learn(Fact::kLteServingCell, c.now);
  c.facts.learn(Fact::kLteSelection, c.now);
  c.facts.learn(Fact::kLteComponentCarriers, c.now);
  measure(c);
}

void LteModem::enter(CellIndex cell, Manner manner, const Circumstances& c) {
  samples_.clear();
  forgetDeconfigured(c);
  if (manner == Manner::kHandover) {
    change(LteConnection::kAttemptingInboundMobility, LteCause::kNotApplicable, c);
    deadline_ = c.now + 120;
  } else {
    change(LteConnection::kIdle, LteCause::kNotApplicable, c);
    backOff_ = 0;
  }
  serve(cell, c);
}

void LteModem::leave(LteCause cause, const Circumstances& c) {
  endAggregation(c);
  change(LteConnection::kNull, cause, c);
  reestablishing_ = false;
  executing_.reset();
  leaving_.reset();
  for (const Fact fact : {Fact::kLteServingCell, Fact::kLteSamples, Fact::kLteConnection, Fact::kLteDrx,
                          Fact::kLteTransmitPower, Fact::kLteComponentCarriers, Fact::kLteSelection,
                          Fact::kLteNeighbours, Fact::kLteInterRatNeighbours, Fact::kLteAggregation}) {
    c.facts.leave(fact);
  }
}

void LteModem::measure(const Circumstances& c) {
  const CellIndex serving = *state_.serving;
  state_.rsrp = c.surroundings.strength(serving);
  state_.rsrq = c.surroundings.quality(serving);
  state_.sinr = c.surroundings.interferenceRatio(serving);
  listAllHeard(c, serving, state_.neighbours);
  c.facts.learn(Fact::kLteNeighbours, c.now);
  c.facts.learn(Fact::kLteInterRatNeighbours, c.now);
  for (SecondaryCarrier& carrier : state_.secondaries) {
    if (carrier.state == SecondaryState::kDeconfigured) continue;
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
    sample.rsrp[antenna] = std::clamp(state_.rsrp + waver, kWeakestRsrp, kStrongestRsrp);
    sample.rsrq[antenna] = std::clamp(state_.rsrq + 0.4 * waver, kWorstRsrq, kBestRsrq);
    sample.sinr[antenna] = std::clamp(state_.sinr + waver, kWorstSinr, kBestSinr);
  }
  if (samples_.size() == kSamples) samples_.erase(samples_.begin());
  samples_.push_back(sample);
  if (samples_.size() < kFewestSamples || !c.measured) return;
  state_.samples = samples_;
  c.facts.learn(Fact::kLteSamples, c.now);
}

// 3GPP TS 36.213, 5.1.1.1 and 5.1.2.1: what makes up for the path loss, within what the phone can do.
void LteModem::control(const Circumstances& c) {
  constexpr double kAntennaGain = 15;  // the broadcast reference signal power is without it
  const double pathLoss = network_.referenceDbm(*state_.serving) - kAntennaGain - state_.rsrp;
  constexpr double kSharedTarget = -82, kPathLossFactor = 0.8, kControlTarget = -112;
  state_.transmitPowers.clear();
  for (unsigned i = 0; i < 4; ++i) {
    TransmitPower power;
    power.subframe = nextSubframe_;
    nextSubframe_ = (nextSubframe_ + 1) % 10;
    power.control = bounded(kControlTarget + pathLoss + c.random.between(-1, 1));
    if (c.demand.uplinkBlocks > 0 || c.demand.signalling) {
      const double blocks = std::max(1U, c.demand.uplinkBlocks);
      power.shared = bounded(toDecibels(blocks) + kSharedTarget + kPathLossFactor * pathLoss + c.random.between(-1, 1));
    }
    state_.transmitPowers.push_back(power);
  }
  c.facts.learn(Fact::kLteTransmitPower, c.now);
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
    case LteConnection::kNull:
      return std::nullopt;
    case LteConnection::kIdle:
      return advanceIdle(c);
    case LteConnection::kAttemptingConnection:
      if (reestablishing_) {
        advanceReestablishment(c);
      } else if (c.now >= deadline_) {
        // The random access is heard where the downlink is; now and then the network is too busy.
        if (state_.sinr > -8 && (c.random.chance(0.98) || c.firstSearch)) {
          becomeConnected(state_.cause, c);
        } else {
          change(LteConnection::kIdle, LteCause::kEstablishNoResponse, c);
          backOff_ = c.now + 1000;
        }
      }
      return std::nullopt;
    case LteConnection::kConnected:
      return advanceConnected(c);
    case LteConnection::kEnding:
      if (c.now >= deadline_) change(LteConnection::kIdle, state_.cause, c);
      return std::nullopt;
    case LteConnection::kAttemptingOutboundMobility:
      return std::nullopt;
    case LteConnection::kAttemptingInboundMobility:
      if (c.now >= deadline_) becomeConnected(LteCause::kEstablishMobilityToEutran, c);
      return std::nullopt;
  }
  return std::nullopt;
}

void LteModem::becomeConnected(LteCause cause, const Circumstances& c) {
  change(LteConnection::kConnected, cause, c);
  lastActivity_ = c.now;
  downloadSince_ = -1;
  outOfSync_ = 0;
  t310Ends_ = -1;
  reestablishing_ = false;
  state_.transmissionMode = state_.sinr > 8 ? 4 : state_.sinr > 0 ? 3 : 2;  // 3GPP TS 36.213, 7.1
  forgetDeconfigured(c);
  c.facts.learn(Fact::kLteAggregation, c.now);
  control(c);
}

std::optional<CellIndex> LteModem::selectionCandidate(const Circumstances& c) const {
  if (const auto cell = strongestAllowed(c, Technology::kLte, LteSelection::kQRxLevMin)) return cell;
  if (const auto cell = strongestAllowed(c, Technology::kUmts, UmtsSelection::kQRxLevMin)) return cell;
  return strongestAllowed(c, Technology::kGsm, GsmSelection::kRxLevAccessMin);
}

// The candidate that the rules of 3GPP TS 36.304, 5.2.4.5 and 5.2.4.6 prefer to the serving cell.
std::optional<CellIndex> LteModem::reselectionCandidate(const Circumstances& c) const {
  const CellIndex serving = *state_.serving;
  const Carrier& carrier = network_.carrierOf(serving);
  const bool unsuitable = c.forbidden.knownForbidden(serving);
  const bool servingLow = unsuitable || state_.rsrp - LteSelection::kQRxLevMin < LteSelection::kServingLowP;
  std::optional<CellIndex> best;
  std::uint32_t bestPriority = 0;
  const auto consider = [&](CellIndex cell, std::uint32_t priority) {
    if (best && priority <= bestPriority) return;
    best = cell;
    bestPriority = priority;
  };
  for (const CellIndex cell : c.surroundings.heard(Technology::kLte)) {
    if (cell == serving || c.forbidden.knownForbidden(cell)) continue;
    const Carrier& other = network_.carrierOf(cell);
    const double strength = c.surroundings.strength(cell);
    const double level = strength - LteSelection::kQRxLevMin;
    if (other.priority > carrier.priority) {
      if (level > LteSelection::kCandidateHighP && c.surroundings.quality(cell) > -16) consider(cell, other.priority);
    } else if (other.priority == carrier.priority) {
      if (unsuitable || strength > state_.rsrp + LteSelection::kHysteresis) consider(cell, other.priority);
    } else if (servingLow && level > LteSelection::kCandidateLowP) {
      consider(cell, other.priority);
    }
  }
  if (best || !servingLow) return best;
  if (const auto cell = strongestAllowed(c, Technology::kUmts, UmtsSelection::kQRxLevMin + 6)) return cell;
  return strongestAllowed(c, Technology::kGsm, GsmSelection::kRxLevAccessMin + 6);
}

std::optional<Departure> LteModem::advanceIdle(const Circumstances& c) {
  if (c.measured) {
    // 3GPP TS 36.304, 5.2.3.2: the serving cell has to stay suitable.
    const bool failing = state_.rsrp <= LteSelection::kQRxLevMin || state_.sinr < -12;
    if (!failing) {
      cellFailingSince_ = -1;
    } else if (cellFailingSince_ < 0) {
      cellFailingSince_ = c.now;
    }
    std::optional<CellIndex> target;
    Milliseconds patience = LteSelection::kReselectionTime;
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
      if (network_.technologyOf(*target) != Technology::kLte) return Departure{*target, Manner::kReselection};
      serve(*target, c);
      return std::nullopt;
    }
  }
  if (!c.demand.any() || c.now < backOff_ || state_.rsrp <= LteSelection::kQRxLevMin) return std::nullopt;
  if (c.forbidden.knownForbidden(*state_.serving)) return std::nullopt;
  const LteCause cause = c.demand.registering        ? LteCause::kEstablishSignalling
                         : c.demand.mobileTerminated ? LteCause::kEstablishMobileTerminated
                                                     : LteCause::kEstablishData;
  change(LteConnection::kAttemptingConnection, cause, c);
  deadline_ = c.now + kStep * c.random.integerBetween(2, 4);
  return std::nullopt;
}

// Event A3 towards cells of the same carrier and, with a larger offset, of others; A5 towards other carriers.
std::optional<CellIndex> LteModem::handoverCandidate(const Circumstances& c) const {
  const CellIndex serving = *state_.serving;
  const CarrierIndex carrier = network_.cells[serving].carrier;
  for (const CellIndex cell : c.surroundings.heard(Technology::kLte)) {
    // The network hands nobody over to where he may not be (3GPP TS 36.413, handover restriction list).
    if (cell == serving || network_.cells[cell].areaCode == network_.forbiddenAreaCode) continue;
    const double strength = c.surroundings.strength(cell);
    if (network_.cells[cell].carrier == carrier) {
      if (strength - LteMobility::kHysteresis > state_.rsrp + LteMobility::kA3Offset) return cell;
    } else if (state_.rsrp + LteMobility::kHysteresis < LteMobility::kA5Serving &&
               strength - LteMobility::kHysteresis > LteMobility::kA5Candidate) {
      return cell;
    }
  }
  return std::nullopt;
}

std::optional<CellIndex> LteModem::outboundCandidate(const Circumstances& c) const {
  if (state_.rsrp + LteMobility::kHysteresis >= LteMobility::kB2Serving) return std::nullopt;
  if (const auto cell = strongestAllowed(c, Technology::kUmts, LteMobility::kB2Umts)) return cell;
  return strongestAllowed(c, Technology::kGsm, LteMobility::kB2Gsm);
}

std::optional<Departure> LteModem::advanceConnected(const Circumstances& c) {
  if (executing_) {
    if (c.now < executesAt_) return std::nullopt;
    const CellIndex target = *executing_;
    executing_.reset();
    // The target has to answer the random access before T304 runs out.
    if (c.surroundings.interferenceRatio(target) < -9) {
      beginReestablishment(LteCause::kReestablishHandoverFailure, c);
      return std::nullopt;
    }
    serve(target, c);
    c.facts.learn(Fact::kLteDrx, c.now);  // the new cell configures it anew
    return std::nullopt;
  }
  if (c.demand.any()) lastActivity_ = c.now;
  if (c.measured) {
    control(c);
    superviseLink(c);
    if (reestablishing_) return std::nullopt;
    if (!c.demand.signalling && c.now - lastActivity_ >= kInactivity) {
      endAggregation(c);
      c.facts.end(Fact::kLteTransmitPower);
      change(LteConnection::kEnding, c.random.chance(0.04) ? LteCause::kReleaseLoadBalancing : LteCause::kReleaseOther,
             c);
      deadline_ = c.now + kStep;
      return std::nullopt;
    }
    // 3GPP TS 23.272: without voice over IMS a call is made on UMTS or GSM.
    if (c.demand.voice && !c.voiceOverIms) {
      auto target = strongestAllowed(c, Technology::kUmts, UmtsSelection::kQRxLevMin + 6);
      if (!target) target = strongestAllowed(c, Technology::kGsm, GsmSelection::kRxLevAccessMin + 6);
      if (target) {
        leaving_ = Departure{*target, Manner::kFallbackForVoice};
        executesAt_ = c.now + kHandoverPreparation;
        return std::nullopt;
      }
    }
    if (const auto target = handoverCandidate(c); handover_.holds(target, c.now, LteMobility::kTimeToTrigger)) {
      endAggregation(c);  // by the very command, while the primary cell is still the old one
      executing_ = target;
      executesAt_ = c.now + kHandoverPreparation;
      return std::nullopt;
    }
    if (const auto target = outboundCandidate(c);
        c.mayLeave && outbound_.holds(target, c.now, LteMobility::kTimeToTrigger)) {
      // A call is handed over (3GPP TS 23.216); data is redirected, which is easier on the network.
      const bool handover = c.demand.voice;
      leaving_ = Departure{*target, handover ? Manner::kHandover : Manner::kRedirection};
      executesAt_ = c.now + (handover ? 160 : kHandoverPreparation);
      if (handover) {
        endAggregation(c);
        change(LteConnection::kAttemptingOutboundMobility, LteCause::kNotApplicable, c);
      }
      return std::nullopt;
    }
    aggregate(c);
  }
  return std::nullopt;
}

void LteModem::superviseLink(const Circumstances& c) {
  if (t310Ends_ >= 0) {
    if (state_.sinr > LteSupervision::kInSync) {
      t310Ends_ = -1;
      outOfSync_ = 0;
    } else if (c.now >= t310Ends_) {
      beginReestablishment(LteCause::kReestablishT310Expired, c);
    }
    return;
  }
  outOfSync_ = state_.sinr < LteSupervision::kOutOfSync ? outOfSync_ + 1 : 0;
  if (outOfSync_ >= LteSupervision::kN310) t310Ends_ = c.now + LteSupervision::kT310;
}

void LteModem::beginReestablishment(LteCause cause, const Circumstances& c) {
  endAggregation(c);
  change(LteConnection::kAttemptingConnection, cause, c);
  c.facts.end(Fact::kLteTransmitPower);
  reestablishing_ = true;
  t310Ends_ = -1;
  deadline_ = c.now + LteSupervision::kT311;
}

// 3GPP TS 36.331, 5.3.7: the phone looks for any suitable cell and asks it to go on.
void LteModem::advanceReestablishment(const Circumstances& c) {
  if (c.measured && c.now - state_.since >= 160) {
    const auto found = strongestAllowed(c, Technology::kLte, LteSelection::kQRxLevMin);
    if (found && c.surroundings.interferenceRatio(*found) > LteSupervision::kInSync) {
      if (*found != state_.serving) serve(*found, c);
      if (c.random.chance(0.9)) {
        becomeConnected(state_.cause, c);
      } else {
        reestablishing_ = false;
        change(LteConnection::kIdle, LteCause::kReleaseReestablishmentRejected, c);
      }
      return;
    }
  }
  if (c.now < deadline_) return;
  reestablishing_ = false;
  change(LteConnection::kIdle, LteCause::kReleaseT311Expired, c);
  // The search has been made already; the next look decides where to go.
  cellFailingSince_ = c.now - 1200;
}

}  // namespace probeview::scenario
