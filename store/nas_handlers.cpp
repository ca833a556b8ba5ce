// SPDX-License-Identifier: Apache-2.0
//
// Handlers of the metrics that belong to no single radio technology: mobility management, bearers and SIM files.
#include "messages/metric_identifiers.h"
#include "store/handlers.h"

namespace probeview {

namespace {

void emmContext(HandlerTurn& turn) {
  turn.formatTimestamp();
  turn.flattenDictionary("guti");
  turn.flattenDictionaries("tai_list");
  // The line shows the flattened texts.
  turn.log();
}

void activeBearers(HandlerTurn& turn) {
  formatTimestampAndLog(turn);
  turn.collect("bearer_contexts", turn.common().activeBearer);
}

void simFiles(HandlerTurn& turn) {
  formatTimestampAndLog(turn);
  // Files are shown as they stand, without a timestamp.
  turn.collect("ef_list", turn.common().simContents, {}, {});
}

constexpr MetricHandler nasTable[] = {
    {K_CELLULAR_MM_INFO, "Received MM Common Info Dict is : ", formatTimestampAndLog},
    {K_CELLULAR_MM_CTXT, "Received MM Context Info is ", formatTimestampAndLog},
    {K_CELLULAR_GMM_CTXT, "Received GMM Context Info is ", formatTimestampAndLog},
    {K_LTE_EMM_CTXT, "Received EMM Context is ", emmContext},
    {K_CELLULAR_ACTIVE_BEARER, "Received Bearer Context Info is ", activeBearers},
    {K_SIM_FILE_INFO, "Received SIM Card File Info is ", simFiles},
};

}  // namespace

std::span<const MetricHandler> nasHandlers() { return nasTable; }

}  // namespace probeview
