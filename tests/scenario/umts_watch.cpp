// SPDX-License-Identifier: Apache-2.0
#include "messages/umts_messages.h"
#include "tests/scenario/drive.h"
#include "tests/scenario/watches.h"

namespace probeview {
namespace {

using UmtsState = KCellularWcdmaRrcConnectionState::State;

// 3GPP TS 25.101, 5.4.4: the bands that the made-up networks use.
bool isUarfcnInBand(std::uint32_t uarfcn, std::uint32_t band) {
  return band == 1 ? uarfcn >= 10562 && uarfcn <= 10838 : band == 8 && uarfcn >= 2937 && uarfcn <= 3088;
}

std::string umtsStateName(std::int32_t state) {
  constexpr std::array names{"INVALID",   "INACTIVE", "IDLE",    "ESTABLISH",          "URA_PCH",  "CELL_PCH",
                             "CELL_FACH", "CELL_DCH", "RELEASE", "RADIO_LINK_FAILURE", "SCRI_SENT"};
  return names.at(static_cast<std::size_t>(state));
}

// 3GPP TS 25.331, 7: from the establishment of the connection to its end, whatever the phone does in between.
bool isConnectedMode(std::int32_t state) {
  switch (state) {
    case UmtsState::KWCDMA_RRC_CONN_STATE_URA_PCH:
    case UmtsState::KWCDMA_RRC_CONN_STATE_CELL_PCH:
    case UmtsState::KWCDMA_RRC_CONN_STATE_CELL_FACH:
    case UmtsState::KWCDMA_RRC_CONN_STATE_CELL_DCH:
    case UmtsState::KWCDMA_RRC_CONN_STATE_RELEASE:
    case UmtsState::KWCDMA_RRC_CONN_STATE_RADIO_LINK_FAILURE:
    case UmtsState::KWCDMA_RRC_CONN_STATE_SCRI_SENT:
      return true;
    default:
      return false;
  }
}

}  // namespace

bool UmtsWatch::serves() const { return states_.now() && *states_.now() != UmtsState::KWCDMA_RRC_CONN_STATE_INACTIVE; }
bool UmtsWatch::isOver() const { return states_.now() == UmtsState::KWCDMA_RRC_CONN_STATE_INACTIVE; }

void UmtsWatch::see(const MetricRecord& record) {
  switch (record.metricId) {
    case K_UMTS_RRC_STATE:
      return seeState(record);
    case K_UMTS_RRC_CONFIG: {
      const auto message = decoded<KCellularWcdmaRrcConfiguration>(record);
      configuration_ = {message.hasDrxCycleLengthMs(), message.isDcConfigured()};
      if (message.hasDrxCycleLengthMs()) {
        findings_.expectBetween(Rule::UmtsRanges, message.drxCycleLengthMs(), 80, 5120);
      }
      return;
    }
    case K_UMTS_SCELL_INFO: {
      const auto message = decoded<KCellularWcdmaCellInfo>(record);
      const CellName cell{message.dlUarfcn(), message.psc()};
      if (serving_ && cell != serving_) findings_.reach("UMTS cell change");
      serving_ = cell;
      cellChangedAt_ = record.time;
      together_.told(0, record.time);
      using Band = KCellularWcdmaCellInfo::WcdmaBand;
      const std::uint32_t band = message.wcdmaBand() == Band::SYS_BAND_WCDMA_I_IMT_2000 ? 1 : 8;
      findings_.expect(Rule::UmtsChannelInBand, isUarfcnInBand(message.dlUarfcn(), band));
      findings_.expectBetween(Rule::UmtsRanges, message.psc(), 0, 511);
      findings_.expectBetween(Rule::UmtsRanges, message.cellId(), 0, 0x0FFFFFFF);
      findings_.expectBetween(Rule::UmtsRanges, message.lac(), 1, 0xFFFD);
      return;
    }
    case K_UMTS_SEL_RESEL_INFO:
      return seeSelection(record);
    case K_UMTS_SCELL_MEAS:
      return seeMeasurement(record);
    case K_UMTS_TX_POWER: {
      const auto message = decoded<KCellularWcdmaTxPower>(record);
      if (!how_.soak) {
        const auto state = states_.at(record.time);
        findings_.expect(Rule::UmtsPowerWhileSending, state == UmtsState::KWCDMA_RRC_CONN_STATE_CELL_FACH ||
                                                          state == UmtsState::KWCDMA_RRC_CONN_STATE_CELL_DCH);
      }
      for (const TxPowerInfo& power : message.txPowerInfos()) {
        findings_.expectBetween(Rule::UmtsRanges, power.puschTxPower(), -50, 24);  // 3GPP TS 25.101, 6.2.1 and 6.4.3
      }
      return;
    }
    case K_UMTS_NCELL_MEAS:
      return seeNeighbours(record);
    default:
      return;
  }
}

void UmtsWatch::settle(Moment time) {
  if (cellChangedAt_ == time) findings_.expect(Rule::UmtsCellChangesAtOneMoment, together_.allAt(time));
  if (!isOver() || states_.since() != time) return;
  if (configuration_) {
    findings_.expect(Rule::UmtsConfigurationIsOverWhenLeft, !configuration_->first && !configuration_->second);
  }
  if (how_.everyChange) findings_.expect(Rule::UmtsMeasurementsEndUnconnected, connectedMode_ != true);
}

void UmtsWatch::seeState(const MetricRecord& record) {
  const auto message = decoded<KCellularWcdmaRrcConnectionState>(record);
  const auto before = states_.now();
  if (!how_.soak && before && message.state() != before) {
    findings_.reach("UMTS " + umtsStateName(*before) + " > " + umtsStateName(message.state()));
  }
  states_.becomes(message.state(), record.time);
}

void UmtsWatch::seeSelection(const MetricRecord& record) {
  const auto message = decoded<KCellularWcdmaSelReselCellInfo>(record);
  together_.told(1, record.time);
  findings_.expectBetween(Rule::UmtsRanges, message.sCellPrio(), 0, 7);
  for (const std::int32_t threshold : {message.sIntrasearch(), message.sIntersearch(), message.sSearchRat()}) {
    findings_.expectBetween(Rule::UmtsRanges, threshold, -32, 20);
  }
  std::set<std::uint32_t> channels;
  for (const EutraFreqInfo& info : message.eutraPrioInfos()) {
    findings_.expect(Rule::CarriersAreDistinct, channels.insert(info.earfcn()).second);
    findings_.expectBetween(Rule::LteRanges, info.prio(), 0, 7);
  }
}

void UmtsWatch::seeMeasurement(const MetricRecord& record) {
  const auto message = decoded<KCellularWcdmaScellMeasurement>(record);
  connectedMode_ = message.connectedMode();
  if (const auto state = states_.at(record.time); state && !how_.soak) {
    findings_.expect(Rule::UmtsConnectedModeIsThatOfTheState, message.connectedMode() == isConnectedMode(*state));
    findings_.reach("UMTS measured in " + umtsStateName(*state));
  }
  for (const RxInfo& info : message.rxInfos()) {
    findings_.expectBetween(Rule::UmtsRanges, info.rssi(), -100, -25);  // 3GPP TS 25.133, 9.1.3
    findings_.expectBetween(Rule::UmtsRanges, info.snr(), -20, 30);
  }
}

void UmtsWatch::seeNeighbours(const MetricRecord& record) {
  const auto message = decoded<KCellularWcdmaNbrCellMeas>(record);
  std::set<CellName> listed;
  for (const UtraCellMeasResult& result : message.measUtraResults()) {
    const CellName cell{result.uarfcn(), result.psc()};
    findings_.expect(Rule::UmtsNeighbourIsNotTheServingCell, cell != serving_ && listed.insert(cell).second);
    findings_.expect(Rule::UmtsChannelInBand, isUarfcnInBand(result.uarfcn(), result.band()));
    findings_.expectBetween(Rule::UmtsRanges, result.psc(), 0, 511);
    findings_.expectBetween(Rule::UmtsRanges, result.rscp(), -5, 91);
    findings_.expectBetween(Rule::UmtsRanges, result.ecno(), 0, 49);
  }
  for (const GsmCellMeasResult& result : message.measGsmResults()) {
    findings_.expectBetween(Rule::GsmRanges, result.rxlev(), 0, 63);
    findings_.expectBetween(Rule::GsmRanges, result.bsic(), 0, 63);
  }
  for (const LteCellMeasResult& result : message.measLteResults()) {
    findings_.expectBetween(Rule::LteRanges, result.rsrp(), 0, 97);
    findings_.expectBetween(Rule::LteRanges, result.rsrq(), 0, 34);
    findings_.expectBetween(Rule::LteRanges, result.phyCellId(), 0, 503);
  }
}

}  // namespace probeview
