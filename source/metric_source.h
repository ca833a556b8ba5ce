// SPDX-License-Identifier: Apache-2.0
//
// What feeds the service. A source is a plug-in: a modem, a scenario, a trace, a recording. It lives on the service's
// loop; nothing here is called from another thread.
#pragma once

#include <chrono>
#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/clock.h"
#include "platform/task_queue.h"
#include "radix/client.h"
#include "values/line_sink.h"

namespace probeview {

// One metric as a source reports it.
struct MetricRecord {
  std::int64_t metricId = 0;          // such as 0x3C4E04
  std::vector<std::uint8_t> payload;  // one encoded message
  std::chrono::milliseconds time{};   // since 1970-01-01 UTC, when the values were measured
  std::string origin;                 // who reports it, such as "scenario:city"
  // How often the source reports this metric as things are; 0: on change, or because it was asked for.
  std::chrono::milliseconds period{};
  // How old the values are already, by a clock that is never set: a modem may tell what it has known for a while.
  std::chrono::nanoseconds age{};
};

// How a source is, as it says itself. One that throws has failed without saying so.
struct SourceCondition {
  using Phase = radix::client::SourceState::Phase;
  Phase phase = Phase::Running;
  std::string reason{};  // why it failed and what to do, for people
};

// What a source has read from a file.
struct SourceIntake {
  std::uint64_t rowsRead = 0;
  std::uint64_t rowsSkipped = 0;
};

// Takes what sources report. Must not be called again from inside emit().
class MetricSink {
 public:
  virtual ~MetricSink() = default;
  virtual void emit(MetricRecord record) = 0;
  // The source runs until it says otherwise, and again when it says so. Must not be called from inside emit() either.
  // Who heeds the condition keeps it. NOLINTNEXTLINE(performance-unnecessary-value-param)
  virtual void conditionChanged(SourceCondition) {}
};

// Which metrics somebody wants, and how often: the union of what all clients asked for, at the shortest period. A
// metric without a period is wanted on every change. A metric that is not in the plan is not wanted, unless somebody
// observes.
struct MetricPlan {
  std::map<std::int64_t, std::optional<std::chrono::milliseconds>> metrics;
  // Somebody observes: every metric is wanted at the source's own period, those above at the shorter of the two.
  bool observed = false;
  friend bool operator==(const MetricPlan&, const MetricPlan&) = default;
};

// What a source is given to live on.
struct SourceContext {
  Scheduler& scheduler;
  const Clock& clock;
  LineSink& log;  // one line per problem: what, where, what to do
};

class MetricSource {
 public:
  virtual ~MetricSource() = default;

  // The origin of its records, such as "scenario:city" or "trace:drive-a.csv".
  virtual std::string_view origin() const = 0;
  // The identifiers of the metrics that it can fill, in ascending order.
  virtual std::vector<std::int64_t> metrics() const = 0;

  // Begins to report to the sink, which outlives the source. Called once, before any other call below.
  virtual void start(const SourceContext& context, MetricSink& sink) = 0;
  // Ends reporting; the source is destroyed next.
  virtual void stop() = 0;

  // The wishes of the clients have changed. Absent: nobody has configured anything, and whoever listens observes: run
  // at the source's own periods.
  virtual void setPlan(const std::optional<MetricPlan>& plan) = 0;
  // Whether anybody takes the records at all; a source that makes its data itself may rest while nobody does.
  virtual void setListening(bool listening) = 0;

  // Reports the metric once, now (before it returns or on a later turn of the loop). False if it cannot.
  virtual bool query(std::int64_t metricId) = 0;
  // What it has read so far, for sources that read a file.
  virtual std::optional<SourceIntake> intake() const { return std::nullopt; }
};

// A source, or the reason for which there is none: what, where and what to do.
struct SourceResult {
  std::unique_ptr<MetricSource> source;
  std::string error;
};

}  // namespace probeview
