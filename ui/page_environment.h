// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "platform/console_log.h"
#include "platform/main_queue.h"
#include "store/metric_validator.h"

namespace probeview {

// What pages are given to live on: the program's own, unless another is named. Everything here outlives every page.
struct PageEnvironment {
  TaskQueue& mainQueue = probeview::mainQueue();
  Scheduler& scheduler = mainScheduler();  // the main queue's own
  LineSink& consoleLog = probeview::consoleLog();
  const MetricValidator& metricValidator = MetricValidator::sharedValidator();
};

}  // namespace probeview
