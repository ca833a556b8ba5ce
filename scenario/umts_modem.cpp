// SPDX-License-Identifier: Apache-2.0
#include "scenario/umts_modem.h"

#include "scenario/selection.h"

namespace probeview::scenario {
namespace {

// How long a connection without data stays in each state (3GPP TS 25.331, 8.5; the network's own timers).
constexpr Milliseconds kDedicatedInactivity = 2000;
constexpr Milliseconds kSharedInactivity = 3000;
constexpr Milliseconds kPagingInactivity = 8000;
constexpr unsigned kIdleDrxCycle = 1280, kPagingDrxCycle = 640;
constexpr double kLargestPower = 24, kSmallestPower = -50;  // 3GPP TS 25.101, 6.2.1 and 6.4.3
constexpr double kOutOfSync = -20;                          // CPICH Ec/No

}  // namespace

void UmtsModem::change(UmtsConnection to, const Circumstances& c) {
  state_.connection = to;
  since_ = c.now;
  c.facts.learn(Fact::kUmtsConnection, c.now);
  configure(c);
  // What was measured at this very moment is told together with the new state.
  if (c.facts[Fact::kUmtsServingMeasurement].learnt == c.now) state_.measuredConnected = state_.connectedMode();
  if (!state_.connected()) c.facts.end(Fact::kUmtsTransmitPower);
}

void UmtsModem::configure(const Circumstances& c) {
  std::optional<unsigned> cycle;
  if (state_.connection == UmtsConnection::kIdle) cycle = kIdleDrxCycle;
  if (state_.connection == UmtsConnection::kUraPch || state_.connection == UmtsConnection::kCellPch) {
    cycle = kPagingDrxCycle;
  }
  const bool dualCarrier = state_.connection == UmtsConnection::kCellDch && c.demand.download;
  if (cycle == state_.drxCycle && dualCarrier == state_.dualCarrier) return;
  state_.drxCycle = cycle;
  state_.dualCarrier = dualCarrier;
  c.facts.learn(Fact::kUmtsConfiguration, c.now);
}

void UmtsModem::serve(CellIndex cell, const Circumstances& c) {
  state_.serving = cell;
  lost_ = false;
  cellFailingSince_ = -1;
  outOfSync_ = 0;
  reselection_.clear();
  bestCell_.clear();
  outbound_.clear();
  c.facts.learn(Fact::kUmtsServingCell, c.now);
  c.facts.learn(Fact::kUmtsSelection, c.now);
  measure(c);
}

void UmtsModem::enter(CellIndex cell, Manner manner, const Circumstances& c) {
  state_.release.reset();
  state_.establishment.reset();
  lastActivity_ = c.now;
  backOff_ = 0;
  serve(cell, c);
  change(manner == Manner::kHandover ? UmtsConnection::kCellDch : UmtsConnection::kIdle, c);
  if (manner == Manner::kHandover) control(c);
  c.facts.learn(Fact::kUmtsConfiguration, c.now);
}

void UmtsModem::leave(const Circumstances& c) {
  if (state_.connectedMode()) state_.release = UmtsRelease::kCellChanged;
  change(UmtsConnection::kInactive, c);
  for (const Fact fact : {Fact::kUmtsServingCell, Fact::kUmtsTransmitPower, Fact::kUmtsSelection, Fact::kUmtsNeighbours,
                          Fact::kUmtsConnection, Fact::kUmtsConfiguration}) {
    c.facts.leave(fact);
  }
  // The last measurement may have been told as one of connected mode, and must not stand as if that went on.
  state_.measuredConnected = false;
  c.facts.leaveWithLastWord(Fact::kUmtsServingMeasurement, c.now);
}

void UmtsModem::measure(const Circumstances& c) {
  const CellIndex serving = *state_.serving;
  state_.rscp = c.surroundings.strength(serving);
  state_.ecNo = c.surroundings.quality(serving);
  state_.pilotRatio = c.surroundings.interferenceRatio(serving);
  state_.carrierPower = c.surroundings.carrierPower(serving);
  const double secondAntenna = state_.carrierPower - c.random.between(1, 3);
  state_.antennaPower = {std::clamp(state_.carrierPower, kWeakestUtraCarrier, kStrongestUtraCarrier),
                         std::clamp(secondAntenna, kWeakestUtraCarrier, kStrongestUtraCarrier)};
  state_.measuredConnected = state_.connectedMode();
  listAllHeard(c, serving, state_.neighbours);
  c.facts.learn(Fact::kUmtsServingMeasurement, c.now);
  c.facts.learn(Fact::kUmtsNeighbours, c.now);
}

// 3GPP TS 25.331, 8.5.3 and 25.214, 5.1.2: what makes up for the path loss, more for a call than for signalling.
void UmtsModem::control(const Circumstances& c) {
  constexpr double kPilotBroadcast = 33;  // the primary CPICH's power without the antenna's gain
  const double pathLoss = kPilotBroadcast - state_.rscp;
  const double target = c.demand.download ? -104 : c.demand.voice ? -110 : -113;
  state_.transmitPowers.clear();
  for (unsigned i = 0; i < 4; ++i) {
    TransmitPower power;
    power.shared = std::clamp(target + pathLoss + c.random.between(-1.5, 1.5), kSmallestPower, kLargestPower);
    power.subframe = i;
    state_.transmitPowers.push_back(power);
  }
  c.facts.learn(Fact::kUmtsTransmitPower, c.now);
}

void UmtsModem::release(UmtsRelease cause, const Circumstances& c) {
  state_.release = cause;
  change(UmtsConnection::kReleasing, c);
  deadline_ = c.now + 2 * kStep;
}

std::optional<Departure> UmtsModem::advance(const Circumstances& c) {
  if (!state_.camped()) return std::nullopt;
  if (c.measured) measure(c);
  switch (state_.connection) {
    case UmtsConnection::kInactive:
      return std::nullopt;
    case UmtsConnection::kIdle:
      return advanceIdle(c);
    case UmtsConnection::kEstablishing:
      if (c.now >= deadline_) {
        if (state_.ecNo > kOutOfSync) {
          const bool dedicated = c.demand.voice || c.demand.download || c.demand.registering;
          lastActivity_ = c.now;
          change(dedicated ? UmtsConnection::kCellDch : UmtsConnection::kCellFach, c);
          control(c);
        } else {
          state_.release = UmtsRelease::kOther;
          change(UmtsConnection::kIdle, c);
          backOff_ = c.now + 1000;
        }
      }
      return std::nullopt;
    case UmtsConnection::kUraPch:
    case UmtsConnection::kCellPch:
    case UmtsConnection::kCellFach:
    case UmtsConnection::kCellDch: {
      if (c.demand.any()) lastActivity_ = c.now;
      if (c.measured) {
        if (state_.connected()) control(c);
        outOfSync_ = state_.ecNo < kOutOfSync || state_.rscp < UmtsSelection::kQRxLevMin - 3 ? outOfSync_ + 1 : 0;
        if (outOfSync_ >= 5) {
          state_.release = UmtsRelease::kLowerLayerFailureDownlink;
          change(UmtsConnection::kRadioLinkFailure, c);
          deadline_ = c.now + 400;
          return std::nullopt;
        }
        if (const auto departure = changeCell(c)) return departure;
      }
      advanceChannel(c);
      return std::nullopt;
    }
    case UmtsConnection::kSignallingReleaseIndicated:
      if (c.now >= deadline_) release(UmtsRelease::kSignallingConnectionRelease, c);
      return std::nullopt;
    case UmtsConnection::kReleasing:
    case UmtsConnection::kRadioLinkFailure:
      if (c.now >= deadline_) change(UmtsConnection::kIdle, c);
      return std::nullopt;
  }
  return std::nullopt;
}

std::optional<CellIndex> UmtsModem::reselectionCandidate(const Circumstances& c) const {
  const CellIndex serving = *state_.serving;
  const bool unsuitable = c.forbidden.knownForbidden(serving);
  if (const auto cell = strongestAllowed(c, Technology::kLte, UmtsSelection::kLteHigh)) return cell;
  for (const CellIndex cell : c.surroundings.heard(Technology::kUmts)) {
    if (cell == serving || c.forbidden.knownForbidden(cell)) continue;
    if (unsuitable || c.surroundings.strength(cell) > state_.rscp + UmtsSelection::kHysteresis) return cell;
    break;
  }
  if (unsuitable || state_.rscp < UmtsSelection::kServingLow) {
    return strongestAllowed(c, Technology::kGsm, unsuitable ? GsmSelection::kRxLevAccessMin : UmtsSelection::kGsmLow);
  }
  return std::nullopt;
}

std::optional<Departure> UmtsModem::advanceIdle(const Circumstances& c) {
  if (c.measured) {
    const bool failing = state_.rscp <= UmtsSelection::kQRxLevMin || state_.ecNo < UmtsSelection::kQQualMin - 3;
    if (!failing) {
      cellFailingSince_ = -1;
    } else if (cellFailingSince_ < 0) {
      cellFailingSince_ = c.now;
    }
    std::optional<CellIndex> target;
    Milliseconds patience = c.firstSearch ? 0 : UmtsSelection::kReselectionTime;
    if (cellFailingSince_ >= 0 && c.now - cellFailingSince_ >= 1200) {
      patience = 0;
      target = strongestAllowed(c, Technology::kLte, LteSelection::kQRxLevMin);
      if (!target) target = strongestAllowed(c, Technology::kUmts, UmtsSelection::kQRxLevMin);
      if (!target || target == state_.serving) {
        target = strongestAllowed(c, Technology::kGsm, GsmSelection::kRxLevAccessMin);
      }
      lost_ = !target && c.now - cellFailingSince_ >= 3000;
    } else if (c.mayLeave) {
      target = reselectionCandidate(c);
    }
    if (reselection_.holds(target, c.now, patience)) {
      if (network_.technologyOf(*target) != Technology::kUmts) return Departure{*target, Manner::kReselection};
      serve(*target, c);
      return std::nullopt;
    }
  }
  if (!c.demand.any() || c.now < backOff_ || c.forbidden.knownForbidden(*state_.serving)) return std::nullopt;
  state_.release.reset();
  if (c.demand.voice) {
    state_.establishment =
        c.demand.mobileTerminated ? UmtsEstablishment::kTerminatingCall : UmtsEstablishment::kOriginatingCall;
  } else if (c.demand.registering) {
    state_.establishment = UmtsEstablishment::kRegistration;
  } else if (c.demand.mobileTerminated) {
    state_.establishment = UmtsEstablishment::kTerminatingInteractive;
  } else {
    state_.establishment =
        c.demand.download ? UmtsEstablishment::kOriginatingInteractive : UmtsEstablishment::kOriginatingBackground;
  }
  change(UmtsConnection::kEstablishing, c);
  deadline_ = c.now + kStep * c.random.integerBetween(2, 4);
  return std::nullopt;
}

// Moves between the connected states as data comes and goes.
void UmtsModem::advanceChannel(const Circumstances& c) {
  const bool wide = c.demand.voice || c.demand.download || c.demand.uplinkBlocks > 4;
  const Milliseconds quiet = c.now - lastActivity_;
  const Milliseconds here = c.now - since_;
  switch (state_.connection) {
    case UmtsConnection::kCellDch:
      configure(c);
      // What was only for signalling is released as soon as all has been said.
      if (state_.establishment == UmtsEstablishment::kRegistration && !c.demand.any()) {
        release(UmtsRelease::kNormal, c);
        return;
      }
      if (quiet >= kDedicatedInactivity) change(UmtsConnection::kCellFach, c);
      return;
    case UmtsConnection::kCellFach:
      if (wide) {
        change(UmtsConnection::kCellDch, c);
      } else if (quiet >= kDedicatedInactivity + kSharedInactivity) {
        change(c.random.chance(0.5) ? UmtsConnection::kUraPch : UmtsConnection::kCellPch, c);
      }
      return;
    case UmtsConnection::kUraPch:
    case UmtsConnection::kCellPch:
      if (c.demand.any()) {
        change(UmtsConnection::kCellFach, c);
        control(c);
      } else if (here >= kPagingInactivity) {
        // Either the network has had enough, or the phone says that it has nothing more to send (25.331, 8.1.14).
        if (c.random.chance(0.5)) {
          release(UmtsRelease::kNormal, c);
        } else {
          change(UmtsConnection::kSignallingReleaseIndicated, c);
          deadline_ = c.now + 3 * kStep;
        }
      }
      return;
    case UmtsConnection::kInactive:
    case UmtsConnection::kIdle:
    case UmtsConnection::kEstablishing:
    case UmtsConnection::kReleasing:
    case UmtsConnection::kRadioLinkFailure:
    case UmtsConnection::kSignallingReleaseIndicated:
      return;
  }
}

std::optional<Departure> UmtsModem::changeCell(const Circumstances& c) {
  std::optional<CellIndex> better;
  for (const CellIndex cell : c.surroundings.heard(Technology::kUmts)) {
    if (cell == state_.serving || network_.cells[cell].areaCode == network_.forbiddenAreaCode) continue;
    if (c.surroundings.strength(cell) > state_.rscp + UmtsSelection::kHysteresis) better = cell;
    break;
  }
  if (bestCell_.holds(better, c.now, UmtsSelection::kTimeToTrigger)) {
    serve(*better, c);
    return std::nullopt;
  }
  if (!c.mayLeave) return std::nullopt;
  // A call goes down to GSM when UMTS gets thin; data goes up to LTE as soon as there is some again.
  std::optional<CellIndex> target;
  Milliseconds patience = UmtsSelection::kTimeToTrigger;
  Manner manner = Manner::kHandover;
  if (state_.rscp < UmtsSelection::kServingLow) {
    target = strongestAllowed(c, Technology::kGsm, UmtsSelection::kGsmLow);
    if (!c.demand.voice) manner = Manner::kRedirection;
  } else if (!c.demand.voice) {
    target = strongestAllowed(c, Technology::kLte, UmtsSelection::kLteHigh);
    patience = UmtsSelection::kToLteTime;
    if (!state_.connected()) manner = Manner::kReselection;
  }
  if (!outbound_.holds(target, c.now, patience)) return std::nullopt;
  return Departure{*target, manner};
}

}  // namespace probeview::scenario
