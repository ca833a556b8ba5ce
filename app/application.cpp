// SPDX-License-Identifier: Apache-2.0
#include "app/application.h"

namespace probeview {

int applicationMain(ApplicationDelegate& delegate, Front& front, const BeforeShowing& beforeShowing) {
  MetricSession session(front);
  delegate.window = &front;
  if (!delegate.didFinishLaunchingWithOptions()) return 1;
  session.navigation().viewDidLoad();
  if (beforeShowing) beforeShowing(session);
  delegate.applicationDidBecomeActive();
  const int status = front.run(session.navigation(), session.statusSource());
  delegate.applicationWillTerminate();
  return status;
}

}  // namespace probeview
