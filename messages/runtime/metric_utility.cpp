// SPDX-License-Identifier: Apache-2.0
#include "messages/runtime/metric_utility.h"

#include <algorithm>
#include <array>

namespace probeview {

namespace {

// Some of the names match no message class; they are the service's own and stay as they are.
constexpr std::array<KBBMetricUtility::Row, 31> table = {{
    {19972, "KCellularLteRrcState"},
    {19992, "KCellularLteCdrxConfig"},
    {20005, "KCellularLteRadioLinkFailure"},
    {16578, "KCellularLteScellInfo"},
    {54030, "KCellularLteSelReselCellInfo"},
    {54017, "KCellularLteServingCellMeasurement"},
    {54018, "KCellularLteTxPower"},
    {20330, "KCellularRsrpRsrqSinr"},
    {54540, "KCellularEmmContext"},
    {54027, "KCellularLteComponentCarrierInfo"},
    {54035, "KCellularLteCarrierAggregationStatus"},
    {54032, "KCellularLteNbrInterRatCellMeas"},
    {54031, "KCellularLteNbrEutraCellMeas"},
    {54537, "KCellularMmCommonInfo"},
    {54541, "KCellularActivatedBearerContexts"},
    {53522, "KCellularWcdmaRrcConnectionState"},
    {12300, "KCellularWcdmaCellInfo"},
    {53506, "KCellularWcdmaScellMeasurement"},
    {53507, "KCellularWcdmaTxPower"},
    {53509, "KCellularWcdmaNbrCellMeas"},
    {53508, "KCellularWcdmaSelReselCellInfo"},
    {53523, "KCellularWcdmaRrcConfiguration"},
    {54538, "KCellularMmContext"},
    {54539, "KCellularGmmContext"},
    {11788, "kCellularGsmScellInfo"},
    {53249, "kCellularGsmIdleConfig"},
    {53250, "kCellularGsmIdleScellMeasurement"},
    {53251, "kCellularGsmCsRfMeasurement"},
    {53257, "kCellularGsmGrrEventMeasCr"},
    {53260, "kCellularGsmGprsConfig"},
    {19, "kCellularSimCardFiles"},
}};

// The same numbers in ascending order, for the search. Built by the compiler, once and for all threads.
constexpr auto sortedIds = [] {
  std::array<std::uint16_t, table.size()> ids{};
  for (std::size_t index = 0; index < table.size(); ++index) ids[index] = table[index].metricId;
  std::sort(ids.begin(), ids.end());
  return ids;
}();

}  // namespace

bool KBBMetricUtility::isValidMetricIdTag(std::uint32_t tag, std::string_view /*forClass*/, LineSink* log) {
  if (!isMetricId(tag)) return false;
  if (log != nullptr) log->line("valid metricId tag");
  return true;
}

bool KBBMetricUtility::isHighMetricId(std::uint32_t number) noexcept {
  static_assert(sortedIds[0] == lowestMetricId && sortedIds[1] == secondMetricId);
  return number <= 0xFFFF && std::binary_search(sortedIds.begin(), sortedIds.end(), number);
}

std::span<const KBBMetricUtility::Row> KBBMetricUtility::rows() noexcept { return table; }

}  // namespace probeview
