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

constexpr std::optional<Milliseconds> kOnChange;
constexpr std::optional<Milliseconds> kEachSecond = 1000;
constexpr Nature kState = Nature::kState;
constexpr Nature kMeasurement = Nature::kMeasurement;

constexpr std::array<Report, kFacts> kReports{{
    {Fact::kLteConnection, K_LTE_RRC_STATE, kState, kOnChange, encode<KCellularLteRrcState>},
    {Fact::kLteServingCell, K_LTE_SCELL_INFO, kState, kOnChange, encode<KCellularLteScellInfo>},
    {Fact::kLteSelection, K_LTE_SEL_RESEL_INFO, kState, kOnChange, encode<KCellularLteSelReselCellInfo>},
    {Fact::kLteComponentCarriers, K_LTE_COMPCARR_INFO, kState, kOnChange, encode<KCellularLteComponentCarrierInfo>},
    {Fact::kLteAggregation, K_LTE_CA_STATUS, kState, kOnChange, encode<KCellularLteCarrierAggregationStatus>},
    {Fact::kLteDrx, K_LTE_CDRX_CONFIG, kState, kOnChange, encode<KCellularLteCdrxConfig>},
    {Fact::kUmtsConnection, K_UMTS_RRC_STATE, kState, kOnChange, encode<KCellularWcdmaRrcConnectionState>},
    {Fact::kUmtsServingCell, K_UMTS_SCELL_INFO, kState, kOnChange, encode<KCellularWcdmaCellInfo>},
    {Fact::kUmtsSelection, K_UMTS_SEL_RESEL_INFO, kState, kOnChange, encode<KCellularWcdmaSelReselCellInfo>},
    {Fact::kUmtsConfiguration, K_UMTS_RRC_CONFIG, kState, kOnChange, encode<KCellularWcdmaRrcConfiguration>},
    {Fact::kGsmServingCell, K_GSM_SCELL_INFO, kState, kOnChange, encode<KCellularGsmScellInfo>},
    {Fact::kGsmIdleConfiguration, K_GSM_IDLE_CONFIG, kState, kOnChange, encode<KCellularGsmIdleConfig>},
    {Fact::kGsmPacketConfiguration, K_GSM_GPRS_CONFIG, kState, kOnChange, encode<KCellularGsmGprsConfig>},
    {Fact::kLteSamples, K_LTE_RSRP_RSRQ_SINR, kMeasurement, kEachSecond, encode<KCellularLteRsrpRsrqSinr>},
    {Fact::kLteTransmitPower, K_LTE_TX_POWER, kMeasurement, kEachSecond, encode<KCellularLteTxPower>},
    {Fact::kLteNeighbours, K_LTE_INTRARAT_MEAS, kMeasurement, kEachSecond, encode<KCellularLteNbrEutraCellMeas>},
    {Fact::kLteInterRatNeighbours, K_LTE_INTERRAT_MEAS, kMeasurement, kEachSecond,
     encode<KCellularLteNbrInterRatCellMeas>},
    {Fact::kUmtsServingMeasurement, K_UMTS_SCELL_MEAS, kMeasurement, kEachSecond,
     encode<KCellularWcdmaScellMeasurement>},
    {Fact::kUmtsTransmitPower, K_UMTS_TX_POWER, kMeasurement, kEachSecond, encode<KCellularWcdmaTxPower>},
    {Fact::kUmtsNeighbours, K_UMTS_NCELL_MEAS, kMeasurement, kEachSecond, encode<KCellularWcdmaNbrCellMeas>},
    {Fact::kGsmIdleMeasurement, K_GSM_IDLE_SCELL_MEAS, kMeasurement, kEachSecond,
     encode<KCellularGsmIdleScellMeasurement>},
    {Fact::kGsmDedicatedMeasurement, K_GSM_CS_RF_MEAS, kMeasurement, kEachSecond, encode<KCellularGsmCsRfMeasurement>},
    {Fact::kGsmNeighbours, K_GSM_NCELL_MEAS, kMeasurement, kEachSecond, encode<KCellularGsmGrrEventMeasCr>},
    {Fact::kEpsContext, K_LTE_EMM_CTXT, kState, kOnChange, encode<KCellularEmmContext>},
    {Fact::kGprsContext, K_CELLULAR_GMM_CTXT, kState, kOnChange, encode<KCellularGmmContext>},
    {Fact::kMobilityContext, K_CELLULAR_MM_CTXT, kState, kOnChange, encode<KCellularMmContext>},
    {Fact::kMobilityCommon, K_CELLULAR_MM_INFO, kState, kOnChange, encode<KCellularMmCommonInfo>},
    {Fact::kBearers, K_CELLULAR_ACTIVE_BEARER, kState, kOnChange, encode<KCellularActivatedBearerContexts>},
    {Fact::kSimFiles, K_SIM_FILE_INFO, kState, kOnChange, encode<KCellularSimCardFiles>},
}};

consteval bool standInTheFactsOrder() {
  for (std::size_t i = 0; i < kReports.size(); ++i) {
    if (kReports[i].fact != static_cast<Fact>(i)) return false;
  }
  return true;
}
static_assert(standInTheFactsOrder());

}  // namespace

std::span<const Report> reports() { return kReports; }

const Report& reportOf(Fact fact) { return kReports[static_cast<std::size_t>(fact)]; }

}  // namespace probeview::scenario
