// SPDX-License-Identifier: Apache-2.0
#include "service/source_slot.h"

#include <algorithm>
#include <exception>
#include <utility>

#include "radix/frames.h"
#include "service/payload_check.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

// What a record's frame needs beside payload and origin.
constexpr std::size_t frameOverhead = 256;
constexpr std::size_t longestPayload = radix::longestFrame - frameOverhead - radix::longestOrigin;

}  // namespace

// Runs the source's timers and catches what they throw.
class SourceSlot::GuardedScheduler final : public Scheduler {
 public:
  explicit GuardedScheduler(SourceSlot& slot) : slot_(slot) {}
  ScheduledTaskHandle after(std::chrono::nanoseconds delay, Task task) override {
    return slot_.worker_.after(delay, guard(std::move(task)));
  }
  ScheduledTaskHandle every(std::chrono::nanoseconds interval, Task task) override {
    return slot_.worker_.every(interval, guard(std::move(task)));
  }

 private:
  Task guard(Task task) {
    return [&slot = slot_, inner = std::move(task)] { slot.guarded("in a timer", inner); };
  }
  SourceSlot& slot_;
};

class SourceSlot::SourceLog final : public LineSink {
 public:
  explicit SourceLog(SourceSlot& slot) : slot_(slot) {}
  void line(std::string_view text) override {
    slot_.log_.write(LogLevel::Warning, slot_.origin_ + ": " + std::string(text));
  }

 private:
  SourceSlot& slot_;
};

SourceSlot::SourceSlot(std::unique_ptr<MetricSource> source, Worker& worker, ServiceLog& log, Ears ears)
    : worker_(worker),
      log_(log),
      ears_(std::move(ears)),
      scheduler_(std::make_unique<GuardedScheduler>(*this)),
      sourceLog_(std::make_unique<SourceLog>(*this)),
      source_(std::move(source)),
      started_(worker.clock().monotonicTime()),
      alive_(std::make_shared<bool>(true)) {
  guarded("naming itself", [this] {
    origin_ = beginningOf(source_->origin(), radix::longestOrigin);
    metrics_ = source_->metrics();
  });
}

SourceSlot::~SourceSlot() {
  *alive_ = false;
  guarded("stopping", [this] { source_->stop(); });
}

void SourceSlot::start(const std::optional<MetricPlan>& plan, bool listening) {
  guarded("starting", [&] {
    source_->start({*scheduler_, worker_.clock(), *sourceLog_}, *this);
    source_->setPlan(plan);
    source_->setListening(listening);
  });
  guarded("telling what it has read", [&] { intake_ = source_->intake(); });
}

SourceCondition SourceSlot::condition() const {
  if (failure_.empty()) return condition_;
  return {SourceCondition::Phase::Failed, failure_};
}

void SourceSlot::setPlan(const std::optional<MetricPlan>& plan) {
  guarded("taking a plan", [&] { source_->setPlan(plan); });
}

void SourceSlot::setListening(bool listening) {
  guarded("being told who listens", [&] { source_->setListening(listening); });
}

bool SourceSlot::canFill(std::int64_t metricId) const {
  return failure_.empty() && condition_.phase != SourceCondition::Phase::Failed &&
         std::find(metrics_.begin(), metrics_.end(), metricId) != metrics_.end();
}

bool SourceSlot::query(std::int64_t metricId) {
  bool taken = false;
  guarded("answering a query", [&] { taken = source_->query(metricId); });
  return taken;
}

double SourceSlot::recordsPerSecond() const { return rate_.perSecond(worker_.clock().monotonicTime(), started_); }

void SourceSlot::emit(MetricRecord record) {
  if (record.payload.size() > longestPayload) {
    withhold(record, "its payload has " + std::to_string(record.payload.size()) + " bytes, more than " +
                         std::to_string(longestPayload));
    return;
  }
  if (!payloadDecodes(record.metricId, record.payload)) {
    withhold(record, "its payload of " + std::to_string(record.payload.size()) + " bytes does not decode");
    return;
  }
  if (record.origin.empty()) record.origin = origin_;
  record.origin.resize(beginningOf(record.origin, radix::longestOrigin).size());
  record.age = radix::boundedSpan(record.age);
  record.period = radix::boundedSpan(record.period);
  const std::chrono::nanoseconds now = worker_.clock().monotonicTime();
  ++records_;
  rate_.add(now);
  lastRecord_ = record.time;
  lastRecordBorn_ = worker_.clock().ageTime() - record.age;
  ears_.record(std::move(record), now);
}

void SourceSlot::conditionChanged(SourceCondition condition) {
  if (!failure_.empty()) return;
  condition.reason.resize(beginningOf(condition.reason, radix::longestReason).size());
  if (condition.phase == SourceCondition::Phase::Failed) {
    log_.write(LogLevel::Error, origin_ + " has failed: " + condition.reason);
  }
  condition_ = std::move(condition);
  if (ears_.conditionChanged) ears_.conditionChanged();
}

void SourceSlot::withhold(const MetricRecord& record, const std::string& reason) {
  ++withheld_;
  if (!isWorthTelling(withheld_)) return;
  log_.write(LogLevel::Warning, origin_ + ": a record of " + metricText(record.metricId) + " was withheld, " + reason +
                                    " (" + std::to_string(withheld_) + " withheld so far)");
}

void SourceSlot::guarded(const char* occasion, const std::function<void()>& call) {
  if (!source_ || !failure_.empty()) return;
  try {
    call();
  } catch (const std::exception& error) {
    fail(occasion, error.what());
  } catch (...) {
    // Whatever a plug-in throws, the service goes on for the others.
    fail(occasion, "something that is no exception");
  }
}

void SourceSlot::fail(const char* occasion, const std::string& reason) {
  failure_ = std::string("failed ") + occasion + ": " + reason;
  log_.write(LogLevel::Error, (origin_.empty() ? "a source" : origin_) + " " + failure_ + "; it runs no more");
  if (ears_.conditionChanged) ears_.conditionChanged();
  // Not from inside its own code.
  worker_.post([this, alive = alive_] {
    if (*alive) source_.reset();
  });
}

}  // namespace probeview
