// SPDX-License-Identifier: Apache-2.0
#include "service/sources/trace_source.h"

#include <algorithm>
#include <set>
#include <utility>

#include "messages/metric_identifiers.h"
#include "service/sources/trace_file.h"
#include "service/sources/trace_reader.h"
#include "service/sources/trace_translator.h"
#include "source/metric_pacer.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

constexpr double slowest = 0.001;
constexpr double fastest = 100'000;
// Rows that are due together, at a high speed, are played so many at a time, so that the loop gets to its other work.
constexpr int rowsPerTurn = 64;
// Between the last row and the first of the next round.
constexpr std::chrono::milliseconds roundPause(1000);

struct TraceArguments {
  std::string path;
  double speed = 1;
  bool loop = false;
};

// Empty, or what is wrong with the arguments.
std::string parseArguments(std::string_view text, TraceArguments& arguments) {
  constexpr std::string_view speedOption = "speed=";
  // Options stand at the end; a file's name may have commas, too.
  while (true) {
    const std::size_t comma = text.rfind(',');
    if (comma == std::string_view::npos) break;
    const std::string_view option = text.substr(comma + 1);
    if (option == "loop") {
      arguments.loop = true;
    } else if (option.starts_with(speedOption)) {
      const std::string_view number = option.substr(speedOption.size());
      const auto speed = parseNumber<double>(number);
      if (!speed || !(*speed >= slowest && *speed <= fastest)) {
        return "speed=" + std::string(number) + " is not understood; a speed is a number from 0.001 to 100000";
      }
      arguments.speed = *speed;
    } else {
      break;
    }
    text = text.substr(0, comma);
  }
  if (text.empty()) return "it names no file; expected trace:FILE[,speed=N][,loop]";
  arguments.path = text;
  return {};
}

// States and serving cells are told when they change, measurements with every row that has one.
bool comesOnChange(std::int64_t metricId) {
  return metricId == K_LTE_SCELL_INFO || metricId == K_LTE_RRC_STATE || metricId == K_UMTS_SCELL_INFO ||
         metricId == K_UMTS_RRC_STATE || metricId == K_GSM_SCELL_INFO;
}

class TraceSource final : public MetricSource {
 public:
  TraceSource(const TraceArguments& arguments, TraceLog log)
      : log_(std::move(log)), speed_(arguments.speed), loop_(arguments.loop) {
    origin_ = "trace:" + arguments.path.substr(arguments.path.rfind('/') + 1);
    TraceTranslator translator;
    std::set<std::int64_t> filled;
    for (const TraceRow& row : log_.rows) {
      translator.translate(row, metricsOfRow_);
      for (const TraceMetric& metric : metricsOfRow_) filled.insert(metric.metricId);
    }
    metrics_.assign(filled.begin(), filled.end());
  }

  std::string_view origin() const override { return origin_; }
  std::vector<std::int64_t> metrics() const override { return metrics_; }

  void start(const SourceContext& context, MetricSink& sink) override {
    scheduler_ = &context.scheduler;
    clock_ = &context.clock;
    logLines_ = &context.log;
    sink_ = &sink;
    pacer_.emplace(context, sink);
    if (!log_.remark.empty()) say(log_.remark);
    for (const std::string& problem : log_.problems) say(problem);
    if (log_.problemCount > log_.problems.size()) {
      say("and " + std::to_string(log_.problemCount - log_.problems.size()) + " more problems like these");
    }
  }

  void stop() override {
    timer_.reset();
    pacer_.reset();
  }

  void setPlan(const std::optional<MetricPlan>& plan) override { pacer_->setPlan(plan); }

  void setListening(bool listening) override {
    if (listening == listening_) return;
    listening_ = listening;
    const std::chrono::nanoseconds now = clock_->monotonicTime();
    if (listening) {
      // As if the drive had begun as long ago as it has been played.
      beganAt_ = now - played_;
      schedule();
    } else {
      played_ = now - beganAt_;
      timer_.reset();
    }
  }

  bool query(std::int64_t metricId) override { return pacer_->resend(metricId); }

  std::optional<SourceIntake> intake() const override { return SourceIntake{log_.rows.size(), log_.rowsSkipped}; }

 private:
  bool ended() const { return next_ == log_.rows.size(); }

  void schedule() {
    timer_.reset();
    if (ended()) return;
    const std::chrono::nanoseconds left = beganAt_ + dueAfter_ - clock_->monotonicTime();
    timer_ = scheduler_->after(std::max(left, std::chrono::nanoseconds(0)), [this] { play(); });
  }

  void play() {
    const std::chrono::nanoseconds now = clock_->monotonicTime();
    for (int count = 0; count < rowsPerTurn && !ended() && beganAt_ + dueAfter_ <= now; ++count) playRow();
    schedule();
  }

  void playRow() {
    const TraceRow& row = log_.rows[next_];
    translator_.translate(row, metricsOfRow_);
    for (TraceMetric& metric : metricsOfRow_) {
      pacer_->offer({.metricId = metric.metricId,
                     .payload = std::move(metric.payload),
                     .time = row.time,
                     .origin = origin_,
                     .period = comesOnChange(metric.metricId) ? std::chrono::milliseconds(0) : rowPeriod(),
                     .age = {}});
    }
    ++next_;
    if (!ended()) {
      // A clock that goes back is no reason to wait.
      wait(std::max(log_.rows[next_].time - row.time, std::chrono::milliseconds(0)));
    } else if (loop_) {
      next_ = 0;
      translator_.startOver();
      wait(roundPause);
    } else {
      say("played to its end, line " + std::to_string(row.line));
      sink_->conditionChanged({.phase = SourceCondition::Phase::Ended, .reason = {}});
    }
  }

  // A log has about one row a second.
  std::chrono::milliseconds rowPeriod() const {
    return std::chrono::milliseconds(std::max<std::int64_t>(1, static_cast<std::int64_t>(1000 / speed_)));
  }

  // Adds driven time to when the next row is due. Dates can be millennia apart; thirty years are as good as never.
  void wait(std::chrono::milliseconds driven) {
    constexpr double never = 1e18;
    const double due = static_cast<double>(dueAfter_.count()) + static_cast<double>(driven.count()) * 1e6 / speed_;
    dueAfter_ = std::chrono::nanoseconds(static_cast<std::int64_t>(std::min(due, never)));
  }

  void say(const std::string& what) { logLines_->line(what); }

  std::string origin_;
  std::vector<std::int64_t> metrics_;
  TraceLog log_;
  double speed_;
  bool loop_;

  Scheduler* scheduler_ = nullptr;
  const Clock* clock_ = nullptr;
  LineSink* logLines_ = nullptr;
  MetricSink* sink_ = nullptr;
  std::optional<MetricPacer> pacer_;
  TraceTranslator translator_;
  std::vector<TraceMetric> metricsOfRow_;

  bool listening_ = false;
  std::size_t next_ = 0;                  // the row that comes next
  std::chrono::nanoseconds dueAfter_{0};  // when it comes, counted from the beginning of the drive
  std::chrono::nanoseconds beganAt_{0};   // on the monotonic clock; while listening
  std::chrono::nanoseconds played_{0};    // how long the drive has been played; while not
  ScheduledTaskHandle timer_;
};

}  // namespace

SourceResult makeTraceSource(std::string_view arguments) {
  TraceArguments parsed;
  if (std::string error = parseArguments(arguments, parsed); !error.empty()) {
    return {nullptr, "trace:" + std::string(arguments) + ": " + error};
  }
  TraceTextResult text = readTraceFile(parsed.path);
  if (!text.text) return {nullptr, "trace file " + parsed.path + " cannot be read: " + text.error};
  TraceLogResult log = readTraceLog(*text.text);
  if (!log.log) return {nullptr, "trace file " + parsed.path + " is no drive-test log: " + log.error};
  return {std::make_unique<TraceSource>(parsed, std::move(*log.log)), {}};
}

}  // namespace probeview
