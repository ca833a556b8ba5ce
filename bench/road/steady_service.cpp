// SPDX-License-Identifier: Apache-2.0
#include "bench/road/steady_service.h"

#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <memory>
#include <set>
#include <utility>

#include "platform/console_log.h"
#include "platform/event_loop.h"
#include "service/service.h"
#include "service/socket_listener.h"

namespace probeview::bench {

namespace {

using std::chrono::nanoseconds;

// How often the source looks at the clock; what has become due in between leaves at once.
constexpr nanoseconds longestTurn = std::chrono::milliseconds(1);

class SteadySource final : public MetricSource {
 public:
  explicit SteadySource(const SteadyService& settings)
      : settings_(settings),
        interval_(std::max(longestTurn, nanoseconds(static_cast<std::int64_t>(1e9 / settings.perSecond)))) {}

  std::string_view origin() const override { return "bench"; }
  std::vector<std::int64_t> metrics() const override {
    std::set<std::int64_t> metrics;
    for (const MetricSample& sample : settings_.stream) metrics.insert(sample.metricId);
    return {metrics.begin(), metrics.end()};
  }
  void start(const SourceContext& context, MetricSink& sink) override {
    context_.emplace(context);
    sink_ = &sink;
  }
  void stop() override { timer_.reset(); }
  void setPlan(const std::optional<MetricPlan>&) override {}
  void setListening(bool listening) override {
    timer_.reset();
    if (!listening) return;
    begin_ = context_->clock.monotonicTime();
    emittedBefore_ = emitted_;
    timer_ = context_->scheduler.every(interval_, [this] { turn(); });
  }
  bool query(std::int64_t) override { return false; }

 private:
  // By the clock and not by the turn: a turn that comes late makes up for what it missed.
  void turn() {
    const double seconds = std::chrono::duration<double>(context_->clock.monotonicTime() - begin_).count();
    const auto due =
        std::min(settings_.most, emittedBefore_ + static_cast<std::uint64_t>(seconds * settings_.perSecond));
    while (emitted_ < due) {
      const MetricSample& sample = settings_.stream[emitted_++ % settings_.stream.size()];
      const auto now = context_->clock.monotonicTime().count();
      sink_->emit({.metricId = sample.metricId,
                   .payload = sample.payload,
                   .time = std::chrono::milliseconds(now),
                   .origin = {}});
    }
    if (emitted_ == settings_.most) timer_.reset();
  }

  const SteadyService& settings_;
  const nanoseconds interval_;
  std::optional<SourceContext> context_;
  MetricSink* sink_ = nullptr;
  ScheduledTaskHandle timer_;
  nanoseconds begin_{};
  std::uint64_t emitted_ = 0;
  std::uint64_t emittedBefore_ = 0;
};

}  // namespace

int SteadyService::serve() const {
  EventLoop loop;
  loop.onSignals({SIGTERM}, [&loop](int) { loop.stop(); });
  ConsoleLog sink(STDERR_FILENO);
  ServiceLog log(sink, LogLevel::Warning);
  ListeningSocket::Result opened = ListeningSocket::make(socket);
  if (!opened.socket) {
    log.write(LogLevel::Error, opened.error);
    return 1;
  }
  Service service(loop, log, {});
  service.addSource(std::make_unique<SteadySource>(*this));
  SocketListener listener(
      loop, log, std::move(opened.socket), peerCredentials,
      [&service](std::unique_ptr<radix::Link> link, Peer peer) { service.accept(std::move(link), std::move(peer)); });
  if (!listener.start()) return 1;
  loop.run();
  return 0;
}

}  // namespace probeview::bench
