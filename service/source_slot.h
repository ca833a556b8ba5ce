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
#include "service/rate_meter.h"
#include "source/metric_source.h"

namespace probeview {

// One source and what the service knows of it. A source is a plug-in: what it throws ends the source and nothing else,
// and what it emits is looked at before anybody sees it.
class SourceSlot final : MetricSink {
 public:
  // What the service hears of the source.
  struct Ears {
    // A record that is fit to be sent, and the moment on the monotonic clock.
    std::function<void(MetricRecord record, std::chrono::nanoseconds now)> record;
    // It has ended, failed, or runs again.
    std::function<void()> conditionChanged{};
  };

  SourceSlot(std::unique_ptr<MetricSource> source, Worker& worker, ServiceLog& log, Ears ears);
  ~SourceSlot() override;

  void start(const std::optional<MetricPlan>& plan, bool listening);
  void setPlan(const std::optional<MetricPlan>& plan);
  void setListening(bool listening);
  bool canFill(std::int64_t metricId) const;
  // Whether the source takes the question.
  bool query(std::int64_t metricId);

  const std::string& origin() const { return origin_; }
  const std::vector<std::int64_t>& metrics() const { return metrics_; }
  // Whether it runs; what has thrown runs no more.
  SourceCondition condition() const;
  std::optional<SourceIntake> intake() const { return intake_; }
  std::uint64_t records() const { return records_; }
  std::uint64_t withheld() const { return withheld_; }
  double recordsPerSecond() const;
  // Wall time of the last record, if there was one; and how old its values are by now.
  const std::optional<std::chrono::milliseconds>& lastRecord() const { return lastRecord_; }
  std::chrono::nanoseconds lastRecordAge() const { return worker_.clock().ageTime() - lastRecordBorn_; }

 private:
  class GuardedScheduler;
  class SourceLog;

  void emit(MetricRecord record) override;
  void conditionChanged(SourceCondition condition) override;
  void withhold(const MetricRecord& record, const std::string& reason);
  void guarded(const char* occasion, const std::function<void()>& call);
  void fail(const char* occasion, const std::string& reason);

  Worker& worker_;
  ServiceLog& log_;
  Ears ears_;
  std::unique_ptr<GuardedScheduler> scheduler_;
  std::unique_ptr<SourceLog> sourceLog_;
  std::unique_ptr<MetricSource> source_;
  std::string origin_;
  std::vector<std::int64_t> metrics_;
  SourceCondition condition_;
  std::string failure_;  // what it has thrown
  std::optional<SourceIntake> intake_;
  std::uint64_t records_ = 0;
  std::uint64_t withheld_ = 0;
  RateMeter rate_;
  std::chrono::nanoseconds started_;
  std::optional<std::chrono::milliseconds> lastRecord_;
  std::chrono::nanoseconds lastRecordBorn_{};  // by Clock::ageTime()
  std::shared_ptr<bool> alive_;
};

}  // namespace probeview
