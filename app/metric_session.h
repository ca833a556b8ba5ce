// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "app/fill_watch.h"
#include "app/root_navigation_controller.h"
#include "platform/detachable_queue.h"
#include "ui/front.h"
#include "ui/status_line.h"

namespace probeview {

// A metric session of this process, whatever shows it: the wrapper, the store and the root controller, made on the
// front's main queue. One per process, because wrapper and store are. Another console or system log is named before.
// Main thread.
class MetricSession {
 public:
  // Names the front's queue as the program's main queue; the front must outlive the session.
  explicit MetricSession(Front& front);
  // The wrapper goes on receiving until the process has ended; nothing of it reaches the front's queue any more.
  ~MetricSession();

  RootNavigationController& navigation() { return navigation_; }
  // Why the page on top moves or stands still. The session must outlive it.
  StatusSource statusSource() const;
  // Why the service has never been there, for people; empty once it has.
  std::string serviceTrouble() const;
  // Whether the store has got what there is to get; to be asked often.
  bool isFilled() { return fillWatch_.isFilled(); }

 private:
  DetachableQueue& mainQueue_;
  RootNavigationController navigation_;
  StatusLine statusLine_;
  FillWatch fillWatch_;
};

}  // namespace probeview
