// SPDX-License-Identifier: Apache-2.0
#include "source/metric_pacer.h"

#include <algorithm>
#include <utility>

namespace probeview {

namespace {

// A source that reports at the same pace has a newer value at the very moment at which the period ends; it gets this
// long to come first.
constexpr std::chrono::milliseconds grace(1);

}  // namespace

MetricPacer::MetricPacer(const SourceContext& context, MetricSink& sink)
    : scheduler_(context.scheduler), clock_(context.clock), sink_(sink) {}

void MetricPacer::offer(MetricRecord record) {
  const std::int64_t metricId = record.metricId;
  Entry& entry = entries_[metricId];
  entry.latest = std::move(record);
  entry.offeredAt = clock_.ageTime();
  entry.waiting = true;
  passOrWait(metricId, entry);
}

void MetricPacer::setPlan(std::optional<MetricPlan> plan) {
  plan_ = std::move(plan);
  for (auto& [metricId, entry] : entries_) {
    entry.timer.reset();
    if (entry.waiting) passOrWait(metricId, entry);
  }
}

bool MetricPacer::resend(std::int64_t metricId) {
  const auto found = entries_.find(metricId);
  if (found == entries_.end()) return false;
  pass(found->second);
  return true;
}

void MetricPacer::passOrWait(std::int64_t metricId, Entry& entry) {
  if (plan_ && !plan_->observed) {
    const auto wanted = plan_->metrics.find(metricId);
    // Kept for the day on which somebody wants it: a serving cell that has not changed since is news to him.
    if (wanted == plan_->metrics.end()) return;
    if (wanted->second && entry.passedAt) {
      const std::chrono::nanoseconds left = *entry.passedAt + *wanted->second - clock_.monotonicTime();
      if (left > std::chrono::nanoseconds(0)) {
        if (!entry.timer) entry.timer = scheduler_.after(left + grace, [this, &entry] { pass(entry); });
        return;
      }
    }
  }
  pass(entry);
}

void MetricPacer::pass(Entry& entry) {
  entry.waiting = false;
  entry.passedAt = clock_.monotonicTime();
  entry.timer.reset();
  MetricRecord record = entry.latest;
  record.period = periodOf(record);
  record.age += clock_.ageTime() - entry.offeredAt;
  sink_.emit(std::move(record));
}

std::chrono::milliseconds MetricPacer::periodOf(const MetricRecord& record) const {
  const std::chrono::milliseconds own = record.period;
  if (!plan_ || plan_->observed) return own;
  const auto wanted = plan_->metrics.find(record.metricId);
  // Nobody wants it again and again: it was asked for.
  if (wanted == plan_->metrics.end()) return {};
  return own.count() == 0 ? own : std::max(own, wanted->second.value_or(own));
}

}  // namespace probeview
