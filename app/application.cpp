// SPDX-License-Identifier: Apache-2.0
#include "app/application.h"

#include <string>

#include "platform/fatal_error.h"

namespace probeview {

int applicationMain(std::string_view delegateClassName, Front& front,
                    const std::function<void(MetricSession&)>& beforeShowing) {
  const auto delegate = makeApplicationDelegate(delegateClassName);
  if (!delegate) fatalError("there is no application delegate \"" + std::string(delegateClassName) + "\"");
  MetricSession session(front);
  delegate->window = &front;
  if (!delegate->didFinishLaunchingWithOptions()) return 1;
  session.navigation().viewDidLoad();
  if (beforeShowing) beforeShowing(session);
  delegate->applicationDidBecomeActive();
  const int status = front.run(session.navigation(), session.statusSource());
  delegate->applicationWillTerminate();
  return status;
}

std::unique_ptr<ApplicationDelegate> makeApplicationDelegate(std::string_view className) {
  if (className == "AppDelegate") return std::make_unique<AppDelegate>();
  return nullptr;
}

}  // namespace probeview
