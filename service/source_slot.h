// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "platform/worker.h"
#include "service/log.h"
#include "service/metric_source.h"
#include "service/rate_meter.h"

namespace probeview {

// One source and what the service knows of it. A source is a plug-in: what it throws ends the source and nothing else,
// and what it emits is looked at before anybody sees it.
class SourceSlot final : MetricSink {
 public:
  // Takes the records that are fit to be sent.
  using Taker = std::function<void(MetricRecord record)>;

  SourceSlot(std::unique_ptr<MetricSource> source, Worker& worker, ServiceLog& log, Taker taker);
  ~SourceSlot() override;

  void start(const std::optional<MetricPlan>& plan, bool listening);
  void setPlan(const std::optional<MetricPlan>& plan);
  void setListening(bool listening);
  bool canFill(std::int64_t metricId) const;
  // Whether the source takes the question.
  bool query(std::int64_t metricId);

  const std::string& origin() const { return origin_; }
  const std::vector<std::int64_t>& metrics() const { return metrics_; }
  // Why the source runs no more; empty while it does.
  const std::string& failure() const { return failure_; }
  std::uint64_t records() const { return records_; }
  std::uint64_t withheld() const { return withheld_; }
  double recordsPerSecond() const;
  // Wall time of the last record, if there was one.
  const std::optional<std::chrono::milliseconds>& lastRecord() const { return lastRecord_; }

 private:
  class GuardedScheduler;
  class SourceLog;

  void emit(MetricRecord record) override;
  void withhold(const MetricRecord& record, const std::string& reason);
  void guarded(const char* occasion, const std::function<void()>& call);
  void fail(const char* occasion, const std::string& reason);

  Worker& worker_;
  ServiceLog& log_;
  Taker taker_;
  std::unique_ptr<GuardedScheduler> scheduler_;
  std::unique_ptr<SourceLog> sourceLog_;
  std::unique_ptr<MetricSource> source_;
  std::string origin_;
  std::vector<std::int64_t> metrics_;
  std::string failure_;
  std::uint64_t records_ = 0;
  std::uint64_t withheld_ = 0;
  RateMeter rate_;
  std::chrono::nanoseconds started_;
  std::optional<std::chrono::milliseconds> lastRecord_;
  std::shared_ptr<bool> alive_;
};

}  // namespace probeview
