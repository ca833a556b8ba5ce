// SPDX-License-Identifier: Apache-2.0
#include "tests/scenario/findings.h"

namespace probeview {

std::string_view nameOf(Rule rule) {
  switch (rule) {
    case Rule::TimestampIsTheRecords:
      return "a payload's timestamp is its record's time";
    case Rule::TimeOfAMetricNeverGoesBack:
      return "the time of a metric never goes back";
    case Rule::LeavingIsToldBeforeTheNextTechnology:
      return "that a technology was left is told before the next one's first state";
    case Rule::LeavingIsToldAtTheMomentOfArrival:
      return "a technology is left at the moment at which the next one serves";
    case Rule::WhatIsLeftIsSilent:
      return "nothing of a technology that was left is newer than that";
    case Rule::LtePreviousStateIsTheOneBefore:
      return "an LTE state's previous state is the one before";
    case Rule::LteDurationIsExact:
      return "an LTE state's previous duration is exact";
    case Rule::LteComesBackFromNull:
      return "the first LTE state after coming back has NULL and the time away";
    case Rule::DrxNamesTheStateThatIs:
      return "C-DRX names the RRC state that is";
    case Rule::DrxIsConfiguredInConnectedAlone:
      return "C-DRX is configured while connected, and at no other time";
    case Rule::LteCellChangesAtOneMoment:
      return "cell, selection parameters and carriers of LTE change with one timestamp";
    case Rule::LteRanges:
      return "LTE values lie within their ranges";
    case Rule::LteChannelInBand:
      return "an EARFCN lies in its band";
    case Rule::LteNeighbourIsNotTheServingCell:
      return "the serving LTE cell is no neighbour of its own";
    case Rule::LtePowerWhileSending:
      return "LTE sends while connected alone";
    case Rule::CarriersAreThoseOfTheServingCell:
      return "the primary carrier is the serving cell's";
    case Rule::CarriersAreDistinct:
      return "component carriers are distinct";
    case Rule::SecondaryKeepsItsIndex:
      return "a secondary carrier keeps the index with which it was configured";
    case Rule::SecondaryNeverNamesThePrimary:
      return "a secondary carrier never names the primary's EARFCN";
    case Rule::SecondaryOnlyWhileConnected:
      return "secondary carriers are configured while connected alone";
    case Rule::DeconfiguredHasNoMeasurements:
      return "a deconfigured secondary carrier has no measurements";
    case Rule::DeconfiguredWasConfiguredInThisConnection:
      return "a deconfigured secondary carrier does not come back in the next connection";
    case Rule::UmtsCellChangesAtOneMoment:
      return "cell and selection parameters of UMTS change with one timestamp";
    case Rule::UmtsRanges:
      return "UMTS values lie within their ranges";
    case Rule::UmtsChannelInBand:
      return "a UARFCN lies in its band";
    case Rule::UmtsNeighbourIsNotTheServingCell:
      return "the serving UMTS cell is no neighbour of its own";
    case Rule::UmtsConnectedModeIsThatOfTheState:
      return "connected_mode is that of the RRC state (3GPP TS 25.331, 7)";
    case Rule::UmtsPowerWhileSending:
      return "UMTS sends in CELL_FACH and CELL_DCH alone";
    case Rule::UmtsConfigurationIsOverWhenLeft:
      return "no UMTS configuration outlives the technology";
    case Rule::UmtsMeasurementsEndUnconnected:
      return "the last measurement of UMTS says that it is no longer connected";
    case Rule::GsmCellChangesAtOneMoment:
      return "cell, idle and packet configuration of GSM change with one timestamp";
    case Rule::GsmRanges:
      return "GSM values lie within their ranges";
    case Rule::GsmChannelInBand:
      return "an ARFCN lies in its band";
    case Rule::GsmNeighbourIsNotTheServingCell:
      return "the serving GSM cell is no neighbour of its own";
    case Rule::GsmMeasurementIsThatOfTheMode:
      return "GSM measures as its mode does";
    case Rule::GsmWithoutACellIsNotDedicated:
      return "GSM that no cell serves has no dedicated channel";
    case Rule::MobilityRanges:
      return "values of mobility management lie within their ranges";
    case Rule::TmsiIsTheVisitorRegisters:
      return "a TMSI never has its two top bits both set (3GPP TS 23.003, 2.4)";
    case Rule::PacketTmsiIsTheServingNodes:
      return "a P-TMSI always has its two top bits set (3GPP TS 23.003, 2.4)";
    case Rule::BearersAreDistinct:
      return "bearers are distinct";
    case Rule::Count:
      break;
  }
  return "?";
}

void Findings::expect(Rule rule, bool holds) {
  Tally& tally = tallies_[static_cast<std::size_t>(rule)];
  ++tally.asked;
  if (holds) return;
  if (tally.broken++ == 0) tally.first = drive_ + " after " + std::to_string(now_.count()) + " ms";
}

std::string Findings::broken() const {
  std::string text;
  for (std::size_t i = 0; i < tallies_.size(); ++i) {
    const Tally& tally = tallies_[i];
    if (tally.asked > 0 && tally.broken == 0) continue;
    text += std::string(nameOf(static_cast<Rule>(i))) + ": ";
    text += tally.asked == 0 ? "never put to the test"
                             : std::to_string(tally.broken) + " of " + std::to_string(tally.asked) +
                                   " times not, first in " + tally.first;
    text += "\n";
  }
  return text;
}

}  // namespace probeview
