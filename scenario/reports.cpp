// SPDX-License-Identifier: Apache-2.0
#include "scenario/reports.h"

#include <array>

#include "messages/metric_identifiers.h"
#include "messages/runtime/data_writer.h"
#include "scenario/family_reports.h"

namespace probeview::scenario {
namespace {

template <typename Message>
std::vector<std::uint8_t> encode(const Phone& phone, std::uint64_t timestamp) {
  Message message;
  message.setTimestamp(timestamp);
  report(phone, message);
  PBDataWriter writer;
  message.writeTo(writer);
  return writer.takeBytes();
}

constexpr std::optional<Milliseconds> onChange;
constexpr std::optional<Milliseconds> eachSecond = 1000;
constexpr Nature state = Nature::State;
constexpr Nature measurement = Nature::Measurement;

constexpr std::array<Report, factCount> reportTable{{
    {Fact::LteConnection, K_LTE_RRC_STATE, state, onChange, encode<KCellularLteRrcState>},
    {Fact::LteServingCell, K_LTE_SCELL_INFO, state, onChange, encode<KCellularLteScellInfo>},
    {Fact::LteSelection, K_LTE_SEL_RESEL_INFO, state, onChange, encode<KCellularLteSelReselCellInfo>},
    {Fact::LteComponentCarriers, K_LTE_COMPCARR_INFO, state, onChange, encode<KCellularLteComponentCarrierInfo>},
    {Fact::LteAggregation, K_LTE_CA_STATUS, state, onChange, encode<KCellularLteCarrierAggregationStatus>},
    {Fact::LteDrx, K_LTE_CDRX_CONFIG, state, onChange, encode<KCellularLteCdrxConfig>},
    {Fact::UmtsConnection, K_UMTS_RRC_STATE, state, onChange, encode<KCellularWcdmaRrcConnectionState>},
    {Fact::UmtsServingCell, K_UMTS_SCELL_INFO, state, onChange, encode<KCellularWcdmaCellInfo>},
    {Fact::UmtsSelection, K_UMTS_SEL_RESEL_INFO, state, onChange, encode<KCellularWcdmaSelReselCellInfo>},
    {Fact::UmtsConfiguration, K_UMTS_RRC_CONFIG, state, onChange, encode<KCellularWcdmaRrcConfiguration>},
    {Fact::GsmServingCell, K_GSM_SCELL_INFO, state, onChange, encode<KCellularGsmScellInfo>},
    {Fact::GsmIdleConfiguration, K_GSM_IDLE_CONFIG, state, onChange, encode<KCellularGsmIdleConfig>},
    {Fact::GsmPacketConfiguration, K_GSM_GPRS_CONFIG, state, onChange, encode<KCellularGsmGprsConfig>},
    {Fact::LteSamples, K_LTE_RSRP_RSRQ_SINR, measurement, eachSecond, encode<KCellularLteRsrpRsrqSinr>},
    {Fact::LteTransmitPower, K_LTE_TX_POWER, measurement, eachSecond, encode<KCellularLteTxPower>},
    {Fact::LteNeighbours, K_LTE_INTRARAT_MEAS, measurement, eachSecond, encode<KCellularLteNbrEutraCellMeas>},
    {Fact::LteInterRatNeighbours, K_LTE_INTERRAT_MEAS, measurement, eachSecond,
     encode<KCellularLteNbrInterRatCellMeas>},
    {Fact::UmtsServingMeasurement, K_UMTS_SCELL_MEAS, measurement, eachSecond, encode<KCellularWcdmaScellMeasurement>},
    {Fact::UmtsTransmitPower, K_UMTS_TX_POWER, measurement, eachSecond, encode<KCellularWcdmaTxPower>},
    {Fact::UmtsNeighbours, K_UMTS_NCELL_MEAS, measurement, eachSecond, encode<KCellularWcdmaNbrCellMeas>},
    {Fact::GsmIdleMeasurement, K_GSM_IDLE_SCELL_MEAS, measurement, eachSecond,
     encode<KCellularGsmIdleScellMeasurement>},
    {Fact::GsmDedicatedMeasurement, K_GSM_CS_RF_MEAS, measurement, eachSecond, encode<KCellularGsmCsRfMeasurement>},
    {Fact::GsmNeighbours, K_GSM_NCELL_MEAS, measurement, eachSecond, encode<KCellularGsmGrrEventMeasCr>},
    {Fact::EpsContext, K_LTE_EMM_CTXT, state, onChange, encode<KCellularEmmContext>},
    {Fact::GprsContext, K_CELLULAR_GMM_CTXT, state, onChange, encode<KCellularGmmContext>},
    {Fact::MobilityContext, K_CELLULAR_MM_CTXT, state, onChange, encode<KCellularMmContext>},
    {Fact::MobilityCommon, K_CELLULAR_MM_INFO, state, onChange, encode<KCellularMmCommonInfo>},
    {Fact::Bearers, K_CELLULAR_ACTIVE_BEARER, state, onChange, encode<KCellularActivatedBearerContexts>},
    {Fact::SimFiles, K_SIM_FILE_INFO, state, onChange, encode<KCellularSimCardFiles>},
}};

consteval bool standInTheFactsOrder() {
  for (std::size_t i = 0; i < reportTable.size(); ++i) {
    if (reportTable[i].fact != static_cast<Fact>(i)) return false;
  }
  return true;
}
static_assert(standInTheFactsOrder());

}  // namespace

std::span<const Report> reports() { return reportTable; }

const Report& reportOf(Fact fact) { return reportTable[static_cast<std::size_t>(fact)]; }

}  // namespace probeview::scenario
