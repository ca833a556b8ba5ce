// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <memory>
#include <string_view>

#include "app/app_delegate.h"
#include "app/metric_session.h"

namespace probeview {

// The application's main loop: makes the delegate of that class, the session and its root controller, lets the
// delegate hear of the launch, loads the controller's view, which begins the session, and shows it on the front until
// the person leaves. A class name that is not known stops the program. The exit status is the front's.
int applicationMain(std::string_view delegateClassName, Front& front,
                    const std::function<void(MetricSession&)>& beforeShowing = {});

// Null when there is no delegate class of that name.
std::unique_ptr<ApplicationDelegate> makeApplicationDelegate(std::string_view className);

}  // namespace probeview
