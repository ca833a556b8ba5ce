// SPDX-License-Identifier: Apache-2.0
#include <algorithm>
#include <utility>

#include "messages/lte_messages.h"
#include "tests/scenario/drive.h"
#include "tests/scenario/watches.h"

namespace probeview {
namespace {

using LteState = KCellularLteRrcState::State;
using SecondaryState = SecondaryComponentCarrier::State;

constexpr std::uint32_t uplinkOffset = 18000;

std::string lteStateName(std::int32_t state) {
  constexpr std::array names{"NULL", "IDLE", "ATTEMPTING", "CONNECTED", "ENDING", "GOING_OUTBOUND", "COMING_INBOUND"};
  return names.at(static_cast<std::size_t>(state));
}

// 3GPP TS 36.101, table 5.7.3-1: the bands that the made-up networks use.
bool isEarfcnInBand(std::uint32_t earfcn, std::uint32_t band) {
  switch (band) {
    case 3:
      return earfcn >= 1200 && earfcn <= 1949;
    case 7:
      return earfcn >= 2750 && earfcn <= 3449;
    case 20:
      return earfcn >= 6150 && earfcn <= 6449;
    default:
      return false;
  }
}

}  // namespace

bool LteWatch::serves() const { return states_.now() && *states_.now() != LteState::KLTE_RRC_STATE_NULL; }
bool LteWatch::isOver() const { return states_.now() == LteState::KLTE_RRC_STATE_NULL; }

void LteWatch::see(const MetricRecord& record) {
  switch (record.metricId) {
    case K_LTE_RRC_STATE:
      return seeState(record);
    case K_LTE_CDRX_CONFIG:
      return seeDrx(record);
    case K_LTE_SCELL_INFO:
      return seeCell(record);
    case K_LTE_SEL_RESEL_INFO:
      return seeSelection(record);
    case K_LTE_COMPCARR_INFO:
      return seeCarriers(record);
    case K_LTE_CA_STATUS:
      return seeAggregation(record);
    case K_LTE_RSRP_RSRQ_SINR:
      return seeSamples(record);
    case K_LTE_TX_POWER:
      return seePower(record);
    case K_LTE_INTRARAT_MEAS:
      return seeNeighbours(record);
    case K_LTE_INTERRAT_MEAS:
      return seeOtherNeighbours(record);
    default:
      return;
  }
}

void LteWatch::settle(Moment time) {
  const bool connected = states_.now() == LteState::KLTE_RRC_STATE_CONNECTED;
  if (drxState_) findings_.expect(Rule::DrxNamesTheStateThatIs, drxState_ == states_.now());
  if (cellChangedAt_ == time) findings_.expect(Rule::LteCellChangesAtOneMoment, together_.allAt(time));
  if (!serving_ || carriers_.empty()) return;
  findings_.expect(Rule::CarriersAreThoseOfTheServingCell, carriers_.front() == serving_->first);
  findings_.expect(Rule::SecondaryOnlyWhileConnected, connected || carriers_.size() == 1);
  if (!how_.everyChange) return;
  std::vector<std::uint32_t> expected{serving_->first};
  for (const Secondary& secondary : secondaries_) {
    findings_.expect(Rule::SecondaryNeverNamesThePrimary, secondary.cell.first != serving_->first);
    if (secondary.state == SecondaryState::SCC_STATE_DECONFIGURED) continue;
    findings_.expect(Rule::SecondaryOnlyWhileConnected, connected);
    expected.push_back(secondary.cell.first);
  }
  findings_.expect(Rule::CarriersAreDistinct, carriers_ == expected);
}

void LteWatch::seeState(const MetricRecord& record) {
  const auto message = decoded<KCellularLteRrcState>(record);
  const auto state = message.state();
  const auto before = states_.now();
  if (!how_.soak && before && state != before) {
    findings_.expect(Rule::LtePreviousStateIsTheOneBefore, message.prevState() == before);
    const bool exact = Moment(message.prevStateDurMs()) == record.time - states_.since();
    findings_.expect(Rule::LteDurationIsExact, exact);
    if (before == LteState::KLTE_RRC_STATE_NULL) findings_.expect(Rule::LteComesBackFromNull, exact);
    findings_.reach("LTE " + lteStateName(*before) + " > " + lteStateName(state));
  }
  if (message.cause() == KCellularLteRrcState::Cause::KLTE_RRC_CAUSE_NO_SERVICE) findings_.reach("LTE without service");
  if (state == LteState::KLTE_RRC_STATE_CONNECTED && before != state) configured_.clear();
  states_.becomes(state, record.time);
}

void LteWatch::seeDrx(const MetricRecord& record) {
  const auto message = decoded<KCellularLteCdrxConfig>(record);
  const bool configured = message.cdrxConfigStatus() != 0;
  drxState_ = message.rrcState();
  findings_.expectBetween(Rule::LteRanges, message.cdrxConfigStatus(), 0, 1);
  findings_.expect(Rule::DrxIsConfiguredInConnectedAlone,
                   configured == (message.rrcState() == LteState::KLTE_RRC_STATE_CONNECTED));
  if (!configured) {
    findings_.expect(Rule::LteRanges, !message.hasLongDrxCycleMs() && !message.hasShortDrxCycleMs());
    return;
  }
  // 3GPP TS 36.331, 6.3.2, DRX-Config: the long cycle is a multiple of the short one.
  findings_.expectBetween(Rule::LteRanges, message.onDurationMs(), 1, 200);
  findings_.expectBetween(Rule::LteRanges, message.longDrxCycleMs(), 10, 2560);
  findings_.expectBetween(Rule::LteRanges, message.shortDrxCycleMs(), 2, 640);
  findings_.expectBetween(Rule::LteRanges, message.drxShortCycleNum(), 1, 16);
  findings_.expectBetween(Rule::LteRanges, message.transmissionMode(), 1, 10);
  findings_.expect(Rule::LteRanges, message.longDrxCycleMs() % message.shortDrxCycleMs() == 0);
}

void LteWatch::seeCell(const MetricRecord& record) {
  const auto message = decoded<KCellularLteScellInfo>(record);
  const CellName cell{message.dlFreq(), message.phyCellId()};
  if (serving_ && cell != serving_) {
    if (!how_.soak) findings_.reach("LTE cell change in " + lteStateName(*states_.now()));
  }
  serving_ = cell;
  cellChangedAt_ = record.time;
  together_.told(0, record.time);
  findings_.expect(Rule::LteChannelInBand, isEarfcnInBand(message.dlFreq(), message.freqBandInd()));
  findings_.expect(Rule::LteChannelInBand, message.ulFreq() == message.dlFreq() + uplinkOffset);
  findings_.expectBetween(Rule::LteRanges, message.phyCellId(), 0, 503);
  findings_.expectBetween(Rule::LteRanges, message.cellId(), 0, 0x0FFFFFFF);
  findings_.expectBetween(Rule::LteRanges, message.trackingAreaCode(), 1, 0xFFFD);
  findings_.expectBetween(Rule::LteRanges, message.dlBw(), 4, 80);  // quarter MHz
}

void LteWatch::seeSelection(const MetricRecord& record) {
  const auto message = decoded<KCellularLteSelReselCellInfo>(record);
  together_.told(1, record.time);
  findings_.expectBetween(Rule::LteRanges, message.qRxLevMin(), -70, -22);
  findings_.expectBetween(Rule::LteRanges, message.qQualMin(), -34, -3);
  findings_.expectBetween(Rule::LteRanges, message.priorityOperatingFreq(), 0, 7);
  for (const NbrEutra& frequency : message.nbrEutras()) {
    findings_.expect(Rule::LteChannelInBand, isEarfcnInBand(frequency.earfcn(), frequency.band()));
    findings_.expect(Rule::LteNeighbourIsNotTheServingCell, serving_ && frequency.earfcn() != serving_->first);
    findings_.expectBetween(Rule::LteRanges, frequency.dlBw(), 0, 5);
    findings_.expectBetween(Rule::LteRanges, frequency.priority(), 0, 7);
  }
}

void LteWatch::seeCarriers(const MetricRecord& record) {
  const auto message = decoded<KCellularLteComponentCarrierInfo>(record);
  together_.told(2, record.time);
  carriers_ = {message.pccEarfcn()};
  if (message.hasScc0Earfcn()) carriers_.push_back(message.scc0Earfcn());
  if (message.hasScc1Earfcn()) carriers_.push_back(message.scc1Earfcn());
  findings_.expect(Rule::CarriersAreDistinct,
                   std::set<std::uint32_t>(carriers_.begin(), carriers_.end()).size() == carriers_.size());
  findings_.expectBetween(Rule::LteRanges, message.pccBandwidth(), 0, 5);
}

void LteWatch::seeAggregation(const MetricRecord& record) {
  const auto message = decoded<KCellularLteCarrierAggregationStatus>(record);
  const std::vector<Secondary> before = std::exchange(secondaries_, {});
  std::set<std::uint32_t> channels, indices;
  for (const SecondaryComponentCarrier& carrier : message.sccLists()) {
    const CellName cell{carrier.dlEarfcn(), carrier.pci()};
    secondaries_.push_back({cell, carrier.state(), carrier.index()});
    for (const Secondary& earlier : before) {
      // What has been deconfigured may be configured anew as another one.
      const bool isNew = earlier.state == SecondaryState::SCC_STATE_DECONFIGURED && carrier.state() != earlier.state;
      if (!how_.everyChange || earlier.cell != cell || isNew) continue;
      findings_.expect(Rule::SecondaryKeepsItsIndex, carrier.index() == earlier.index);
    }
    findings_.expect(Rule::CarriersAreDistinct,
                     channels.insert(cell.first).second && indices.insert(carrier.index()).second);
    if (!how_.soak) {
      findings_.expect(Rule::SecondaryNeverNamesThePrimary, serving_ && cell.first != serving_->first);
    }
    findings_.expect(Rule::LteChannelInBand, isEarfcnInBand(carrier.dlEarfcn(), carrier.dlRfBand()));
    findings_.expectBetween(Rule::LteRanges, carrier.pci(), 0, 503);
    constexpr std::array states{"deconfigured", "deactivated", "activated"};
    if (!how_.soak)
      findings_.reach(std::string("secondary ") + states.at(static_cast<std::size_t>(carrier.state())) + " in " +
                      lteStateName(*states_.now()));
    if (carrier.state() == SecondaryState::SCC_STATE_DECONFIGURED) {
      findings_.expect(Rule::DeconfiguredHasNoMeasurements,
                       !carrier.hasRsrp() && !carrier.hasRsrq() && !carrier.hasSnr() && !carrier.hasRssi());
      if (how_.everyChange) {
        findings_.expect(Rule::DeconfiguredWasConfiguredInThisConnection, configured_.contains(cell));
      }
      continue;
    }
    configured_.insert(cell);
    if (!how_.soak) {
      findings_.expect(Rule::SecondaryOnlyWhileConnected, states_.now() == LteState::KLTE_RRC_STATE_CONNECTED);
    }
    findings_.expectBetween(Rule::LteRanges, carrier.rsrp(), -14000, -4400);  // hundredths
    findings_.expectBetween(Rule::LteRanges, carrier.rsrq(), -1950, -300);
    findings_.expectBetween(Rule::LteRanges, carrier.snr(), -20, 30);
    findings_.expectBetween(Rule::LteRanges, carrier.rssi(), carrier.rsrp(), 0);
  }
}

void LteWatch::seeSamples(const MetricRecord& record) {
  const auto message = decoded<KCellularLteRsrpRsrqSinr>(record);
  const auto look = [&](const RsrpRsrqSinr& sample) {
    findings_.expectBetween(Rule::LteRanges, sample.phyCellId(), 0, 503);
    for (const std::int32_t rsrp : {sample.rsrp0(), sample.rsrp1()}) {
      findings_.expectBetween(Rule::LteRanges, rsrp, -140, -44);
    }
    for (const std::int32_t rsrq : {sample.rsrq0(), sample.rsrq1()}) {
      findings_.expectBetween(Rule::LteRanges, rsrq, -20, -3);
    }
    for (const std::int32_t sinr : {sample.sinr0(), sample.sinr1()}) {
      findings_.expectBetween(Rule::LteRanges, sinr, -40, 60);  // half dB
    }
    if (!how_.soak) findings_.expect(Rule::CarriersAreThoseOfTheServingCell, sample.phyCellId() == serving_->second);
  };
  for (const RsrpRsrqSinr& sample : message.instValues()) look(sample);
  if (message.hasAvgValues()) look(*message.avgValues());
  findings_.expect(Rule::LteDurationIsExact, message.durationMs() == message.numSamples() * message.samplePeriodMs() &&
                                                 message.numSamples() == message.instValuesCount());
}

void LteWatch::seePower(const MetricRecord& record) {
  const auto message = decoded<KCellularLteTxPower>(record);
  if (!how_.soak) {
    const auto state = states_.at(record.time);
    findings_.expect(Rule::LtePowerWhileSending, state == LteState::KLTE_RRC_STATE_CONNECTED ||
                                                     state == LteState::KLTE_RRC_STATE_ATMPT_OUTBND_MOBILITY);
  }
  for (const TxPowerInfo& power : message.txPowerInfos()) {
    if (power.hasPucchTxPower()) findings_.expectBetween(Rule::LteRanges, power.pucchTxPower(), -40, 23);
    if (power.hasPuschTxPower()) findings_.expectBetween(Rule::LteRanges, power.puschTxPower(), -40, 23);
    findings_.expectBetween(Rule::LteRanges, power.subframeIndex(), 0, 9);
  }
}

void LteWatch::seeNeighbours(const MetricRecord& record) {
  const auto message = decoded<KCellularLteNbrEutraCellMeas>(record);
  std::set<CellName> listed;
  for (const EgwErrcNbrEutraMeas& neighbour : message.measNbrEutras()) {
    const CellName cell{neighbour.nbrEarfcn(), neighbour.nbrPhysCellId()};
    findings_.expect(Rule::LteNeighbourIsNotTheServingCell, cell != serving_ && listed.insert(cell).second);
    findings_.expect(Rule::LteChannelInBand, isEarfcnInBand(neighbour.nbrEarfcn(), neighbour.freqBandInd()));
    findings_.expectBetween(Rule::LteRanges, neighbour.nbrPhysCellId(), 0, 503);
    findings_.expectBetween(Rule::LteRanges, neighbour.nbrRsrp(), 0, 97);
    findings_.expectBetween(Rule::LteRanges, neighbour.nbrRsrq(), 0, 34);
  }
}

void LteWatch::seeOtherNeighbours(const MetricRecord& record) {
  const auto message = decoded<KCellularLteNbrInterRatCellMeas>(record);
  for (const EgwErrcNbrUtraMeas& neighbour : message.measNbrUtras()) {
    findings_.expectBetween(Rule::UmtsRanges, neighbour.psc(), 0, 511);
    findings_.expectBetween(Rule::UmtsRanges, neighbour.rscp(), -5, 91);
    findings_.expectBetween(Rule::UmtsRanges, neighbour.ecno(), 0, 49);
  }
  for (const EgwErrcNbrGeranMeas& neighbour : message.measNbrGerans()) {
    findings_.expectBetween(Rule::GsmRanges, neighbour.bsic(), 0, 63);
    findings_.expectBetween(Rule::GsmRanges, neighbour.rxlev(), 0, 63);
  }
}

}  // namespace probeview
