// SPDX-License-Identifier: Apache-2.0
#include "messages/lte_messages.h"

namespace probeview {

PB_DEFINE(KCellularLteRrcState)
PB_DEFINE(KCellularLteCdrxConfig)
PB_DEFINE(KCellularLteScellInfo)
PB_DEFINE(NbrEutra)
PB_DEFINE(KCellularLteSelReselCellInfo)
PB_DEFINE(RxInfo)
PB_DEFINE(KCellularLteServingCellMeasurement)
PB_DEFINE(TxPowerInfo)
PB_DEFINE(KCellularLteTxPower)
PB_DEFINE(RsrpRsrqSinr)
PB_DEFINE(KCellularLteRsrpRsrqSinr)
PB_DEFINE(KCellularLteComponentCarrierInfo)
PB_DEFINE(SecondaryComponentCarrier)
PB_DEFINE(KCellularLteCarrierAggregationStatus)
PB_DEFINE(EgwErrcNbrEutraMeas)
PB_DEFINE(KCellularLteNbrEutraCellMeas)
PB_DEFINE(EgwErrcNbrUtraMeas)
PB_DEFINE(EgwErrcNbrGeranMeas)
PB_DEFINE(KCellularLteNbrInterRatCellMeas)

}  // namespace probeview
