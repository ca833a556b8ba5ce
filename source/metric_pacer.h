// SPDX-License-Identifier: Apache-2.0
//
// Between a source that has values when it has them and clients that want them so often and no oftener.
#pragma once

#include <chrono>
#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "source/metric_source.h"

namespace probeview {

// Keeps the latest record of each metric and passes on what the plan wants: a metric that is not in the plan not at
// all, one with a period not more often than that (what comes too early waits, and only the latest of it), one without
// a period at once. Without a plan, and while somebody observes, everything passes at once. On the scheduler's thread.
//
// Records that pass say how long ago they were offered, and how often their metric comes as things are: what is offered
// with the source's own period passes with that or the plan's, whichever is longer; what is offered without one, as it
// comes on change, passes without one.
class MetricPacer {
 public:
  // The sink, scheduler and clock must outlive the pacer.
  MetricPacer(const SourceContext& context, MetricSink& sink);

  void offer(MetricRecord record);
  void setPlan(std::optional<MetricPlan> plan);
  // Passes the latest record of the metric on again, whatever the plan; false if there is none yet.
  bool resend(std::int64_t metricId);

 private:
  struct Entry {
    MetricRecord latest;
    std::chrono::nanoseconds offeredAt{};              // by Clock::ageTime()
    bool waiting = false;                              // the latest has not been passed on, but is to be
    std::optional<std::chrono::nanoseconds> passedAt;  // by Clock::monotonicTime()
    ScheduledTaskHandle timer;
  };

  void pass(Entry& entry);
  std::chrono::milliseconds periodOf(const MetricRecord& record) const;
  void passOrWait(std::int64_t metricId, Entry& entry);

  Scheduler& scheduler_;
  const Clock& clock_;
  MetricSink& sink_;
  std::optional<MetricPlan> plan_;
  std::map<std::int64_t, Entry> entries_;
};

}  // namespace probeview
