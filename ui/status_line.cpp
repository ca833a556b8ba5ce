// SPDX-License-Identifier: Apache-2.0
#include "ui/status_line.h"

#include <algorithm>
#include <cstdint>
#include <vector>

#include "values/plain_text.h"

namespace probeview {

namespace {

constexpr std::int64_t secondsPerDay = 86400;

std::int64_t floorDivided(std::int64_t number, std::int64_t divisor) {
  return number / divisor - (number % divisor < 0 ? 1 : 0);
}

std::string twoDigits(std::int64_t number) { return (number < 10 ? "0" : "") + std::to_string(number); }

// Bytes of what others say that the line has room for.
constexpr std::size_t longestOrigin = 64;
constexpr std::size_t longestReason = 240;

// What another program says, as it may stand in the line.
std::string shown(std::string_view text, std::size_t longest) {
  const std::string line = onOneLine(beginningOf(text, longest));
  // What stands in place of a character may be longer than it.
  const auto beginning = beginningOf(line, longest);
  const bool isWhole = text.size() <= longest && beginning.size() == line.size();
  return std::string(beginning) + (isWhole ? "" : "…");
}

std::string withReason(std::string_view what, const std::string& reason) {
  return reason.empty() ? std::string(what) : std::string(what) + ": " + shown(reason, longestReason);
}

using radix::client::SourceState;
using StatusKind = Status::Kind;

bool isRunning(const SourceState& source) { return source.phase == SourceState::Phase::Running; }

// Where several bear the name, one that runs speaks for them.
const SourceState* sourceNamed(const std::vector<SourceState>& sources, const std::string& origin) {
  const SourceState* found = nullptr;
  for (const auto& source : sources) {
    if (source.origin == origin && (found == nullptr || isRunning(source))) found = &source;
  }
  return found;
}

StatusKind kindOf(const SourceState& source) {
  switch (source.phase) {
    case SourceState::Phase::Running:
      return StatusKind::Live;
    case SourceState::Phase::Ended:
      return StatusKind::Ended;
    case SourceState::Phase::Failed:
      return StatusKind::Failed;
  }
  return StatusKind::Live;
}

// How a source that no longer runs has come to its end.
std::string endOf(const SourceState& source) {
  if (source.phase == SourceState::Phase::Failed) return withReason("source failed", source.reason);
  return source.origin.starts_with("trace:") ? "trace ended" : "source ended";
}

std::string named(const SourceState& source) {
  return source.origin.empty() ? "a source without name" : shown(source.origin, longestOrigin);
}

// "a", "a and b", or the text where they are more.
std::string named(const std::vector<const SourceState*>& sources, const std::string& ofMany) {
  if (sources.size() > 2) return ofMany;
  return sources.size() == 1 ? named(*sources[0]) : named(*sources[0]) + " and " + named(*sources[1]);
}

// Where nothing is known of what feeds the service.
Status nothingYet(const std::optional<PageFeed>& feed) {
  return {StatusKind::Waiting, feed ? "Connected to the baseband service, nothing received yet for this page"
                                    : "Connected to the baseband service, nothing received yet"};
}

// Why no record has come for a page, or for the lists. Where the sources are not all, only what those promise that run
// is certain.
Status nothingYet(const std::vector<SourceState>& sources, bool areAll, const std::optional<PageFeed>& feed) {
  if (areAll && sources.empty()) return {StatusKind::Unfillable, "the baseband service has no source"};
  std::vector<const SourceState*> all;
  std::vector<const SourceState*> able;
  std::vector<const SourceState*> running;
  const SourceState* failed = nullptr;
  for (const auto& source : sources) {
    all.push_back(&source);
    const auto fills = [&](std::int64_t metric) {
      return std::find(source.metrics.begin(), source.metrics.end(), metric) != source.metrics.end();
    };
    if (feed && std::none_of(feed->begin(), feed->end(), fills)) continue;
    able.push_back(&source);
    if (isRunning(source)) running.push_back(&source);
    if (source.phase == SourceState::Phase::Failed && failed == nullptr) failed = &source;
  }
  const auto count = [](const auto& many) { return std::to_string(many.size()) + " sources"; };
  if (!running.empty())
    return {StatusKind::Waiting, "nothing received yet from " + named(running, "any of " + count(running))};
  if (!areAll) return nothingYet(feed);
  if (able.empty())
    return {StatusKind::Unfillable,
            named(all, "none of the " + count(all)) + " can" + (all.size() > 2 ? "" : "not") + " fill this page"};
  const auto& gone = failed != nullptr ? *failed : *able.front();
  return {kindOf(gone), named(gone) + " · " + endOf(gone) + (failed != nullptr ? "" : ", nothing received")};
}

}  // namespace

std::string ageText(std::chrono::nanoseconds age) {
  using std::chrono::duration_cast;
  const auto milliseconds =
      duration_cast<std::chrono::milliseconds>(std::max(age, std::chrono::nanoseconds(0))).count();
  const auto seconds = milliseconds / 1000;
  if (seconds < 10) return std::to_string(seconds) + "." + std::to_string(milliseconds / 100 % 10) + " s";
  if (seconds < 60) return std::to_string(seconds) + " s";
  if (seconds < 60 * 60) return std::to_string(seconds / 60) + " min";
  if (seconds < 2 * secondsPerDay) return std::to_string(seconds / 3600) + " h";
  return std::to_string(seconds / secondsPerDay) + " d";
}

Status StatusLine::status(const StatusFacts& facts) const {
  const auto& connection = facts.service.connection;
  if (!connection.connected) return away(facts);
  if (facts.isConfigurationMissing) return {StatusKind::Failed, "no configuration: resource missing"};
  if (connection.configuration == ConfigurationOutcome::Refused) {
    return {StatusKind::Failed, withReason("configuration refused", connection.configurationTrouble)};
  }
  if (facts.feed && facts.feed->empty()) return {StatusKind::Unfillable, "no metric fills this page"};
  if (const auto* record = youngestOf(facts)) return filled(facts.service, *record);
  if (connection.configuration == ConfigurationOutcome::Unsent) {
    return {StatusKind::Waiting, withReason("configuration not taken yet", connection.configurationTrouble)};
  }
  if (connection.configuration == ConfigurationOutcome::NotPushed) {
    return {StatusKind::Waiting, "no configuration pushed, nothing received yet"};
  }
  if (connection.sources) return nothingYet(*connection.sources, !connection.areSourcesCut, facts.feed);
  return nothingYet(facts.feed);
}

Status StatusLine::away(const StatusFacts& facts) const {
  const auto& connection = facts.service.connection;
  if (!connection.everConnected) {
    if (connection.trouble.empty()) return {StatusKind::Waiting, "Waiting for the baseband service"};
    // Why it does not come is worth its place: who waits may be waiting at the wrong socket.
    return {StatusKind::Away, "Waiting for the baseband service · " + shown(connection.trouble, longestReason)};
  }
  return {StatusKind::Away,
          "Baseband service away since " + localTime(connection.since) +
              (youngestOf(facts) != nullptr ? ", showing what was last known" : ", nothing received yet")};
}

Status StatusLine::filled(const ServiceStatus& service, const Record& record) const {
  // How old the values are, not when they were measured: a replayed drive may be years old and yet alive.
  const auto age = ageText(ageOf(record));
  const auto origin = shown(record.origin, longestOrigin);
  // Of a record whose age nobody tells, no more is known than when it came.
  const auto since = (record.age ? "" : "received ") + age + " ago";
  const auto line = (origin.empty() ? "Last record " : origin + " · ") + since;
  if (service.connection.sources && !record.origin.empty()) {
    const auto* source = sourceNamed(*service.connection.sources, record.origin);
    if (source == nullptr && !service.connection.areSourcesCut)
      return {StatusKind::Ended, line + " · no longer a source"};
    if (source != nullptr && source->phase != SourceState::Phase::Running)
      return {kindOf(*source), line + " · " + endOf(*source)};
  }
  if (!isStale(record)) return {StatusKind::Live, line};
  const auto silence = origin.empty() ? std::nullopt : silenceOf(service, record.origin);
  if (!silence) return {StatusKind::Stale, line + ", stale"};
  const auto silent = "source silent for " + ageText(*silence);
  return {StatusKind::Stale, (ageText(*silence) == age ? origin : line) + " · " + silent};
}

std::chrono::nanoseconds StatusLine::ageOf(const Record& record) const {
  return record.age.value_or(std::chrono::milliseconds(0)) + clock_.ageTime() - record.receivedAgeTime;
}

bool StatusLine::isPeriodic(const Record& record) { return record.period && record.period->count() > 0; }

bool StatusLine::isStale(const Record& record) const {
  return isPeriodic(record) &&
         ageOf(record) > std::max<std::chrono::nanoseconds>(leastStaleAge, stalePeriods * *record.period);
}

std::optional<std::chrono::nanoseconds> StatusLine::silenceOf(const ServiceStatus& service,
                                                              const std::string& origin) const {
  auto silence = std::chrono::nanoseconds::max();
  bool keepsAPeriod = false;
  const auto consider = [&](const Record& record) {
    if (record.origin != origin) return;
    silence = std::min(silence, ageOf(record));
    keepsAPeriod = keepsAPeriod || (isPeriodic(record) && !isStale(record));
  };
  for (const auto& [metric, record] : service.lastRecords) consider(record);
  if (service.lastRecord) consider(*service.lastRecord);
  if (keepsAPeriod || silence <= leastStaleAge) return std::nullopt;
  return silence;
}

const StatusLine::Record* StatusLine::youngestOf(const StatusFacts& facts) const {
  if (!facts.feed) return facts.service.lastRecord ? &*facts.service.lastRecord : nullptr;
  const Record* youngest = nullptr;
  for (const auto metric : *facts.feed) {
    const auto found = facts.service.lastRecords.find(metric);
    if (found == facts.service.lastRecords.end()) continue;
    if (youngest == nullptr || ageOf(found->second) < ageOf(*youngest)) youngest = &found->second;
  }
  return youngest;
}

std::string StatusLine::localTime(std::chrono::milliseconds wallTime) const {
  const auto local = [this](std::chrono::milliseconds time) {
    const auto utc = floorDivided(time.count(), 1000);
    return utc + zone_.periodAt(utc).offset;
  };
  const auto then = local(wallTime);
  const auto day = floorDivided(then, secondsPerDay);
  const auto second = then - day * secondsPerDay;
  std::string timeOfDay = twoDigits(second / 3600) + ":" + twoDigits(second / 60 % 60) + ":" + twoDigits(second % 60);
  if (day == floorDivided(local(clock_.wallTime()), secondsPerDay)) return timeOfDay;
  const std::chrono::year_month_day date{std::chrono::sys_days{std::chrono::days{day}}};
  return std::to_string(static_cast<int>(date.year())) + "-" + twoDigits(static_cast<unsigned>(date.month())) + "-" +
         twoDigits(static_cast<unsigned>(date.day())) + " " + timeOfDay;
}

}  // namespace probeview
