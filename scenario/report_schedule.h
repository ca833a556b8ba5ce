// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <array>
#include <cstdint>
#include <optional>

#include "scenario/facts.h"
#include "scenario/reports.h"
#include "source/metric_source.h"

namespace probeview::scenario {

// Decides at each step which facts are to be reported, by the wishes of the clients and by what has changed. Periods
// are of the clients' time: a drive at speed 100 is no reason to send a hundred times as much.
class ReportSchedule {
 public:
  // How many ms of simulated time go by in one of real time; at least 1. Everything is sent at this period whatever is
  // asked for, if there is one: a scenario whose purpose is load.
  ReportSchedule(double speed, std::optional<Milliseconds> forcedPeriod);

  void setPlan(const std::optional<MetricPlan>& plan);
  // Somebody new listens: all that is known is news again.
  void renew();
  // Whether anything of it is wanted at all.
  bool wantsAnything() const;
  // How often the fact is reported as things are, in ms of real time; 0: on change, or only when it is asked for.
  Milliseconds reportingPeriod(const Report& report) const;
  // The shortest period that anybody wants, in ms of real time; none if everything is wanted on change only.
  std::optional<Milliseconds> shortestPeriod() const;

  // Whether the fact is to be reported now; if so, it counts as reported. The answer's time is the simulated time at
  // which the reported values were measured.
  std::optional<Milliseconds> due(const Report& report, const Facts& facts, Milliseconds now);
  // The simulated time as which values measured at that one are told, now and from now on: what held when it was told
  // last, on its turn or because somebody asked, is not told as if it had ended before.
  Milliseconds tellAs(const Report& report, Milliseconds measuredAt);

 private:
  struct Entry {
    bool wanted = true;
    std::optional<Milliseconds> period;  // simulated ms
    std::optional<Milliseconds> realPeriod;
    bool periodIsAsked = false;  // by a client or by the scenario; otherwise it is the report's own
    std::uint32_t reported = 0;  // revision
    bool pending = true;         // not reported since somebody began to want it
    Milliseconds next = 0;       // not before, in simulated ms
    Milliseconds toldUntil = 0;  // the latest moment of which it has been told
  };

  void setPeriod(Entry& entry, std::optional<Milliseconds> period) const;

  double speed_;
  std::optional<Milliseconds> forcedPeriod_;
  std::array<Entry, factCount> entries_;
};

}  // namespace probeview::scenario
