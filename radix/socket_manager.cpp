// SPDX-License-Identifier: Apache-2.0
#include "radix/socket_manager.h"

#include <system_error>
#include <utility>

#include "platform/loop_thread.h"
#include "radix/connection_manager.h"
#include "radix/socket_connector.h"

namespace radix::client {

namespace {

using probeview::Dictionary;
using probeview::TaskQueue;

class SocketManager final : public Manager {
 public:
  SocketManager(std::string clientName, std::shared_ptr<TaskQueue> queue, SocketSurroundings surroundings,
                ManagerOptions options)
      : thread_("radix.client"),
        manager_(makeConnectionManager(thread_.loop(), makeSocketConnector(thread_.loop(), std::move(surroundings)),
                                       {.clientName = std::move(clientName), .observes = options.observes},
                                       std::move(queue))) {}

  Result performCommand(std::string_view command, const Dictionary& arguments, ObjectHandle& reply) override {
    return manager_->performCommand(command, arguments, reply);
  }
  void registerEventHandler(std::string_view event, EventHandler handler) override {
    manager_->registerEventHandler(event, std::move(handler));
  }
  void eventsOn() override { manager_->eventsOn(); }
  void eventsOff() override { manager_->eventsOff(); }
  ConnectionState connection() const override { return manager_->connection(); }

 private:
  // The thread goes last: the manager leaves its connection there to be closed.
  probeview::LoopThread thread_;
  std::shared_ptr<Manager> manager_;
};

// Stands in when the system gives not even what a connection needs. It answers like one whose service is away.
class UnableManager final : public Manager {
 public:
  explicit UnableManager(std::string trouble) { state_.trouble = std::move(trouble); }
  Result performCommand(std::string_view, const Dictionary&, ObjectHandle&) override {
    return {static_cast<std::int32_t>(Status::NoService), state_.trouble};
  }
  void registerEventHandler(std::string_view, EventHandler) override {}
  void eventsOn() override {}
  void eventsOff() override {}
  ConnectionState connection() const override { return state_; }

 private:
  ConnectionState state_;
};

}  // namespace

std::shared_ptr<Manager> makeSocketManager(std::string clientName, std::shared_ptr<TaskQueue> queue,
                                           SocketSurroundings surroundings, ManagerOptions options) {
  try {
    return std::make_shared<SocketManager>(std::move(clientName), std::move(queue), std::move(surroundings), options);
  } catch (const std::system_error& error) {
    return std::make_shared<UnableManager>(std::string("cannot connect to the baseband service: ") + error.what());
  }
}

}  // namespace radix::client
