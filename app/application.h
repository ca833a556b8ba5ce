// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>

#include "app/app_delegate.h"
#include "app/metric_session.h"

namespace probeview {

// What is done with the session that has begun, before it is shown.
using BeforeShowing = std::function<void(MetricSession&)>;

// The application's main loop: makes the session and its root controller, lets the delegate hear of the launch, loads
// the controller's view, which begins the session, and shows it on the front until the person leaves. The exit status
// is the front's; 1 when the delegate does not let the application launch.
int applicationMain(ApplicationDelegate& delegate, Front& front, const BeforeShowing& beforeShowing = {});

}  // namespace probeview
