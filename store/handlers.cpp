// SPDX-License-Identifier: Apache-2.0
#include "store/handlers.h"

#include <algorithm>
#include <array>
#include <iterator>
#include <optional>

#include "messages/metric_identifiers.h"
#include "platform/fatal_error.h"

namespace probeview {

namespace {

using HandledMetrics = std::array<HandledMetric, std::size(storedMetrics)>;

// In ascending order of the identifiers, so that the choice takes five comparisons.
HandledMetrics handledMetricsInOrder() {
  HandledMetrics metrics{};
  std::size_t count = 0;
  for (const auto family : {lteHandlers(), umtsHandlers(), gsmHandlers(), nasHandlers()}) {
    for (const MetricHandler& handler : family) {
      const std::optional<DisplayDictionary> dictionary = displayDictionaryOf(handler.metricID);
      if (count == metrics.size() || !dictionary) fatalError("a handler's metric is not among those that are stored");
      metrics[count++] = {handler, metricWithId(handler.metricID)->message, *dictionary};
    }
  }
  if (count != metrics.size()) fatalError("a metric lacks its handler");
  std::sort(metrics.begin(), metrics.end(),
            [](const auto& left, const auto& right) { return left.handler.metricID < right.handler.metricID; });
  return metrics;
}

const HandledMetrics& handledMetrics() {
  static const HandledMetrics metrics = handledMetricsInOrder();
  return metrics;
}

}  // namespace

const HandledMetric* handledMetric(std::int64_t metricID) {
  const HandledMetrics& metrics = handledMetrics();
  const auto found =
      std::lower_bound(metrics.begin(), metrics.end(), metricID,
                       [](const HandledMetric& metric, std::int64_t id) { return metric.handler.metricID < id; });
  return found != metrics.end() && found->handler.metricID == metricID ? &*found : nullptr;
}

void formatTimestampAndLog(HandlerTurn& turn) {
  turn.formatTimestamp();
  turn.log();
}

}  // namespace probeview
