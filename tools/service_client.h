// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <memory>
#include <string>
#include <string_view>

#include "platform/event_loop.h"
#include "radix/client.h"
#include "tools/subcommand.h"

namespace probeview {

// A subcommand's own client of the service, with its events on the subcommand's loop. Main thread.
class ServiceClient {
 public:
  // Throws std::system_error when the system gives no loop.
  explicit ServiceClient(Tool& tool, radix::client::ManagerOptions options = {});

  EventLoop& loop() { return *loop_; }
  // Failure, with the reason written to the tool's errors, when the service refuses or is away. What a service says
  // that does as it was told is written there, too. The subject, such as a file, is what its words are about.
  ExitStatus perform(std::string_view command, const Dictionary& arguments, Dictionary* reply = nullptr,
                     const std::string& subject = {});
  // Has each event handed to the taker and begins to listen.
  void listen(std::function<void(const Dictionary& event)> take);
  // Waits until all events that the service had for this client have been handed over.
  ExitStatus drain();
  radix::client::ConnectionState connection() const { return radix::client::Connection(manager_); }

 private:
  Tool& tool_;
  std::shared_ptr<EventLoop> loop_;
  radix::client::ManagerHandle manager_;
};

}  // namespace probeview
