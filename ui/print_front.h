// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <functional>
#include <optional>
#include <string>

#include "platform/event_loop.h"
#include "ui/front.h"

namespace probeview {

// Prints pages once, as plain text, when there is something to print, and ends. Each page has a heading, the titles
// that lead to it. A reader that goes away ends it early and in peace.
class PrintFront final : public Front {
 public:
  // What is waited for at most.
  static constexpr std::chrono::nanoseconds patience = std::chrono::seconds(15);

  // The descriptor stays the caller's. The program must ignore SIGPIPE.
  explicit PrintFront(int fileDescriptor) : fileDescriptor_(fileDescriptor) {}

  // Whether there is nothing more to wait for; asked after every turn of the loop. Without it nothing is waited for.
  void waitUntil(std::function<bool()> isFilled) { isFilled_ = std::move(isFilled); }

  TaskQueue& mainQueue() override { return loop_; }
  Scheduler& scheduler() override { return loop_; }
  // Prints every page that the launch list leads to; where the stack stands on another page, that page alone.
  int run(NavigationStack& navigation, const StatusText& status) override;

 private:
  // False when nobody reads any more.
  bool printTopPage(const NavigationStack& navigation);
  bool printBelow(NavigationStack& navigation);
  bool write(std::string_view text);

  int fileDescriptor_;
  EventLoop loop_;
  std::function<bool()> isFilled_;
};

}  // namespace probeview
