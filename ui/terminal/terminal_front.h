// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "platform/event_loop.h"
#include "ui/front.h"
#include "ui/terminal/list_view.h"

namespace probeview::terminal {

// Shows the pages in the terminal of standard input and output. Draws when a key is pressed, a page reloads, the status
// line is due or the size changes, and sleeps otherwise. Gives the terminal back as it was when it ends, and also when
// the program is stopped by a signal or by a broken contract.
//
//   ↑ ↓ Page-Up Page-Down Home End   move        Return →     open
//   Esc Backspace ←                  back        q Ctrl-C     quit
class TerminalFront final : public Front {
 public:
  // Make it before other threads start, so that signals reach it. Null, with the reason, where there is no terminal.
  static std::unique_ptr<TerminalFront> make(std::string& error);
  ~TerminalFront() override;

  TaskQueue& mainQueue() override { return loop_; }
  Scheduler& scheduler() override { return loop_; }
  int run(NavigationStack& navigation, const StatusText& status) override;

 private:
  class Views;

  TerminalFront();
  void readKeys();
  void handleKey(int key);
  void resize();
  void draw();

  EventLoop loop_;
  NavigationStack* navigation_ = nullptr;
  std::unique_ptr<Views> views_;
  StatusText status_;
};

}  // namespace probeview::terminal
