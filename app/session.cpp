// SPDX-License-Identifier: Apache-2.0
#include "app/session.h"

#include "platform/main_queue.h"

namespace probeview {

namespace {

// The queue must be named before the controller, whose properties make the wrapper, is made.
RootNavigationController makeController(Front& front) {
  setMainQueue(front.mainQueue(), front.scheduler());
  return RootNavigationController();
}

}  // namespace

Session::Session(Front& front)
    : navigation_(makeController(front)), fillWatch_(navigation_.myMetricValidator, systemClock(), [this] {
        return navigation_.myRadixWrapper->fillableMetrics();
      }) {}

StatusText Session::statusText() const {
  return [this] { return statusLine_.text(navigation_.myRadixWrapper->serviceStatus()); };
}

}  // namespace probeview
