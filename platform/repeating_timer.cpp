// SPDX-License-Identifier: Apache-2.0
#include "platform/repeating_timer.h"

#include <utility>

namespace probeview {

RepeatingTimer::RepeatingTimer(Scheduler& scheduler, std::chrono::nanoseconds interval, Task action)
    : scheduled_(scheduler.every(interval, std::move(action))) {}

}  // namespace probeview
