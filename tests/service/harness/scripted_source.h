// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <functional>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "source/metric_source.h"

namespace probeview {

// A source that does what a test says and notes what it is told. Everything on the service's thread.
class ScriptedSource final : public MetricSource {
 public:
  // What the test sees of it; outlives the source.
  struct Script {
    std::string origin = "scripted";
    std::vector<std::int64_t> metrics;
    // Called for each query; whether it is taken. Without one each is refused.
    std::function<bool(std::int64_t metricId)> onQuery;
    std::function<void()> onStart;
    std::function<void(bool)> onListening;
    std::optional<SourceIntake> intake;

    MetricSink* sink = nullptr;  // null before the start and after the end
    std::optional<SourceContext> context;
    std::optional<MetricPlan> plan;
    bool listening = false;
    bool stopped = false;
    int plans = 0;  // how often a plan was told

    void emit(std::int64_t metricId, std::vector<std::uint8_t> payload, std::chrono::milliseconds time = {}) {
      if (sink == nullptr) throw std::logic_error("the source does not run");
      sink->emit({.metricId = metricId, .payload = std::move(payload), .time = time, .origin = {}});
    }
  };

  explicit ScriptedSource(std::shared_ptr<Script> script) : script_(std::move(script)) {}
  ~ScriptedSource() override {
    script_->sink = nullptr;
    script_->context.reset();
  }

  std::string_view origin() const override { return script_->origin; }
  std::vector<std::int64_t> metrics() const override { return script_->metrics; }
  void start(const SourceContext& context, MetricSink& sink) override {
    script_->context.emplace(context);
    script_->sink = &sink;
    if (script_->onStart) script_->onStart();
  }
  void stop() override { script_->stopped = true; }
  void setPlan(const std::optional<MetricPlan>& plan) override {
    script_->plan = plan;
    ++script_->plans;
  }
  void setListening(bool listening) override {
    script_->listening = listening;
    if (script_->onListening) script_->onListening(listening);
  }
  std::optional<SourceIntake> intake() const override { return script_->intake; }
  bool query(std::int64_t metricId) override { return script_->onQuery && script_->onQuery(metricId); }

 private:
  std::shared_ptr<Script> script_;
};

// Keeps log lines.
class KeptLines final : public LineSink {
 public:
  void line(std::string_view text) override { lines.emplace_back(text); }
  // How many of them contain the text.
  std::size_t count(std::string_view text) const {
    std::size_t found = 0;
    for (const std::string& line : lines) found += line.find(text) != std::string::npos ? 1 : 0;
    return found;
  }
  std::vector<std::string> lines;
};

}  // namespace probeview
