// SPDX-License-Identifier: Apache-2.0
//
// The connected mode of LTE: handover and departure, radio link supervision and re-establishment.
#include "scenario/lte_modem.h"
#include "scenario/selection.h"

namespace probeview::scenario {
namespace {

constexpr Milliseconds inactivity = 5000;         // the network releases a connection without data after this
constexpr Milliseconds handoverPreparation = 80;  // from the measurement report to the new cell

}  // namespace

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
      beginReestablishment(LteCause::KLTE_RRC_CAUSE_REEST_HO_FAIL, c);
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
      change(
          LteConnection::KLTE_RRC_STATE_ENDING,
          c.random.chance(0.04) ? LteCause::KLTE_RRC_CAUSE_REL_LOAD_BAL_TAU_REQD : LteCause::KLTE_RRC_CAUSE_REL_OTHER,
          c);
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
        change(LteConnection::KLTE_RRC_STATE_ATMPT_OUTBND_MOBILITY, LteCause::KLTE_RRC_CAUSE_NA, c);
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
      beginReestablishment(LteCause::KLTE_RRC_CAUSE_REEST_OTHER_FAIL_T310_EXP, c);
    }
    return;
  }
  outOfSync_ = state_.sinr < LteSupervision::outOfSync ? outOfSync_ + 1 : 0;
  if (outOfSync_ >= LteSupervision::n310) t310Ends_ = c.now + LteSupervision::t310;
}

void LteModem::beginReestablishment(LteCause::Value cause, const Circumstances& c) {
  endAggregation(c);
  change(LteConnection::KLTE_RRC_STATE_ATMPT_CONNECTION, cause, c);
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
        change(LteConnection::KLTE_RRC_STATE_IDLE, LteCause::KLTE_RRC_CAUSE_REL_CONN_FAIL_REEST_REJ, c);
      }
      return;
    }
  }
  if (c.now < deadline_) return;
  reestablishing_ = false;
  change(LteConnection::KLTE_RRC_STATE_IDLE, LteCause::KLTE_RRC_CAUSE_REL_CONN_FAIL_T311_EXP, c);
  // The search has been made already; the next look decides where to go.
  failing_.failsSince(c.now - searchAfter);
}

}  // namespace probeview::scenario
