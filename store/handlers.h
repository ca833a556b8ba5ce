// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "messages/runtime/field_descriptor.h"
#include "store/display_dictionaries.h"
#include "store/handler_turn.h"

namespace probeview {

// One metric kind: how its log line begins, and what else is done with it.
struct MetricHandler {
  std::int64_t metricID;
  std::string_view prefix;
  // Runs when the dictionary form of the message has been stored; formats the timestamp and writes the log line at the
  // place that is this metric's.
  void (*rewrite)(HandlerTurn& turn);
};

// The handlers of each family.
std::span<const MetricHandler> lteHandlers();
std::span<const MetricHandler> umtsHandlers();
std::span<const MetricHandler> gsmHandlers();
std::span<const MetricHandler> nasHandlers();

// A handler with what it needs to be called.
struct HandledMetric {
  MetricHandler handler;
  const MessageDescriptor* message;  // the class of its payload
  DisplayDictionary dictionary;      // holds its latest message
};

// The handled metric of exactly this identifier; null for one that nobody handles.
const HandledMetric* handledMetric(std::int64_t metricID);

// What every handler does that has nothing more to do.
void formatTimestampAndLog(HandlerTurn& turn);

}  // namespace probeview
