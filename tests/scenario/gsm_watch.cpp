// SPDX-License-Identifier: Apache-2.0
#include <algorithm>

#include "messages/gsm_messages.h"
#include "messages/umts_messages.h"
#include "tests/scenario/drive.h"
#include "tests/scenario/watches.h"

namespace probeview {
namespace {

using GsmState = KCellularGsmScellInfo::State;
using Band = KCellularWcdmaCellInfo::WcdmaBand;

// 3GPP TS 45.005, 2: the bands that the made-up networks use.
bool isArfcnInBand(std::uint32_t arfcn, std::int32_t band) {
  return band == Band::SYS_BAND_GSM_DCS_1800 ? arfcn >= 512 && arfcn <= 885
                                             : band == Band::SYS_BAND_GSM_PGSM_900 && arfcn >= 1 && arfcn <= 124;
}

}  // namespace

bool GsmWatch::isOver() const {
  return !servesCell_ && states_.now() == GsmState::NON_DEDICATED_STATE && stateTime_ >= latest_;
}

void GsmWatch::see(const MetricRecord& record) {
  latest_ = std::max(latest_, record.time);
  switch (record.metricId) {
    case K_GSM_SCELL_INFO: {
      const auto message = decoded<KCellularGsmScellInfo>(record);
      const auto before = states_.now();
      servesCell_ = message.hasCellId();
      if (!servesCell_) {
        findings_.expect(Rule::GsmWithoutACellIsNotDedicated,
                         message.state() == GsmState::NON_DEDICATED_STATE && !message.hasArfcn() && !message.hasLac());
        if (!how_.soak && before == GsmState::DEDICATED_STATE) findings_.reach("GSM > NON_DEDICATED");
        states_.becomes(message.state(), record.time);
        stateTime_ = record.time;
        serving_.reset();
        return;
      }
      const CellName cell{message.arfcn(), message.bsic()};
      if (!how_.soak && before && message.state() != before) {
        findings_.reach(message.state() == GsmState::DEDICATED_STATE ? "GSM > DEDICATED" : "GSM > NON_DEDICATED");
      }
      if (cell != serving_) {
        if (!how_.soak && serving_ && before == GsmState::DEDICATED_STATE && message.state() == before)
          findings_.reach("GSM handover");
        cellChangedAt_ = record.time;
      }
      states_.becomes(message.state(), record.time);
      stateTime_ = record.time;
      serving_ = cell;
      together_.told(0, record.time);
      findings_.expect(Rule::GsmChannelInBand, isArfcnInBand(message.arfcn(), message.gsmBand()));
      findings_.expectBetween(Rule::GsmRanges, message.bsic(), 0, 63);
      findings_.expectBetween(Rule::GsmRanges, message.lac(), 1, 0xFFFD);
      findings_.expectBetween(Rule::GsmRanges, message.cellId(), 0, 0xFFFF);
      return;
    }
    case K_GSM_IDLE_CONFIG:
      return seeIdleConfiguration(record);
    case K_GSM_GPRS_CONFIG: {
      const auto message = decoded<KCellularGsmGprsConfig>(record);
      together_.told(2, record.time);
      findings_.expectBetween(Rule::GsmRanges, message.rac(), 0, 255);
      findings_.expectBetween(Rule::GsmRanges, message.nco(), 0, 2);
      findings_.expectBetween(Rule::GsmRanges, message.nom(), 1, 3);
      findings_.expectBetween(Rule::GsmRanges, message.crHyst(), 0, 7);
      return;
    }
    case K_GSM_IDLE_SCELL_MEAS: {
      const auto message = decoded<KCellularGsmIdleScellMeasurement>(record);
      if (!how_.soak) {
        findings_.expect(Rule::GsmMeasurementIsThatOfTheMode,
                         states_.at(record.time) == GsmState::NON_DEDICATED_STATE && serving_ &&
                             message.scellArfcn() == serving_->first);
      }
      findings_.expectBetween(Rule::GsmRanges, message.idleRxlevDBm(), -110, -47);
      return;
    }
    case K_GSM_CS_RF_MEAS: {
      const auto message = decoded<KCellularGsmCsRfMeasurement>(record);
      if (!how_.soak) {
        findings_.expect(Rule::GsmMeasurementIsThatOfTheMode, states_.at(record.time) == GsmState::DEDICATED_STATE &&
                                                                  serving_ && message.scellArfcn() == serving_->first);
      }
      findings_.expectBetween(Rule::GsmRanges, message.csRxlevSub(), 0, 63);
      findings_.expectBetween(Rule::GsmRanges, message.csRxqualSub(), 0, 7);
      for (std::size_t i = 0; i < message.csTxPwrsCount(); ++i) {
        findings_.expectBetween(Rule::GsmRanges, message.csTxPwrAtIndex(i), 5, 33);
      }
      return;
    }
    case K_GSM_NCELL_MEAS:
      return seeNeighbours(record);
    default:
      return;
  }
}

void GsmWatch::settle(Moment time) {
  if (cellChangedAt_ == time) findings_.expect(Rule::GsmCellChangesAtOneMoment, together_.allAt(time));
}

void GsmWatch::seeIdleConfiguration(const MetricRecord& record) {
  const auto message = decoded<KCellularGsmIdleConfig>(record);
  together_.told(1, record.time);
  findings_.expect(Rule::GsmChannelInBand,
                   isArfcnInBand(message.arfcnBcch(), static_cast<std::int32_t>(message.gsmBand())));
  findings_.expectBetween(Rule::GsmRanges, message.radioLinkTimeout(), 0, 15);
  findings_.expectBetween(Rule::GsmRanges, message.msTxpwr(), 0, 31);
  findings_.expectBetween(Rule::GsmRanges, message.rxAccMin(), 0, 63);
  findings_.expectBetween(Rule::GsmRanges, message.bsPaMfrms(), 2, 9);
  findings_.expectBetween(Rule::GsmRanges, message.maxRetransCs(), 0, 3);
  findings_.expectBetween(Rule::GsmRanges, message.penaltyT(), 0, 31);
}

void GsmWatch::seeNeighbours(const MetricRecord& record) {
  const auto message = decoded<KCellularGsmGrrEventMeasCr>(record);
  std::set<CellName> listed;
  for (const GsmNcellMeas& neighbour : message.gsmNcellMeas()) {
    const CellName cell{neighbour.arfcn(), neighbour.bsic()};
    findings_.expect(Rule::GsmNeighbourIsNotTheServingCell, cell != serving_ && listed.insert(cell).second);
    findings_.expectBetween(Rule::GsmRanges, neighbour.rxlev(), 0, 63);
  }
  for (const UmtsNcellMeas& neighbour : message.umtsNcellMeas()) {
    findings_.expectBetween(Rule::UmtsRanges, neighbour.cpichSc(), 0, 511);
    findings_.expectBetween(Rule::UmtsRanges, neighbour.cpichRscp(), 0, 91);
    findings_.expectBetween(Rule::UmtsRanges, neighbour.cpichEcn0(), 0, 49);
  }
  for (const LteNcellMeas& neighbour : message.lteNcellMeas()) {
    findings_.expectBetween(Rule::LteRanges, neighbour.physicalCellId(), 0, 503);
    findings_.expectBetween(Rule::LteRanges, neighbour.rsrp(), 0, 97);
    findings_.expectBetween(Rule::LteRanges, neighbour.rsrq(), 0, 34);
    findings_.expectBetween(Rule::LteRanges, neighbour.bandwidth(), 0, 5);
  }
}

}  // namespace probeview
