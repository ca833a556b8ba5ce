// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <memory>
#include <string>

#include "radix/client.h"
#include "service/service.h"
#include "tests/service/harness/scripted_source.h"

namespace probeview {

// A service with one scripted source, and managers that are its clients. What a test may do is the same in process and
// over the socket, so that one test proves both.
class TestService {
 public:
  using Script = ScriptedSource::Script;

  virtual ~TestService() = default;

  // A new client of the service, whose handlers run on queue().
  virtual radix::client::ManagerHandle manager(const std::string& clientName,
                                               radix::client::ManagerOptions options = {}) = 0;
  virtual std::shared_ptr<TaskQueue> queue() = 0;
  // Lets everybody work until the condition holds; whether it came to that.
  virtual bool until(const std::function<bool()>& condition) = 0;
  // Lets everybody work until nothing is left to do for what has been said so far.
  virtual void settle() = 0;
  // Runs the task where the service lives, and waits for it. For the source's script and for the service itself.
  virtual void onService(const std::function<void()>& task) = 0;
  // Ends the service as if its process had died; its clients stay.
  virtual void kill() = 0;
  // Starts a new service at the same place, with the same script.
  virtual void restart() = 0;
  // Connects by hand, to say what no manager would say. The link lives on queue()'s thread.
  virtual std::unique_ptr<radix::Link> rawLink() = 0;

  // Where programs find it; empty in process.
  virtual std::string socketPath() const = 0;
  virtual Service& service() = 0;
  Script& script() { return *script_; }
  // To be read on the service's thread.
  KeptLines& log() { return log_; }

  void emit(std::int64_t metricId, std::vector<std::uint8_t> payload, std::chrono::milliseconds time = {}) {
    onService([&] { script_->emit(metricId, payload, time); });
  }

 protected:
  std::shared_ptr<Script> script_ = std::make_shared<Script>();
  KeptLines log_;
  Service::Settings settings_;
};

std::unique_ptr<TestService> makeInProcessService(Service::Settings settings = {});
std::unique_ptr<TestService> makeSocketService(Service::Settings settings = {});

}  // namespace probeview
