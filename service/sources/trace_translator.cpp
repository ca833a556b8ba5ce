// SPDX-License-Identifier: Apache-2.0
#include "service/sources/trace_translator.h"

#include <limits>

#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/metric_identifiers.h"
#include "messages/runtime/data_writer.h"
#include "messages/umts_messages.h"
#include "service/sources/wire_units.h"

namespace probeview {

namespace {

using LteState = KCellularLteRrcState::State;
using UmtsState = KCellularWcdmaRrcConnectionState::State;
using GsmState = KCellularGsmScellInfo::State;

LteState::Value lteState(const TraceActivity& activity) {
  return activity.idle() ? LteState::KLTE_RRC_STATE_IDLE : LteState::KLTE_RRC_STATE_CONNECTED;
}

// The log does not tell the connected states apart. A call needs a dedicated channel, and the log's "D" is data on the
// move, which HSPA carries on one as well.
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
  if (row.technology != technology_) enter(row.technology);
  if (!row.technology) return;
  switch (*row.technology) {
    case TraceTechnology::Lte:
      return translateLte(row);
    case TraceTechnology::Umts:
      return translateUmts(row);
    case TraceTechnology::Gsm:
      return translateGsm(row);
  }
}

// What the phone did on a technology before it left it says nothing of what it finds when it comes back.
void TraceTranslator::enter(std::optional<TraceTechnology> technology) {
  technology_ = technology;
  cell_.reset();
  state_.reset();
}

bool TraceTranslator::cellChanged(const Cell& cell) {
  if (cell == Cell{} || cell == cell_) return false;
  cell_ = cell;
  return true;
}

void TraceTranslator::translateLte(const TraceRow& row) {
  const Cell cell{.identity = row.cellIdentity, .area = row.areaCode, .dedicated = {}};
  if (cellChanged(cell)) {
    auto message = messageAt<KCellularLteScellInfo>(row);
    if (cell.identity) message.setCellId(*cell.identity);
    if (cell.area) message.setTrackingAreaCode(*cell.area);
    add(K_LTE_SCELL_INFO, message);
  }
  if (!row.activity) {
    state_.reset();
  } else if (const std::int32_t state = lteState(*row.activity); state != state_) {
    auto message = messageAt<KCellularLteRrcState>(row);
    message.setState(state);
    if (state_) {
      message.setPrevState(*state_);
      // A log whose clock went back does not tell how long.
      const std::chrono::milliseconds::rep duration = (row.time - stateSince_).count();
      if (duration >= 0 && duration <= std::numeric_limits<std::uint32_t>::max()) {
        message.setPrevStateDurMs(static_cast<std::uint32_t>(duration));
      }
    }
    state_ = state;
    stateSince_ = row.time;
    add(K_LTE_RRC_STATE, message);
  }
  if (row.level || row.quality || row.signalToNoise) {
    auto message = messageAt<KCellularLteRsrpRsrqSinr>(row);
    RsrpRsrqSinr& sample = message.addInstValues();
    if (row.level) sample.setRsrp0(units::lteSampleRsrp.toSigned(*row.level));
    if (row.quality) sample.setRsrq0(units::lteSampleRsrq.toSigned(*row.quality));
    if (row.signalToNoise) sample.setSinr0(units::lteSampleSinr.toSigned(*row.signalToNoise));
    add(K_LTE_RSRP_RSRQ_SINR, message);
  }
  if (row.neighbourLevel || row.neighbourQuality) {
    auto message = messageAt<KCellularLteNbrEutraCellMeas>(row);
    EgwErrcNbrEutraMeas& neighbour = message.addMeasNbrEutra();
    if (row.neighbourLevel) neighbour.setNbrRsrp(units::lteRsrp.toSigned(*row.neighbourLevel));
    if (row.neighbourQuality) neighbour.setNbrRsrq(units::lteRsrq.toSigned(*row.neighbourQuality));
    add(K_LTE_INTRARAT_MEAS, message);
  }
}

void TraceTranslator::translateUmts(const TraceRow& row) {
  const Cell cell{.identity = row.cellIdentity, .area = row.areaCode, .dedicated = {}};
  if (cellChanged(cell)) {
    auto message = messageAt<KCellularWcdmaCellInfo>(row);
    if (cell.area) message.setLac(*cell.area);
    if (cell.identity) message.setCellId(*cell.identity);
    add(K_UMTS_SCELL_INFO, message);
  }
  if (!row.activity) {
    state_.reset();
  } else if (const std::int32_t state = umtsState(*row.activity); state != state_) {
    state_ = state;
    auto message = messageAt<KCellularWcdmaRrcConnectionState>(row);
    message.setState(state);
    add(K_UMTS_RRC_STATE, message);
  }
  if (row.neighbourLevel || row.neighbourQuality) {
    auto message = messageAt<KCellularWcdmaNbrCellMeas>(row);
    UtraCellMeasResult& neighbour = message.addMeasUtraResult();
    if (row.neighbourQuality) neighbour.setEcno(units::utraEcNo.toUnsigned(*row.neighbourQuality));
    if (row.neighbourLevel) neighbour.setRscp(units::utraRscp.toSigned(*row.neighbourLevel));
    add(K_UMTS_NCELL_MEAS, message);
  }
}

void TraceTranslator::translateGsm(const TraceRow& row) {
  // Only a call has a dedicated channel; packet data on GPRS and EDGE has none (3GPP TS 44.018, 3.1).
  std::optional<bool> dedicated;
  if (row.activity) dedicated = row.activity->voice;
  const Cell cell{.identity = row.cellIdentity, .area = row.areaCode, .dedicated = dedicated};
  if (cellChanged(cell)) {
    auto message = messageAt<KCellularGsmScellInfo>(row);
    if (cell.area) message.setLac(*cell.area);
    if (cell.identity) message.setCellId(*cell.identity);
    if (dedicated) message.setState(*dedicated ? GsmState::DEDICATED_STATE : GsmState::NON_DEDICATED_STATE);
    add(K_GSM_SCELL_INFO, message);
  }
  if (dedicated.value_or(false)) {
    if (row.level || row.quality) {
      auto message = messageAt<KCellularGsmCsRfMeasurement>(row);
      if (row.level) message.setCsRxlevSub(units::gsmRxLev.toUnsigned(*row.level));
      if (row.quality) message.setCsRxqualSub(units::gsmRxQual.toUnsigned(*row.quality));
      add(K_GSM_CS_RF_MEAS, message);
    }
  } else if (row.level) {
    auto message = messageAt<KCellularGsmIdleScellMeasurement>(row);
    message.setIdleRxlevDBm(units::gsmIdleLevel.toSigned(*row.level));
    add(K_GSM_IDLE_SCELL_MEAS, message);
  }
  if (row.neighbourLevel) {
    auto message = messageAt<KCellularGsmGrrEventMeasCr>(row);
    message.addGsmNcellMeas().setRxlev(units::gsmRxLev.toUnsigned(*row.neighbourLevel));
    add(K_GSM_NCELL_MEAS, message);
  }
}

void TraceTranslator::add(std::int64_t metricId, const PBCodable& message) {
  PBDataWriter writer;
  message.writeTo(writer);
  metrics_->push_back({metricId, writer.takeBytes()});
}

}  // namespace probeview
