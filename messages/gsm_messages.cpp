// SPDX-License-Identifier: Apache-2.0
#include "messages/gsm_messages.h"

namespace probeview {

PB_DEFINE(KCellularGsmScellInfo)
PB_DEFINE(KCellularGsmIdleConfig)
PB_DEFINE(KCellularGsmIdleScellMeasurement)
PB_DEFINE(KCellularGsmCsRfMeasurement)
PB_DEFINE(GsmNcellMeas)
PB_DEFINE(UmtsNcellMeas)
PB_DEFINE(LteNcellMeas)
PB_DEFINE(KCellularGsmGrrEventMeasCr)
PB_DEFINE(KCellularGsmGprsConfig)

}  // namespace probeview
