// SPDX-License-Identifier: Apache-2.0
#include "messages/nas_messages.h"

#include "messages/metric_utility.h"

namespace probeview {

#define DEFINE(Class) PB_DEFINE(Class, KBBMetricUtility::isValidMetricIdTag)
NAS_MESSAGES(DEFINE)
#undef DEFINE

}  // namespace probeview
