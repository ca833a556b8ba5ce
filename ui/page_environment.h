// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "platform/task_queue.h"
#include "values/line_sink.h"

namespace probeview {

class MetricValidator;

// What pages are given to live on. Everything here outlives every page.
struct PageEnvironment {
  TaskQueue& mainQueue;
  Scheduler& scheduler;  // the main queue's own
  LineSink& consoleLog;
  const MetricValidator& metricValidator;
};

}  // namespace probeview
