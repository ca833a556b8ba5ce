// SPDX-License-Identifier: Apache-2.0
#include "service/sources/trace_translator.h"

#include <limits>

#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/metric_identifiers.h"
#include "messages/quantities.h"
#include "messages/runtime/data_writer.h"
#include "messages/umts_messages.h"

namespace probeview {

namespace {

using LteState = KCellularLteRrcState::State;
using UmtsState = KCellularWcdmaRrcConnectionState::State;
using GsmState = KCellularGsmScellInfo::State;

LteState::Value lteState(const TraceActivity& activity) {
  return activity.idle() ? LteState::KLTE_RRC_STATE_IDLE : LteState::KLTE_RRC_STATE_CONNECTED;
}

// A guess: the log does not tell the connected states apart. A call needs a dedicated channel, and the log's "D" is
// data on the move, which HSPA carries on one as well, but little data goes in CELL_FACH, and a pause in CELL_PCH or
// URA_PCH (3GPP TS 25.331, 7). docs/traces.md and radixd --help say so.
UmtsState::Value umtsState(const TraceActivity& activity) {
  return activity.idle() ? UmtsState::KWCDMA_RRC_CONN_STATE_IDLE : UmtsState::KWCDMA_RRC_CONN_STATE_CELL_DCH;
}

template <typename Message>
Message messageAt(const TraceRow& row) {
  Message message;
  // No drive was logged before 1970.
  if (row.time.count() >= 0) message.setTimestamp(static_cast<std::uint64_t>(row.time.count()));
  return message;
}

}  // namespace

void TraceTranslator::translate(const TraceRow& row, std::vector<TraceMetric>& metrics) {
  metrics.clear();
  metrics_ = &metrics;
  // A log whose clock went back does not tell how long anything lasted meanwhile.
  if (time_ && row.time < *time_) lteStateSince_.reset();
  time_ = row.time;
  if (!row.technology) return loseSight();
  if (technology_ && *technology_ != *row.technology) leave(row);
  technology_ = row.technology;
  switch (*row.technology) {
    case TraceTechnology::Lte:
      return translateLte(row);
    case TraceTechnology::Umts:
      return translateUmts(row);
    case TraceTechnology::Gsm:
      return translateGsm(row);
  }
}

void TraceTranslator::startOver() {
  time_.reset();
  cell_ = {};
  lteState_.reset();
  lteStateSince_.reset();
  umtsState_.reset();
}

// What the phone does while no technology is known, nobody knows; one that had been left before stays left.
void TraceTranslator::loseSight() {
  cell_ = {};
  if (technology_ == TraceTechnology::Lte) lteState_.reset();
  if (technology_ == TraceTechnology::Umts) umtsState_.reset();
}

// The row is the first of another technology.
void TraceTranslator::leave(const TraceRow& row) {
  cell_ = {};
  switch (*technology_) {
    case TraceTechnology::Lte:
      if (told_.lte) tellLteState(row, LteState::KLTE_RRC_STATE_NULL);
      return;
    case TraceTechnology::Umts:
      if (told_.umts) tellUmtsState(row, UmtsState::KWCDMA_RRC_CONN_STATE_INACTIVE);
      return;
    case TraceTechnology::Gsm:
      if (!told_.gsm) return;
      auto message = messageAt<KCellularGsmScellInfo>(row);
      message.setState(GsmState::NON_DEDICATED_STATE);
      add(K_GSM_SCELL_INFO, message);
  }
}

// A row that does not say which cell serves, or whether a channel is dedicated, says nothing against what was told.
bool TraceTranslator::isNews(const Cell& cell) {
  const auto differs = [](const auto& now, const auto& told) { return now && now != told; };
  if (!differs(cell.identity, cell_.identity) && !differs(cell.area, cell_.area) &&
      !differs(cell.dedicated, cell_.dedicated)) {
    return false;
  }
  cell_ = cell;
  return true;
}

void TraceTranslator::tellLteState(const TraceRow& row, std::int32_t state) {
  auto message = messageAt<KCellularLteRrcState>(row);
  message.setState(state);
  if (lteState_) {
    message.setPrevState(*lteState_);
    if (lteStateSince_) {
      const std::chrono::milliseconds::rep duration = (row.time - *lteStateSince_).count();
      if (duration <= std::numeric_limits<std::uint32_t>::max()) {
        message.setPrevStateDurMs(static_cast<std::uint32_t>(duration));
      }
    }
  }
  lteState_ = state;
  lteStateSince_ = row.time;
  told_.lte = true;
  add(K_LTE_RRC_STATE, message);
}

void TraceTranslator::tellUmtsState(const TraceRow& row, std::int32_t state) {
  auto message = messageAt<KCellularWcdmaRrcConnectionState>(row);
  message.setState(state);
  umtsState_ = state;
  told_.umts = true;
  add(K_UMTS_RRC_STATE, message);
}

void TraceTranslator::translateLte(const TraceRow& row) {
  const Cell cell{.identity = row.cellIdentity, .area = row.areaCode, .dedicated = {}};
  if (isNews(cell)) {
    auto message = messageAt<KCellularLteScellInfo>(row);
    if (cell.identity) message.setCellId(*cell.identity);
    if (cell.area) message.setTrackingAreaCode(*cell.area);
    add(K_LTE_SCELL_INFO, message);
  }
  if (!row.activity) {
    lteState_.reset();
  } else if (const std::int32_t state = lteState(*row.activity); state != lteState_) {
    tellLteState(row, state);
  }
  if (row.level || row.quality || row.signalToNoise) {
    auto message = messageAt<KCellularLteRsrpRsrqSinr>(row);
    RsrpRsrqSinr& sample = message.addInstValues();
    if (row.level) sample.setRsrp0(quantities::lteSampleRsrp.toSigned(*row.level));
    if (row.quality) sample.setRsrq0(quantities::lteSampleRsrq.toSigned(*row.quality));
    if (row.signalToNoise) sample.setSinr0(quantities::lteSampleSinr.toSigned(*row.signalToNoise));
    add(K_LTE_RSRP_RSRQ_SINR, message);
  }
  if (row.neighbourLevel || row.neighbourQuality) {
    auto message = messageAt<KCellularLteNbrEutraCellMeas>(row);
    EgwErrcNbrEutraMeas& neighbour = message.addMeasNbrEutra();
    if (row.neighbourLevel) neighbour.setNbrRsrp(quantities::lteRsrp.toSigned(*row.neighbourLevel));
    if (row.neighbourQuality) neighbour.setNbrRsrq(quantities::lteRsrq.toSigned(*row.neighbourQuality));
    add(K_LTE_INTRARAT_MEAS, message);
  }
}

void TraceTranslator::translateUmts(const TraceRow& row) {
  const Cell cell{.identity = row.cellIdentity, .area = row.areaCode, .dedicated = {}};
  if (isNews(cell)) {
    auto message = messageAt<KCellularWcdmaCellInfo>(row);
    if (cell.area) message.setLac(*cell.area);
    if (cell.identity) message.setCellId(*cell.identity);
    add(K_UMTS_SCELL_INFO, message);
  }
  if (!row.activity) {
    umtsState_.reset();
  } else if (const std::int32_t state = umtsState(*row.activity); state != umtsState_) {
    tellUmtsState(row, state);
  }
  if (row.neighbourLevel || row.neighbourQuality) {
    auto message = messageAt<KCellularWcdmaNbrCellMeas>(row);
    UtraCellMeasResult& neighbour = message.addMeasUtraResult();
    if (row.neighbourQuality) neighbour.setEcno(quantities::utraEcNo.toUnsigned(*row.neighbourQuality));
    if (row.neighbourLevel) neighbour.setRscp(quantities::utraRscp.toSigned(*row.neighbourLevel));
    add(K_UMTS_NCELL_MEAS, message);
  }
}

void TraceTranslator::translateGsm(const TraceRow& row) {
  // Only a call has a dedicated channel; packet data on GPRS and EDGE has none (3GPP TS 44.018, 3.1).
  std::optional<bool> dedicated;
  if (row.activity) dedicated = row.activity->voice;
  const Cell cell{.identity = row.cellIdentity, .area = row.areaCode, .dedicated = dedicated};
  if (isNews(cell)) {
    auto message = messageAt<KCellularGsmScellInfo>(row);
    if (cell.area) message.setLac(*cell.area);
    if (cell.identity) message.setCellId(*cell.identity);
    if (dedicated) message.setState(*dedicated ? GsmState::DEDICATED_STATE : GsmState::NON_DEDICATED_STATE);
    if (dedicated) told_.gsm = true;
    add(K_GSM_SCELL_INFO, message);
  }
  if (dedicated.value_or(false)) {
    if (row.level || row.quality) {
      auto message = messageAt<KCellularGsmCsRfMeasurement>(row);
      if (row.level) message.setCsRxlevSub(quantities::gsmRxLev.toUnsigned(*row.level));
      if (row.quality) message.setCsRxqualSub(quantities::gsmRxQual.toUnsigned(*row.quality));
      add(K_GSM_CS_RF_MEAS, message);
    }
  } else if (row.level) {
    auto message = messageAt<KCellularGsmIdleScellMeasurement>(row);
    message.setIdleRxlevDBm(quantities::gsmIdleLevel.toSigned(*row.level));
    add(K_GSM_IDLE_SCELL_MEAS, message);
  }
  if (row.neighbourLevel) {
    auto message = messageAt<KCellularGsmGrrEventMeasCr>(row);
    message.addGsmNcellMeas().setRxlev(quantities::gsmRxLev.toUnsigned(*row.neighbourLevel));
    add(K_GSM_NCELL_MEAS, message);
  }
}

void TraceTranslator::add(std::int64_t metricId, const PBCodable& message) {
  PBDataWriter writer;
  message.writeTo(writer);
  metrics_->push_back({metricId, writer.takeBytes()});
}

}  // namespace probeview
