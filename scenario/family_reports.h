// SPDX-License-Identifier: Apache-2.0
//
// The report functions by family; reports.cpp puts them into its table.
#pragma once

#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/nas_messages.h"
#include "messages/umts_messages.h"
#include "scenario/phone.h"

namespace probeview::scenario {

// Each fills everything but the timestamp of an empty message.
void report(const Phone& phone, KCellularLteRrcState& message);
void report(const Phone& phone, KCellularLteCdrxConfig& message);
void report(const Phone& phone, KCellularLteScellInfo& message);
void report(const Phone& phone, KCellularLteSelReselCellInfo& message);
void report(const Phone& phone, KCellularLteTxPower& message);
void report(const Phone& phone, KCellularLteRsrpRsrqSinr& message);
void report(const Phone& phone, KCellularLteComponentCarrierInfo& message);
void report(const Phone& phone, KCellularLteCarrierAggregationStatus& message);
void report(const Phone& phone, KCellularLteNbrEutraCellMeas& message);
void report(const Phone& phone, KCellularLteNbrInterRatCellMeas& message);

void report(const Phone& phone, KCellularWcdmaRrcConnectionState& message);
void report(const Phone& phone, KCellularWcdmaRrcConfiguration& message);
void report(const Phone& phone, KCellularWcdmaCellInfo& message);
void report(const Phone& phone, KCellularWcdmaScellMeasurement& message);
void report(const Phone& phone, KCellularWcdmaTxPower& message);
void report(const Phone& phone, KCellularWcdmaSelReselCellInfo& message);
void report(const Phone& phone, KCellularWcdmaNbrCellMeas& message);

void report(const Phone& phone, KCellularGsmScellInfo& message);
void report(const Phone& phone, KCellularGsmIdleConfig& message);
void report(const Phone& phone, KCellularGsmIdleScellMeasurement& message);
void report(const Phone& phone, KCellularGsmCsRfMeasurement& message);
void report(const Phone& phone, KCellularGsmGrrEventMeasCr& message);
void report(const Phone& phone, KCellularGsmGprsConfig& message);

void report(const Phone& phone, KCellularMmCommonInfo& message);
void report(const Phone& phone, KCellularMmContext& message);
void report(const Phone& phone, KCellularGmmContext& message);
void report(const Phone& phone, KCellularEmmContext& message);
void report(const Phone& phone, KCellularActivatedBearerContexts& message);
void report(const Phone& phone, KCellularSimCardFiles& message);

// For fields that carry whole dBm or dB as they are.
inline std::int32_t wholeDecibels(double value) {
  return static_cast<std::int32_t>(value < 0 ? value - 0.5 : value + 0.5);
}

}  // namespace probeview::scenario
