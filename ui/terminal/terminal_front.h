// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "platform/event_loop.h"
#include "ui/front.h"
#include "ui/terminal/list_view.h"
#include "ui/terminal/screen_text.h"

namespace probeview::terminal {

// Shows the pages in the terminal of standard input and output. Draws when a key is pressed, a page reloads, the status
// line is due or the size changes, and sleeps otherwise. Gives the terminal back as it was when it ends, and also when
// the program is stopped by a signal or by a broken contract.
//
//   ↑ ↓ Page-Up Page-Down Home End   move        Return →     open
//   Esc Backspace ←                  back        q Ctrl-C     quit
//   ?                                all keys, until the next key
class TerminalFront final : public Front {
 public:
  // Make it before other threads start, so that signals reach it. Null, with the reason, where there is no terminal.
  // Where the encoding is not UTF-8, everything is drawn in ASCII.
  static std::unique_ptr<TerminalFront> make(std::string& error, std::string_view encoding = localeEncoding());
  // The name of the encoding that the environment's locale asks for. Takes over the locale's characters.
  static std::string localeEncoding();
  ~TerminalFront() override;

  TaskQueue& mainQueue() override { return loop_; }
  Scheduler& scheduler() override { return loop_; }
  int run(NavigationStack& navigation, const StatusSource& status) override;

 private:
  class Views;

  explicit TerminalFront(CharacterSet characterSet);
  void readKeys();
  void handleKey(int key);
  void resize();
  void draw();
  void drawLine(int y) const;
  void drawPage(const ListView& view) const;
  void drawKeys() const;
  void drawStatus(int y) const;
  void write(int line, int column, std::wstring_view text) const;

  const CharacterSet characterSet_;
  EventLoop loop_;
  NavigationStack* navigation_ = nullptr;
  std::unique_ptr<Views> views_;
  StatusSource status_;
  bool showsKeys_ = false;
};

}  // namespace probeview::terminal
