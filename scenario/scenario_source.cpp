// SPDX-License-Identifier: Apache-2.0
#include "scenario/scenario_source.h"

#include <algorithm>
#include <array>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <utility>

#include "scenario/edges_story.h"
#include "scenario/phone_story.h"
#include "scenario/report_schedule.h"
#include "scenario/reports.h"
#include "values/plain_text.h"

namespace probeview {
namespace scenario {
namespace {

using std::chrono::milliseconds;
using std::chrono::nanoseconds;

// How long the source sleeps at most and at least; in between, as long as the shortest period that anybody wants.
constexpr Milliseconds longestSleep = 100, shortestSleep = stepTime;
// A machine that was stopped for longer than this does not drive all the way that it has missed, nor does a source that
// rested for as much of simulated time.
constexpr milliseconds mostToCatchUp{5000};
// The time of day is followed when it jumps by more than this, as when a phone learns what time it is; a clock that is
// only drawn along slowly comes to no more in hours.
constexpr milliseconds largestDrift{1000};

class ScenarioSource final : public MetricSource {
 public:
  ScenarioSource(std::string_view name, std::unique_ptr<Story> story, double speed,
                 std::optional<Milliseconds> forcedPeriod)
      : origin_("scenario:" + std::string(name)),
        story_(std::move(story)),
        speed_(speed),
        schedule_(speed, forcedPeriod) {}

  std::string_view origin() const override { return origin_; }

  std::vector<std::int64_t> metrics() const override {
    std::vector<std::int64_t> ids;
    for (const Report& report : reports()) ids.push_back(report.metricId);
    std::sort(ids.begin(), ids.end());
    return ids;
  }

  void start(const SourceContext& context, MetricSink& sink) override {
    scheduler_ = &context.scheduler;
    clock_ = &context.clock;
    sink_ = &sink;
    anchor();
  }

  void stop() override { timer_.reset(); }

  void setPlan(const std::optional<MetricPlan>& plan) override {
    // First as far as it is by now: whoever changes his mind again and again must not keep the others waiting.
    if (listening_) driveOn();
    schedule_.setPlan(plan);
    sleep();
  }

  void setListening(bool listening) override {
    if (listening == listening_) return;
    listening_ = listening;
    if (listening_) {
      anchor();
      schedule_.renew();
    }
    sleep();
  }

  bool query(std::int64_t metricId) override {
    const std::span<const Report> all = reports();
    const auto found =
        std::find_if(all.begin(), all.end(), [&](const Report& report) { return report.metricId == metricId; });
    if (found == all.end()) return false;
    if (listening_ && !timer_) driveOn();
    // The card can be read as soon as the phone is on.
    if (story_->now() < 0) story_->advance();
    const Facts::Entry& fact = story_->facts()[found->fact];
    if (fact.learnt < 0) return false;
    if (!listening_) anchor();  // while the drive rests, now is the time of day
    const bool isSoNow = fact.holds && found->nature == Nature::State;
    emit(*found, schedule_.tellAs(*found, isSoNow ? story_->now() : fact.learnt));
    return true;
  }

 private:
  // From here on, or since a moment ago, simulated time and the time of day go together.
  void anchor(milliseconds ago = milliseconds(0)) {
    anchorMonotonic_ = clock_->monotonicTime() - ago;
    anchorWall_ = clock_->wallTime() - ago;
    wallOffset_ = wallOffset();
    anchorSimulated_ = story_->now();
    lastTurn_ = anchorMonotonic_;
  }

  // The time of day, counted from where the monotonic clock begins.
  milliseconds wallOffset() const {
    return clock_->wallTime() - std::chrono::duration_cast<milliseconds>(clock_->monotonicTime());
  }

  // Turns from now on as often as is wanted; not at all, without any timer, while nobody listens or nothing is wanted.
  void sleep() {
    timer_.reset();
    if (!listening_ || !schedule_.wantsAnything()) return;
    const Milliseconds sleep =
        std::clamp(schedule_.shortestPeriod().value_or(longestSleep), shortestSleep, longestSleep);
    timer_ = scheduler_->every(milliseconds(sleep), [this] { turn(); });
  }

  // Drives to where it is by now, also after a rest without a timer; the last of a long way is enough for that.
  void driveOn() {
    const milliseconds most(static_cast<Milliseconds>(static_cast<double>(mostToCatchUp.count()) / speed_));
    if (!timer_ && clock_->monotonicTime() - lastTurn_ > most) anchor(most);
    turn();
  }

  void turn() {
    const nanoseconds now = clock_->monotonicTime();
    if (const milliseconds jump = wallOffset() - wallOffset_; jump > largestDrift || jump < -largestDrift) {
      anchorWall_ += jump;
      wallOffset_ += jump;
    }
    if (now - std::exchange(lastTurn_, now) > mostToCatchUp) {
      anchor();
      return;
    }
    const double elapsed = std::chrono::duration<double, std::milli>(now - anchorMonotonic_).count();
    const Milliseconds until = anchorSimulated_ + static_cast<Milliseconds>(elapsed * speed_);
    while (story_->now() + stepTime <= until) {
      story_->advance();
      // That a technology has been left is told before what serves instead.
      tell(true);
      tell(false);
    }
  }

  // What is due of the technologies that have been left, or of everything else.
  void tell(bool ofTheLeft) {
    for (const Report& report : reports()) {
      if (story_->facts()[report.fact].left != ofTheLeft) continue;
      const std::optional<Milliseconds> time = schedule_.due(report, story_->facts(), story_->now());
      if (time) emit(report, *time);
    }
  }

  void emit(const Report& report, Milliseconds simulated) {
    MetricRecord record;
    record.metricId = report.metricId;
    record.time = anchorWall_ + milliseconds(simulated - anchorSimulated_);
    record.payload = story_->tell(report.fact, static_cast<std::uint64_t>(record.time.count()));
    record.origin = origin_;
    record.period = milliseconds(schedule_.reportingPeriod(report));
    record.age = std::chrono::duration_cast<nanoseconds>(
        std::chrono::duration<double, std::milli>(static_cast<double>(story_->now() - simulated) / speed_));
    sink_->emit(std::move(record));
  }

  std::string origin_;
  std::unique_ptr<Story> story_;
  double speed_;
  ReportSchedule schedule_;
  Scheduler* scheduler_ = nullptr;
  const Clock* clock_ = nullptr;
  MetricSink* sink_ = nullptr;
  ScheduledTaskHandle timer_;
  bool listening_ = false;
  nanoseconds anchorMonotonic_{};
  nanoseconds lastTurn_{};
  milliseconds anchorWall_{};
  milliseconds wallOffset_{};
  Milliseconds anchorSimulated_ = 0;
};

struct Scenario {
  std::string_view name;
  std::unique_ptr<Story> (*make)(std::uint64_t seed);
  std::optional<Milliseconds> forcedPeriod;
};

template <World (*makeWorld)(std::uint64_t)>
std::unique_ptr<Story> drive(std::uint64_t seed) {
  return std::make_unique<PhoneStory>(makeWorld(seed), seed);
}

constexpr Milliseconds twentyTimesASecond = 50;

const std::array<Scenario, 5> scenarios{{
    {"city", drive<cityWorld>, std::nullopt},
    {"highway", drive<highwayWorld>, std::nullopt},
    {"indoor", drive<indoorWorld>, std::nullopt},
    {"soak", drive<cityWorld>, twentyTimesASecond},
    {"edges", [](std::uint64_t) -> std::unique_ptr<Story> { return std::make_unique<EdgesStory>(); }, std::nullopt},
}};

std::string names() {
  std::string text;
  for (const Scenario& scenario : scenarios) {
    if (!text.empty()) text += ", ";
    text += scenario.name;
  }
  return text;
}

struct Options {
  std::string_view name = "city";
  std::optional<std::uint64_t> seed;
  std::optional<double> speed;
};

// Empty if the option was understood.
std::string readOption(std::string_view option, Options& options) {
  const std::size_t equals = option.find('=');
  const std::string_view key = option.substr(0, equals);
  const std::string_view value = equals == std::string_view::npos ? "" : option.substr(equals + 1);
  const std::string what = "scenario: \"" + std::string(option) + "\": ";
  if (key == "seed" && equals != std::string_view::npos) {
    if (options.seed) return what + "the seed is given twice; give it once";
    options.seed = parseNumber<std::uint64_t>(value);
    return options.seed ? "" : what + "the seed must be a whole number from 0 to 18446744073709551615";
  }
  if (key == "speed" && equals != std::string_view::npos) {
    if (options.speed) return what + "the speed is given twice; give it once";
    options.speed = parseNumber<double>(value);
    return options.speed && *options.speed >= 1 && *options.speed <= 1000
               ? ""
               : what + "the speed must be a number from 1 to 1000";
  }
  return what + "no such option; say scenario[:NAME][,seed=N][,speed=N]";
}

}  // namespace
}  // namespace scenario

SourceResult makeScenarioSource(std::string_view arguments) {
  using namespace scenario;
  if (arguments.starts_with(':')) arguments.remove_prefix(1);
  Options options;
  bool first = true;
  // A comma announces one more option.
  if (arguments.ends_with(',')) return {nullptr, readOption("", options)};
  while (first || !arguments.empty()) {
    const std::size_t comma = arguments.find(',');
    const std::string_view item = arguments.substr(0, comma);
    arguments.remove_prefix(comma == std::string_view::npos ? arguments.size() : comma + 1);
    const bool isName = first && item.find('=') == std::string_view::npos;
    first = false;
    if (isName) {
      if (!item.empty()) options.name = item;
      continue;
    }
    if (std::string error = readOption(item, options); !error.empty()) return {nullptr, std::move(error)};
  }
  for (const Scenario& scenario : scenarios) {
    if (scenario.name != options.name) continue;
    const std::uint64_t seed = options.seed.value_or(1);
    return {std::make_unique<ScenarioSource>(scenario.name, scenario.make(seed), options.speed.value_or(1),
                                             scenario.forcedPeriod),
            ""};
  }
  return {nullptr, "scenario: there is no scenario \"" + std::string(options.name) + "\"; choose one of " + names()};
}

}  // namespace probeview
