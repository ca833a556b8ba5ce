// SPDX-License-Identifier: Apache-2.0
#include "messages/umts_messages.h"

namespace probeview {

PB_DEFINE(KCellularWcdmaRrcConnectionState)
PB_DEFINE(KCellularWcdmaRrcConfiguration)
PB_DEFINE(KCellularWcdmaCellInfo)
PB_DEFINE(KCellularWcdmaScellMeasurement)
PB_DEFINE(KCellularWcdmaTxPower)
PB_DEFINE(EutraFreqInfo)
PB_DEFINE(UtraFreqInfo)
PB_DEFINE(GsmFreqInfo)
PB_DEFINE(KCellularWcdmaSelReselCellInfo)
PB_DEFINE(UtraCellMeasResult)
PB_DEFINE(GsmCellMeasResult)
PB_DEFINE(LteCellMeasResult)
PB_DEFINE(KCellularWcdmaNbrCellMeas)

}  // namespace probeview
