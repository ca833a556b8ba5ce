// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <functional>
#include <iosfwd>
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

  // Why nothing can come, empty when something can; asked before anything is waited for and once more after it. With a
  // reason nothing is printed: it goes to the errors, and the status is 1. So it is when the pages cannot be
  // written, as on a full disk.
  void failWith(std::function<std::string()> reason, std::ostream& errors) {
    failure_ = std::move(reason);
    errors_ = &errors;
  }

  TaskQueue& mainQueue() override { return loop_; }
  Scheduler& scheduler() override { return loop_; }
  // Prints every page that the launch list leads to; where the stack stands on another page, that page alone.
  int run(NavigationStack& navigation, const StatusSource& status) override;

 private:
  // Whether nothing can come; then it has said so.
  bool hasFailed() const;
  // False when nobody reads any more.
  bool printTopPage(const NavigationStack& navigation);
  bool printBelow(NavigationStack& navigation);
  bool write(std::string_view text);

  int fileDescriptor_;
  int trouble_ = 0;  // why writing has failed
  EventLoop loop_;
  std::function<bool()> isFilled_;
  std::function<std::string()> failure_;
  std::ostream* errors_ = nullptr;
};

}  // namespace probeview
