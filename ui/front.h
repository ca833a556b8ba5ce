// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>

#include "platform/task_queue.h"
#include "ui/navigation_stack.h"
#include "ui/status.h"

namespace probeview {

// The one quiet line below the list, outside it, about the page on top of the stack: asked anew every second
// (StatusLine::refreshInterval) and whenever another page comes on top.
using StatusSource = std::function<Status()>;

// What shows the pages: a window, a terminal, plain text. It brings the event loop, whose queue is the program's main
// queue; it is made before the session and outlives it. Main thread.
class Front {
 public:
  virtual ~Front() = default;
  virtual TaskQueue& mainQueue() = 0;
  virtual Scheduler& scheduler() = 0;
  // Shows the stack's pages until the person leaves. The program's exit status.
  virtual int run(NavigationStack& navigation, const StatusSource& status) = 0;
};

}  // namespace probeview
