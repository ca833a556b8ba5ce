// SPDX-License-Identifier: Apache-2.0
#include "service/sources/scenario/reports.h"

#include <array>

#include "messages/metric_identifiers.h"
#include "messages/runtime/data_writer.h"
#include "service/sources/scenario/family_reports.h"

namespace probeview::scenario {
namespace {

constexpr std::optional<Milliseconds> kOnChange;
constexpr std::optional<Milliseconds> kEachSecond = 1000;
constexpr Nature kState = Nature::kState;
constexpr Nature kMeasurement = Nature::kMeasurement;

constexpr std::array<Report, kFacts> kReports{{
    {Fact::kGsmServingCell, K_GSM_SCELL_INFO, kState, kOnChange},
    {Fact::kGsmIdleConfiguration, K_GSM_IDLE_CONFIG, kState, kOnChange},
    {Fact::kGsmIdleMeasurement, K_GSM_IDLE_SCELL_MEAS, kMeasurement, kEachSecond},
    {Fact::kGsmDedicatedMeasurement, K_GSM_CS_RF_MEAS, kMeasurement, kEachSecond},
    {Fact::kGsmNeighbours, K_GSM_NCELL_MEAS, kMeasurement, kEachSecond},
    {Fact::kGsmPacketConfiguration, K_GSM_GPRS_CONFIG, kState, kOnChange},
    {Fact::kUmtsServingCell, K_UMTS_SCELL_INFO, kState, kOnChange},
    {Fact::kUmtsServingMeasurement, K_UMTS_SCELL_MEAS, kMeasurement, kEachSecond},
    {Fact::kUmtsTransmitPower, K_UMTS_TX_POWER, kMeasurement, kEachSecond},
    {Fact::kUmtsSelection, K_UMTS_SEL_RESEL_INFO, kState, kOnChange},
    {Fact::kUmtsNeighbours, K_UMTS_NCELL_MEAS, kMeasurement, kEachSecond},
    {Fact::kUmtsConnection, K_UMTS_RRC_STATE, kState, kOnChange},
    {Fact::kUmtsConfiguration, K_UMTS_RRC_CONFIG, kState, kOnChange},
    {Fact::kLteServingCell, K_LTE_SCELL_INFO, kState, kOnChange},
    {Fact::kLteSamples, K_LTE_RSRP_RSRQ_SINR, kMeasurement, kEachSecond},
    {Fact::kLteConnection, K_LTE_RRC_STATE, kState, kOnChange},
    {Fact::kLteDrx, K_LTE_CDRX_CONFIG, kState, kOnChange},
    {Fact::kLteTransmitPower, K_LTE_TX_POWER, kMeasurement, kEachSecond},
    {Fact::kLteComponentCarriers, K_LTE_COMPCARR_INFO, kState, kOnChange},
    {Fact::kLteSelection, K_LTE_SEL_RESEL_INFO, kState, kOnChange},
    {Fact::kLteNeighbours, K_LTE_INTRARAT_MEAS, kMeasurement, kEachSecond},
    {Fact::kLteInterRatNeighbours, K_LTE_INTERRAT_MEAS, kMeasurement, kEachSecond},
    {Fact::kLteAggregation, K_LTE_CA_STATUS, kState, kOnChange},
    {Fact::kMobilityCommon, K_CELLULAR_MM_INFO, kState, kOnChange},
    {Fact::kMobilityContext, K_CELLULAR_MM_CTXT, kState, kOnChange},
    {Fact::kGprsContext, K_CELLULAR_GMM_CTXT, kState, kOnChange},
    {Fact::kEpsContext, K_LTE_EMM_CTXT, kState, kOnChange},
    {Fact::kBearers, K_CELLULAR_ACTIVE_BEARER, kState, kOnChange},
    {Fact::kSimFiles, K_SIM_FILE_INFO, kState, kOnChange},
}};

template <typename Message>
std::vector<std::uint8_t> encode(const Phone& phone, std::uint64_t timestamp) {
  Message message;
  message.setTimestamp(timestamp);
  report(phone, message);
  PBDataWriter writer;
  message.writeTo(writer);
  return writer.takeBytes();
}

}  // namespace

std::span<const Report> reports() { return kReports; }

std::vector<std::uint8_t> payloadOf(const Phone& phone, Fact fact, std::uint64_t timestamp) {
  switch (fact) {
    case Fact::kGsmServingCell:
      return encode<KCellularGsmScellInfo>(phone, timestamp);
    case Fact::kGsmIdleConfiguration:
      return encode<KCellularGsmIdleConfig>(phone, timestamp);
    case Fact::kGsmIdleMeasurement:
      return encode<KCellularGsmIdleScellMeasurement>(phone, timestamp);
    case Fact::kGsmDedicatedMeasurement:
      return encode<KCellularGsmCsRfMeasurement>(phone, timestamp);
    case Fact::kGsmNeighbours:
      return encode<KCellularGsmGrrEventMeasCr>(phone, timestamp);
    case Fact::kGsmPacketConfiguration:
      return encode<KCellularGsmGprsConfig>(phone, timestamp);
    case Fact::kUmtsServingCell:
      return encode<KCellularWcdmaCellInfo>(phone, timestamp);
    case Fact::kUmtsServingMeasurement:
      return encode<KCellularWcdmaScellMeasurement>(phone, timestamp);
    case Fact::kUmtsTransmitPower:
      return encode<KCellularWcdmaTxPower>(phone, timestamp);
    case Fact::kUmtsSelection:
      return encode<KCellularWcdmaSelReselCellInfo>(phone, timestamp);
    case Fact::kUmtsNeighbours:
      return encode<KCellularWcdmaNbrCellMeas>(phone, timestamp);
    case Fact::kUmtsConnection:
      return encode<KCellularWcdmaRrcConnectionState>(phone, timestamp);
    case Fact::kUmtsConfiguration:
      return encode<KCellularWcdmaRrcConfiguration>(phone, timestamp);
    case Fact::kLteServingCell:
      return encode<KCellularLteScellInfo>(phone, timestamp);
    case Fact::kLteSamples:
      return encode<KCellularLteRsrpRsrqSinr>(phone, timestamp);
    case Fact::kLteConnection:
      return encode<KCellularLteRrcState>(phone, timestamp);
    case Fact::kLteDrx:
      return encode<KCellularLteCdrxConfig>(phone, timestamp);
    case Fact::kLteTransmitPower:
      return encode<KCellularLteTxPower>(phone, timestamp);
    case Fact::kLteComponentCarriers:
      return encode<KCellularLteComponentCarrierInfo>(phone, timestamp);
    case Fact::kLteSelection:
      return encode<KCellularLteSelReselCellInfo>(phone, timestamp);
    case Fact::kLteNeighbours:
      return encode<KCellularLteNbrEutraCellMeas>(phone, timestamp);
    case Fact::kLteInterRatNeighbours:
      return encode<KCellularLteNbrInterRatCellMeas>(phone, timestamp);
    case Fact::kLteAggregation:
      return encode<KCellularLteCarrierAggregationStatus>(phone, timestamp);
    case Fact::kMobilityCommon:
      return encode<KCellularMmCommonInfo>(phone, timestamp);
    case Fact::kMobilityContext:
      return encode<KCellularMmContext>(phone, timestamp);
    case Fact::kGprsContext:
      return encode<KCellularGmmContext>(phone, timestamp);
    case Fact::kEpsContext:
      return encode<KCellularEmmContext>(phone, timestamp);
    case Fact::kBearers:
      return encode<KCellularActivatedBearerContexts>(phone, timestamp);
    case Fact::kSimFiles:
      return encode<KCellularSimCardFiles>(phone, timestamp);
  }
  return {};
}

}  // namespace probeview::scenario
