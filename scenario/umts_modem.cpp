// SPDX-License-Identifier: Apache-2.0
#include "scenario/umts_modem.h"

#include "scenario/selection.h"

namespace probeview::scenario {
namespace {

// How long a connection without data stays in each state (3GPP TS 25.331, 8.5; the network's own timers).
constexpr Milliseconds dedicatedInactivity = 2000;
constexpr Milliseconds sharedInactivity = 3000;
constexpr Milliseconds pagingInactivity = 8000;
constexpr unsigned idleDrxCycle = 1280, pagingDrxCycle = 640;
constexpr double largestPower = 24, smallestPower = -50;  // 3GPP TS 25.101, 6.2.1 and 6.4.3
constexpr double outOfSyncEcNo = -20;                     // CPICH Ec/No

}  // namespace

void UmtsModem::change(UmtsConnection::Value to, const Circumstances& c) {
  state_.connection = to;
  since_ = c.now;
  c.facts.learn(Fact::UmtsConnection, c.now);
  configure(c);
  // What was measured at this very moment is told together with the new state.
  if (c.facts[Fact::UmtsServingMeasurement].learnt == c.now) state_.measuredConnected = state_.connectedMode();
  if (!state_.connected()) c.facts.end(Fact::UmtsTransmitPower);
}

void UmtsModem::configure(const Circumstances& c) {
  std::optional<unsigned> cycle;
  if (state_.connection == UmtsConnection::KWCDMA_RRC_CONN_STATE_IDLE) cycle = idleDrxCycle;
  if (state_.connection == UmtsConnection::KWCDMA_RRC_CONN_STATE_URA_PCH ||
      state_.connection == UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_PCH) {
    cycle = pagingDrxCycle;
  }
  const bool dualCarrier = state_.connection == UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_DCH && c.demand.download;
  if (cycle == state_.drxCycle && dualCarrier == state_.dualCarrier) return;
  state_.drxCycle = cycle;
  state_.dualCarrier = dualCarrier;
  c.facts.learn(Fact::UmtsConfiguration, c.now);
}

void UmtsModem::serve(CellIndex cell, const Circumstances& c) {
  state_.serving = cell;
  lost_ = false;
  failing_.clear();
  outOfSync_ = 0;
  reselection_.clear();
  bestCell_.clear();
  outbound_.clear();
  c.facts.learn(Fact::UmtsServingCell, c.now);
  c.facts.learn(Fact::UmtsSelection, c.now);
  measure(c);
}

void UmtsModem::enter(CellIndex cell, Manner manner, const Circumstances& c) {
  state_.release.reset();
  state_.establishment.reset();
  lastActivity_ = c.now;
  backOff_ = 0;
  serve(cell, c);
  change(manner == Manner::Handover ? UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_DCH
                                    : UmtsConnection::KWCDMA_RRC_CONN_STATE_IDLE,
         c);
  if (manner == Manner::Handover) control(c);
  c.facts.learn(Fact::UmtsConfiguration, c.now);
}

void UmtsModem::leave(const Circumstances& c) {
  if (state_.connectedMode()) state_.release = UmtsRelease::KRRC_REL_CELL_CHANGED;
  change(UmtsConnection::KWCDMA_RRC_CONN_STATE_INACTIVE, c);
  for (const Fact fact : {Fact::UmtsServingCell, Fact::UmtsTransmitPower, Fact::UmtsSelection, Fact::UmtsNeighbours,
                          Fact::UmtsConnection, Fact::UmtsConfiguration}) {
    c.facts.leave(fact);
  }
  // The last measurement may have been told as one of connected mode, and must not stand as if that went on.
  state_.measuredConnected = false;
  c.facts.leaveWithLastWord(Fact::UmtsServingMeasurement, c.now);
}

void UmtsModem::measure(const Circumstances& c) {
  const CellIndex serving = *state_.serving;
  state_.rscp = c.surroundings.strength(serving);
  state_.ecNo = c.surroundings.quality(serving);
  state_.pilotRatio = c.surroundings.interferenceRatio(serving);
  state_.carrierPower = c.surroundings.carrierPower(serving);
  const double secondAntenna = state_.carrierPower - c.random.between(1, 3);
  state_.antennaPower = {std::clamp(state_.carrierPower, weakestUtraCarrier, strongestUtraCarrier),
                         std::clamp(secondAntenna, weakestUtraCarrier, strongestUtraCarrier)};
  state_.measuredConnected = state_.connectedMode();
  listAllHeard(c, serving, state_.neighbours);
  c.facts.learn(Fact::UmtsServingMeasurement, c.now);
  c.facts.learn(Fact::UmtsNeighbours, c.now);
}

// 3GPP TS 25.331, 8.5.3 and 25.214, 5.1.2: what makes up for the path loss, more for a call than for signalling.
void UmtsModem::control(const Circumstances& c) {
  constexpr double pilotBroadcast = 33;  // the primary CPICH's power without the antenna's gain
  const double pathLoss = pilotBroadcast - state_.rscp;
  const double target = c.demand.download ? -104 : c.demand.voice ? -110 : -113;
  state_.transmitPowers.clear();
  for (unsigned i = 0; i < 4; ++i) {
    TransmitPower power;
    power.shared = std::clamp(target + pathLoss + c.random.between(-1.5, 1.5), smallestPower, largestPower);
    power.subframe = i;
    state_.transmitPowers.push_back(power);
  }
  c.facts.learn(Fact::UmtsTransmitPower, c.now);
}

void UmtsModem::release(UmtsRelease::Value cause, const Circumstances& c) {
  state_.release = cause;
  change(UmtsConnection::KWCDMA_RRC_CONN_STATE_RELEASE, c);
  deadline_ = c.now + 2 * stepTime;
}

std::optional<Departure> UmtsModem::advance(const Circumstances& c) {
  if (!state_.camped()) return std::nullopt;
  if (c.measured) measure(c);
  switch (state_.connection) {
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_INVALID:
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_INACTIVE:
      return std::nullopt;
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_IDLE:
      return advanceIdle(c);
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_ESTABLISH:
      if (c.now >= deadline_) {
        if (state_.ecNo > outOfSyncEcNo) {
          const bool dedicated = c.demand.voice || c.demand.download || c.demand.registering;
          lastActivity_ = c.now;
          change(dedicated ? UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_DCH
                           : UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_FACH,
                 c);
          control(c);
        } else {
          state_.release = UmtsRelease::KRRC_REL_OTHER_CAUSE;
          change(UmtsConnection::KWCDMA_RRC_CONN_STATE_IDLE, c);
          backOff_ = c.now + 1000;
        }
      }
      return std::nullopt;
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_URA_PCH:
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_PCH:
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_FACH:
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_DCH: {
      if (c.demand.any()) lastActivity_ = c.now;
      if (c.measured) {
        if (state_.connected()) control(c);
        outOfSync_ = state_.ecNo < outOfSyncEcNo || state_.rscp < UmtsSelection::qRxLevMin - 3 ? outOfSync_ + 1 : 0;
        if (outOfSync_ >= 5) {
          state_.release = UmtsRelease::KRRC_REL_CONN_REL_LOWER_LAYER_FAILURE_DL;
          change(UmtsConnection::KWCDMA_RRC_CONN_STATE_RADIO_LINK_FAILURE, c);
          deadline_ = c.now + 400;
          return std::nullopt;
        }
        if (const auto departure = changeCell(c)) return departure;
      }
      advanceChannel(c);
      return std::nullopt;
    }
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_SCRI_SENT:
      if (c.now >= deadline_) release(UmtsRelease::KRRC_REL_SIGN_CONN_REL, c);
      return std::nullopt;
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_RELEASE:
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_RADIO_LINK_FAILURE:
      if (c.now >= deadline_) change(UmtsConnection::KWCDMA_RRC_CONN_STATE_IDLE, c);
      return std::nullopt;
  }
  return std::nullopt;
}

std::optional<CellIndex> UmtsModem::reselectionCandidate(const Circumstances& c) const {
  const CellIndex serving = *state_.serving;
  const bool unsuitable = c.forbidden.knownForbidden(serving);
  if (const auto cell = strongestAllowed(c, Technology::Lte, UmtsSelection::lteHigh)) return cell;
  for (const CellIndex cell : c.surroundings.heard(Technology::Umts)) {
    if (cell == serving || c.forbidden.knownForbidden(cell)) continue;
    if (unsuitable || c.surroundings.strength(cell) > state_.rscp + UmtsSelection::hysteresis) return cell;
    break;
  }
  if (unsuitable || state_.rscp < UmtsSelection::servingLow) {
    return strongestAllowed(c, Technology::Gsm, unsuitable ? GsmSelection::rxLevAccessMin : UmtsSelection::gsmLow);
  }
  return std::nullopt;
}

std::optional<Departure> UmtsModem::advanceIdle(const Circumstances& c) {
  if (c.measured) {
    failing_.note(state_.rscp <= UmtsSelection::qRxLevMin || state_.ecNo < UmtsSelection::qQualMin - 3, c.now);
    std::optional<CellIndex> target;
    Milliseconds patience = c.firstSearch ? 0 : UmtsSelection::reselectionTime;
    if (failing_.hasFailedFor(searchAfter, c.now)) {
      patience = 0;
      target = selectionCandidate(c);
      if (target == state_.serving) target = strongestAllowed(c, Technology::Gsm, GsmSelection::rxLevAccessMin);
      lost_ = !target && failing_.hasFailedFor(lostAfter, c.now);
    } else if (c.mayLeave) {
      target = reselectionCandidate(c);
    }
    if (reselection_.holds(target, c.now, patience)) {
      if (network_.technologyOf(*target) != Technology::Umts) return Departure{*target, Manner::Reselection};
      serve(*target, c);
      return std::nullopt;
    }
  }
  if (!c.demand.any() || c.now < backOff_ || c.forbidden.knownForbidden(*state_.serving)) return std::nullopt;
  state_.release.reset();
  if (c.demand.voice) {
    state_.establishment = c.demand.mobileTerminated ? UmtsEstablishment::KRRC_EST_TERM_CONV_CALL
                                                     : UmtsEstablishment::KRRC_EST_ORIG_CONV_CALL;
  } else if (c.demand.registering) {
    state_.establishment = UmtsEstablishment::KRRC_EST_REGISTRATION;
  } else if (c.demand.mobileTerminated) {
    state_.establishment = UmtsEstablishment::KRRC_EST_TERM_INTERACT_CALL;
  } else {
    state_.establishment = c.demand.download ? UmtsEstablishment::KRRC_EST_ORIG_INTERACT_CALL
                                             : UmtsEstablishment::KRRC_EST_ORIG_BACKGND_CALL;
  }
  change(UmtsConnection::KWCDMA_RRC_CONN_STATE_ESTABLISH, c);
  deadline_ = c.now + stepTime * c.random.integerBetween(2, 4);
  return std::nullopt;
}

// Moves between the connected states as data comes and goes.
void UmtsModem::advanceChannel(const Circumstances& c) {
  const bool wide = c.demand.voice || c.demand.download || c.demand.uplinkBlocks > 4;
  const Milliseconds quiet = c.now - lastActivity_;
  const Milliseconds here = c.now - since_;
  switch (state_.connection) {
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_DCH:
      configure(c);
      // What was only for signalling is released as soon as all has been said.
      if (state_.establishment == UmtsEstablishment::KRRC_EST_REGISTRATION && !c.demand.any()) {
        release(UmtsRelease::KRRC_REL_NORMAL_EVENT, c);
        return;
      }
      if (quiet >= dedicatedInactivity) change(UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_FACH, c);
      return;
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_FACH:
      if (wide) {
        change(UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_DCH, c);
      } else if (quiet >= dedicatedInactivity + sharedInactivity) {
        change(c.random.chance(0.5) ? UmtsConnection::KWCDMA_RRC_CONN_STATE_URA_PCH
                                    : UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_PCH,
               c);
      }
      return;
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_URA_PCH:
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_PCH:
      if (c.demand.any()) {
        change(UmtsConnection::KWCDMA_RRC_CONN_STATE_CELL_FACH, c);
        control(c);
      } else if (here >= pagingInactivity) {
        // Either the network has had enough, or the phone says that it has nothing more to send (25.331, 8.1.14).
        if (c.random.chance(0.5)) {
          release(UmtsRelease::KRRC_REL_NORMAL_EVENT, c);
        } else {
          change(UmtsConnection::KWCDMA_RRC_CONN_STATE_SCRI_SENT, c);
          deadline_ = c.now + 3 * stepTime;
        }
      }
      return;
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_INVALID:
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_INACTIVE:
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_IDLE:
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_ESTABLISH:
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_RELEASE:
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_RADIO_LINK_FAILURE:
    case UmtsConnection::KWCDMA_RRC_CONN_STATE_SCRI_SENT:
      return;
  }
}

std::optional<Departure> UmtsModem::changeCell(const Circumstances& c) {
  const std::optional<CellIndex> better =
      strongerCell(c, Technology::Umts, *state_.serving, state_.rscp + UmtsSelection::hysteresis);
  if (bestCell_.holds(better, c.now, UmtsSelection::timeToTrigger)) {
    serve(*better, c);
    return std::nullopt;
  }
  if (!c.mayLeave) return std::nullopt;
  // A call goes down to GSM when UMTS gets thin; data goes up to LTE as soon as there is some again.
  std::optional<CellIndex> target;
  Milliseconds patience = UmtsSelection::timeToTrigger;
  Manner manner = Manner::Handover;
  if (state_.rscp < UmtsSelection::servingLow) {
    target = strongestAllowed(c, Technology::Gsm, UmtsSelection::gsmLow);
    if (!c.demand.voice) manner = Manner::Redirection;
  } else if (!c.demand.voice) {
    target = strongestAllowed(c, Technology::Lte, UmtsSelection::lteHigh);
    patience = UmtsSelection::toLteTime;
    if (!state_.connected()) manner = Manner::Reselection;
  }
  if (!outbound_.holds(target, c.now, patience)) return std::nullopt;
  return Departure{*target, manner};
}

}  // namespace probeview::scenario
