// SPDX-License-Identifier: Apache-2.0
#include "messages/metric_identifiers.h"

#include <array>

#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/nas_messages.h"
#include "messages/umts_messages.h"

namespace probeview {

namespace {

// The radio link failure and the serving cell measurement of LTE are known but left alone on purpose.
constexpr std::array<MetricIdentifier, 31> metrics = {{
    {K_LTE_CDRX_CONFIG, "K_LTE_CDRX_CONFIG", &KCellularLteCdrxConfig::pbDescriptor, true},
    {K_LTE_RRC_STATE, "K_LTE_RRC_STATE", &KCellularLteRrcState::pbDescriptor, true},
    {K_LTE_SCELL_INFO, "K_LTE_SCELL_INFO", &KCellularLteScellInfo::pbDescriptor, true},
    {K_LTE_RLF, "K_LTE_RLF", nullptr, false},
    {K_LTE_SEL_RESEL_INFO, "K_LTE_SEL_RESEL_INFO", &KCellularLteSelReselCellInfo::pbDescriptor, true},
    {K_LTE_SCELL_MEAS, "K_LTE_SCELL_MEAS", nullptr, false},
    {K_LTE_TX_POWER, "K_LTE_TX_POWER", &KCellularLteTxPower::pbDescriptor, true},
    {K_LTE_RSRP_RSRQ_SINR, "K_LTE_RSRP_RSRQ_SINR", &KCellularLteRsrpRsrqSinr::pbDescriptor, true},
    {K_LTE_COMPCARR_INFO, "K_LTE_COMPCARR_INFO", &KCellularLteComponentCarrierInfo::pbDescriptor, true},
    {K_LTE_CA_STATUS, "K_LTE_CA_STATUS", &KCellularLteCarrierAggregationStatus::pbDescriptor, true},
    {K_LTE_INTERRAT_MEAS, "K_LTE_INTERRAT_MEAS", &KCellularLteNbrInterRatCellMeas::pbDescriptor, true},
    {K_LTE_INTRARAT_MEAS, "K_LTE_INTRARAT_MEAS", &KCellularLteNbrEutraCellMeas::pbDescriptor, true},
    {K_CELLULAR_MM_INFO, "K_CELLULAR_MM_INFO", &KCellularMmCommonInfo::pbDescriptor, true},
    {K_CELLULAR_ACTIVE_BEARER, "K_CELLULAR_ACTIVE_BEARER", &KCellularActivatedBearerContexts::pbDescriptor, true},
    {K_LTE_EMM_CTXT, "K_LTE_EMM_CTXT", &KCellularEmmContext::pbDescriptor, true},
    {K_CELLULAR_MM_CTXT, "K_CELLULAR_MM_CTXT", &KCellularMmContext::pbDescriptor, true},
    {K_CELLULAR_GMM_CTXT, "K_CELLULAR_GMM_CTXT", &KCellularGmmContext::pbDescriptor, true},
    {K_UMTS_RRC_STATE, "K_UMTS_RRC_STATE", &KCellularWcdmaRrcConnectionState::pbDescriptor, true},
    {K_UMTS_RRC_CONFIG, "K_UMTS_RRC_CONFIG", &KCellularWcdmaRrcConfiguration::pbDescriptor, true},
    {K_UMTS_SCELL_INFO, "K_UMTS_SCELL_INFO", &KCellularWcdmaCellInfo::pbDescriptor, true},
    {K_UMTS_SCELL_MEAS, "K_UMTS_SCELL_MEAS", &KCellularWcdmaScellMeasurement::pbDescriptor, true},
    {K_UMTS_TX_POWER, "K_UMTS_TX_POWER", &KCellularWcdmaTxPower::pbDescriptor, true},
    {K_UMTS_SEL_RESEL_INFO, "K_UMTS_SEL_RESEL_INFO", &KCellularWcdmaSelReselCellInfo::pbDescriptor, true},
    {K_UMTS_NCELL_MEAS, "K_UMTS_NCELL_MEAS", &KCellularWcdmaNbrCellMeas::pbDescriptor, true},
    {K_GSM_SCELL_INFO, "K_GSM_SCELL_INFO", &KCellularGsmScellInfo::pbDescriptor, true},
    {K_GSM_IDLE_CONFIG, "K_GSM_IDLE_CONFIG", &KCellularGsmIdleConfig::pbDescriptor, true},
    {K_GSM_IDLE_SCELL_MEAS, "K_GSM_IDLE_SCELL_MEAS", &KCellularGsmIdleScellMeasurement::pbDescriptor, true},
    {K_GSM_CS_RF_MEAS, "K_GSM_CS_RF_MEAS", &KCellularGsmCsRfMeasurement::pbDescriptor, true},
    {K_GSM_NCELL_MEAS, "K_GSM_NCELL_MEAS", &KCellularGsmGrrEventMeasCr::pbDescriptor, true},
    {K_GSM_GPRS_CONFIG, "K_GSM_GPRS_CONFIG", &KCellularGsmGprsConfig::pbDescriptor, true},
    {K_SIM_FILE_INFO, "K_SIM_FILE_INFO", &KCellularSimCardFiles::pbDescriptor, true},
}};

}  // namespace

std::span<const MetricIdentifier> metricIdentifiers() noexcept { return metrics; }

const MetricIdentifier* metricWithId(std::int64_t id) noexcept {
  for (const MetricIdentifier& metric : metrics) {
    if (metric.id == id) return &metric;
  }
  return nullptr;
}

const MetricIdentifier* metricNamed(std::string_view name) noexcept {
  for (const MetricIdentifier& metric : metrics) {
    if (metric.name == name) return &metric;
  }
  return nullptr;
}

}  // namespace probeview
