// SPDX-License-Identifier: Apache-2.0
#include "messages/gsm_messages.h"
#include "messages/nas_messages.h"
#include "tests/scenario/drive.h"
#include "tests/scenario/watches.h"

namespace probeview {
namespace {

char technologyOf(std::int64_t metricId) {
  switch (metricId) {
    case K_LTE_RRC_STATE:
    case K_LTE_CDRX_CONFIG:
    case K_LTE_SCELL_INFO:
    case K_LTE_SEL_RESEL_INFO:
    case K_LTE_COMPCARR_INFO:
    case K_LTE_CA_STATUS:
    case K_LTE_RSRP_RSRQ_SINR:
    case K_LTE_TX_POWER:
    case K_LTE_INTRARAT_MEAS:
    case K_LTE_INTERRAT_MEAS:
      return 'L';
    case K_UMTS_RRC_STATE:
    case K_UMTS_RRC_CONFIG:
    case K_UMTS_SCELL_INFO:
    case K_UMTS_SEL_RESEL_INFO:
    case K_UMTS_SCELL_MEAS:
    case K_UMTS_TX_POWER:
    case K_UMTS_NCELL_MEAS:
      return 'U';
    case K_GSM_SCELL_INFO:
    case K_GSM_IDLE_CONFIG:
    case K_GSM_GPRS_CONFIG:
    case K_GSM_IDLE_SCELL_MEAS:
    case K_GSM_CS_RF_MEAS:
    case K_GSM_NCELL_MEAS:
      return 'G';
    default:
      return ' ';
  }
}

// The first field of every message, a varint with the number 1.
std::optional<std::uint64_t> timestampOf(const MetricRecord& record) {
  if (record.payload.empty() || record.payload[0] != 0x08) return std::nullopt;
  std::uint64_t value = 0;
  for (std::size_t i = 1; i < record.payload.size() && i <= 10; ++i) {
    value |= std::uint64_t{record.payload[i] & 0x7FU} << (7 * (i - 1));
    if ((record.payload[i] & 0x80U) == 0) return value;
  }
  return std::nullopt;
}

}  // namespace

void StateHistory::becomes(std::int32_t state, Moment time) {
  if (states_.empty() || state != states_.back().first) states_.emplace_back(state, time);
}

std::optional<std::int32_t> StateHistory::now() const {
  if (states_.empty()) return std::nullopt;
  return states_.back().first;
}

std::optional<std::int32_t> StateHistory::at(Moment time) const {
  for (auto state = states_.rbegin(); state != states_.rend(); ++state) {
    if (state->second <= time) return state->first;
  }
  return std::nullopt;
}

void PhoneWatch::see(const MetricRecord& record) {
  if (!start_) start_ = now_ = record.time;
  if (record.time > now_) {
    if (!how_.soak) {
      lte_.settle(now_);
      umts_.settle(now_);
      gsm_.settle(now_);
    }
    now_ = record.time;
  }
  findings_.at(record.time - *start_);
  findings_.expect(Rule::TimestampIsTheRecords, timestampOf(record) == static_cast<std::uint64_t>(record.time.count()));
  Moment& last = last_[record.metricId];
  findings_.expect(Rule::TimeOfAMetricNeverGoesBack, record.time >= last);
  last = record.time;
  const char technology = technologyOf(record.metricId);
  switch (technology) {
    case 'L':
      lte_.see(record);
      break;
    case 'U':
      umts_.see(record);
      break;
    case 'G':
      gsm_.see(record);
      break;
    default:
      mobility_.see(record);
      return;
  }
  if (!how_.soak) watchTechnology(record, technology);
}

void PhoneWatch::watchTechnology(const MetricRecord& record, char technology) {
  const bool arrives = (record.metricId == K_LTE_RRC_STATE && lte_.serves()) ||
                       (record.metricId == K_UMTS_RRC_STATE && umts_.serves()) || record.metricId == K_GSM_SCELL_INFO;
  if (arrives && technology != technology_) arrive(technology, record.time);
  if (technology == technology_) return;
  findings_.expect(Rule::WhatIsLeftIsSilent, record.time <= leftAt_[technology]);
}

void PhoneWatch::arrive(char technology, Moment time) {
  bool over = true;
  Moment since = time;
  switch (technology_) {
    case 'L':
      over = lte_.isOver();
      since = lte_.overSince();
      break;
    case 'U':
      over = umts_.isOver();
      since = umts_.overSince();
      break;
    case 'G':
      over = gsm_.isOver();
      since = gsm_.overSince();
      break;
    default:
      break;
  }
  if (technology_ != ' ') {
    findings_.expect(Rule::LeavingIsToldBeforeTheNextTechnology, over);
    // Between two technologies there is nothing, but when service was lost.
    if (!mobility_.lostService()) findings_.expect(Rule::LeavingIsToldAtTheMomentOfArrival, since == time);
    findings_.reach(std::string{technology_, '>', technology} + (mobility_.lostService() ? " after no service" : ""));
    leftAt_[technology_] = since;
  }
  technology_ = technology;
}

}  // namespace probeview
