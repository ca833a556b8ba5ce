// SPDX-License-Identifier: Apache-2.0
#include "app/metric_session.h"

#include "platform/main_queue.h"

namespace probeview {

namespace {

// Named before the controller, whose properties make the wrapper, is made.
DetachableQueue& nameMainQueue(Front& front) {
  auto* queue = new DetachableQueue(front.mainQueue());
  setMainQueue(*queue, front.scheduler());
  return *queue;
}

}  // namespace

MetricSession::MetricSession(Front& front)
    : mainQueue_(nameMainQueue(front)), fillWatch_(navigation_.myMetricValidator, systemClock(), [this] {
        return navigation_.myRadixWrapper->fillableMetrics();
      }) {}

MetricSession::~MetricSession() { mainQueue_.detach(); }

StatusSource MetricSession::statusSource() const {
  return [this] {
    return statusLine_.status({.service = navigation_.myRadixWrapper->serviceStatus(),
                               .feed = feedOfTopPage(navigation_),
                               .isConfigurationMissing = navigation_.metricFileIsMissing()});
  };
}

std::string MetricSession::serviceTrouble() const {
  const auto connection = navigation_.myRadixWrapper->serviceStatus().connection;
  return connection.everConnected ? std::string() : connection.trouble;
}

}  // namespace probeview
