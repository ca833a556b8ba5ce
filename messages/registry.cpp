// SPDX-License-Identifier: Apache-2.0
#include "messages/registry.h"

#include <array>

#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/nas_messages.h"
#include "messages/umts_messages.h"

namespace probeview {

namespace {

constexpr std::array<const MessageDescriptor*, 54> classes = {
    &KCellularLteRrcState::pbDescriptor,
    &KCellularLteCdrxConfig::pbDescriptor,
    &KCellularLteScellInfo::pbDescriptor,
    &KCellularLteSelReselCellInfo::pbDescriptor,
    &NbrEutra::pbDescriptor,
    &KCellularLteServingCellMeasurement::pbDescriptor,
    &RxInfo::pbDescriptor,
    &KCellularLteTxPower::pbDescriptor,
    &TxPowerInfo::pbDescriptor,
    &KCellularLteRsrpRsrqSinr::pbDescriptor,
    &RsrpRsrqSinr::pbDescriptor,
    &KCellularLteComponentCarrierInfo::pbDescriptor,
    &KCellularLteCarrierAggregationStatus::pbDescriptor,
    &SecondaryComponentCarrier::pbDescriptor,
    &KCellularLteNbrEutraCellMeas::pbDescriptor,
    &EgwErrcNbrEutraMeas::pbDescriptor,
    &KCellularLteNbrInterRatCellMeas::pbDescriptor,
    &EgwErrcNbrUtraMeas::pbDescriptor,
    &EgwErrcNbrGeranMeas::pbDescriptor,
    &KCellularWcdmaRrcConnectionState::pbDescriptor,
    &KCellularWcdmaRrcConfiguration::pbDescriptor,
    &KCellularWcdmaCellInfo::pbDescriptor,
    &KCellularWcdmaScellMeasurement::pbDescriptor,
    &KCellularWcdmaTxPower::pbDescriptor,
    &KCellularWcdmaSelReselCellInfo::pbDescriptor,
    &EutraFreqInfo::pbDescriptor,
    &UtraFreqInfo::pbDescriptor,
    &GsmFreqInfo::pbDescriptor,
    &KCellularWcdmaNbrCellMeas::pbDescriptor,
    &UtraCellMeasResult::pbDescriptor,
    &GsmCellMeasResult::pbDescriptor,
    &LteCellMeasResult::pbDescriptor,
    &KCellularGsmScellInfo::pbDescriptor,
    &KCellularGsmIdleConfig::pbDescriptor,
    &KCellularGsmIdleScellMeasurement::pbDescriptor,
    &KCellularGsmCsRfMeasurement::pbDescriptor,
    &KCellularGsmGrrEventMeasCr::pbDescriptor,
    &GsmNcellMeas::pbDescriptor,
    &UmtsNcellMeas::pbDescriptor,
    &LteNcellMeas::pbDescriptor,
    &KCellularGsmGprsConfig::pbDescriptor,
    &KCellularMmCommonInfo::pbDescriptor,
    &Plmn::pbDescriptor,
    &KCellularLocationAreaId::pbDescriptor,
    &KCellularTrackingAreaId::pbDescriptor,
    &KCellularMmContext::pbDescriptor,
    &KCellularGmmContext::pbDescriptor,
    &RoutingAreaId::pbDescriptor,
    &KCellularEmmContext::pbDescriptor,
    &Guti::pbDescriptor,
    &KCellularActivatedBearerContexts::pbDescriptor,
    &BearerContext::pbDescriptor,
    &KCellularSimCardFiles::pbDescriptor,
    &ElementaryFile::pbDescriptor,
};

}  // namespace

std::span<const MessageDescriptor* const> messageClasses() noexcept { return classes; }

const MessageDescriptor* messageClass(std::string_view name) noexcept {
  for (const MessageDescriptor* descriptor : classes) {
    if (descriptor->name == name) return descriptor;
  }
  return nullptr;
}

}  // namespace probeview
