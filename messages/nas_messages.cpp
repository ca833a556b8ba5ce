// SPDX-License-Identifier: Apache-2.0
#include "messages/nas_messages.h"

namespace probeview {

PB_DEFINE(Plmn)
PB_DEFINE(KCellularLocationAreaId)
PB_DEFINE(KCellularTrackingAreaId)
PB_DEFINE(KCellularMmCommonInfo)
PB_DEFINE(KCellularMmContext)
PB_DEFINE(RoutingAreaId)
PB_DEFINE(KCellularGmmContext)
PB_DEFINE(Guti)
PB_DEFINE(KCellularEmmContext)
PB_DEFINE(BearerContext)
PB_DEFINE(KCellularActivatedBearerContexts)
PB_DEFINE(ElementaryFile)
PB_DEFINE(KCellularSimCardFiles)

}  // namespace probeview
