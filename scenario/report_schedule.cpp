// SPDX-License-Identifier: Apache-2.0
#include "scenario/report_schedule.h"

#include <algorithm>

namespace probeview::scenario {

ReportSchedule::ReportSchedule(double speed, std::optional<Milliseconds> forcedPeriod)
    : speed_(speed), forcedPeriod_(forcedPeriod) {
  setPlan(std::nullopt);
}

void ReportSchedule::setPeriod(Entry& entry, std::optional<Milliseconds> period) const {
  entry.realPeriod = forcedPeriod_ ? forcedPeriod_ : period;
  entry.period.reset();
  if (entry.realPeriod) {
    entry.period = std::max(static_cast<Milliseconds>(static_cast<double>(*entry.realPeriod) * speed_), stepTime);
  }
}

void ReportSchedule::setPlan(const std::optional<MetricPlan>& plan) {
  for (const Report& report : reports()) {
    Entry& entry = entries_[static_cast<std::size_t>(report.fact)];
    const bool wasWanted = entry.wanted;
    const std::optional<Milliseconds> before = entry.realPeriod;
    if (!plan) {
      entry.wanted = true;
      entry.periodIsAsked = forcedPeriod_.has_value();
      setPeriod(entry, report.ownPeriod);
    } else {
      const auto wish = plan->metrics.find(report.metricId);
      const bool isListed = wish != plan->metrics.end();
      entry.wanted = isListed || plan->observed;
      std::optional<Milliseconds> period = plan->observed ? report.ownPeriod : std::nullopt;
      if (isListed) {
        std::optional<Milliseconds> wished;
        if (wish->second) wished = wish->second->count();
        // On change is more than any period: without one sorts before all that have one.
        period = plan->observed ? std::min(period, wished) : wished;
      }
      entry.periodIsAsked = forcedPeriod_ || (period && isListed && wish->second);
      setPeriod(entry, period);
    }
    if (entry.wanted && !wasWanted) entry.pending = true;
    if (entry.realPeriod != before) entry.next = 0;
  }
}

void ReportSchedule::renew() {
  for (Entry& entry : entries_) {
    entry.pending = true;
    entry.next = 0;
  }
}

bool ReportSchedule::wantsAnything() const {
  return std::ranges::any_of(entries_, [](const Entry& entry) { return entry.wanted; });
}

Milliseconds ReportSchedule::reportingPeriod(const Report& report) const {
  const Entry& entry = entries_[static_cast<std::size_t>(report.fact)];
  return entry.wanted ? entry.realPeriod.value_or(0) : 0;
}

std::optional<Milliseconds> ReportSchedule::shortestPeriod() const {
  std::optional<Milliseconds> shortest;
  for (const Entry& entry : entries_) {
    if (!entry.wanted || !entry.realPeriod) continue;
    shortest = std::min(shortest.value_or(*entry.realPeriod), *entry.realPeriod);
  }
  return shortest;
}

std::optional<Milliseconds> ReportSchedule::due(const Report& report, const Facts& facts, Milliseconds now) {
  Entry& entry = entries_[static_cast<std::size_t>(report.fact)];
  const Facts::Entry& fact = facts[report.fact];
  if (!entry.wanted || fact.learnt < 0) return std::nullopt;
  // A measurement that was made too early to be sent, and has been overtaken by a change of the cell, is news no more.
  const bool news = fact.revision != entry.reported && !fact.outdated &&
                    (fact.holds || fact.lastWord || report.nature == Nature::State);
  if (entry.period || report.nature == Nature::Measurement) {
    // A last word waits for nothing but what was asked for: the next technology is about to be told of.
    const bool waits = !news || !fact.lastWord || entry.periodIsAsked;
    if (waits && now < entry.next) return std::nullopt;
  }
  Milliseconds measuredAt = fact.learnt;
  if (forcedPeriod_) {
    measuredAt = now;
  } else if (!news) {
    if (entry.pending) {
      // A measurement that is still being made will be news soon enough; what is over is told as it last was.
      if (report.nature == Nature::Measurement && fact.holds) return std::nullopt;
    } else if (entry.period && report.nature == Nature::State && fact.holds) {
      measuredAt = now;
    } else {
      return std::nullopt;
    }
  }
  entry.pending = false;
  entry.reported = fact.revision;
  if (entry.period) {
    // On the period's own grid, so that steps do not add up to a slower rate; but nothing is made up for.
    entry.next += *entry.period;
    if (entry.next <= now) entry.next = now + *entry.period;
  } else if (report.nature == Nature::Measurement) {
    entry.next = now + static_cast<Milliseconds>(static_cast<double>(measurementPeriod) * speed_);
  }
  return tellAs(report, measuredAt);
}

Milliseconds ReportSchedule::tellAs(const Report& report, Milliseconds measuredAt) {
  Milliseconds& toldUntil = entries_[static_cast<std::size_t>(report.fact)].toldUntil;
  toldUntil = std::max(toldUntil, measuredAt);
  return toldUntil;
}

}  // namespace probeview::scenario
