// SPDX-License-Identifier: Apache-2.0
#include "radix/client.h"

#include "radix/manager.h"
#include "radix/object.h"
#include "radix/socket_manager.h"
#include "radix/socket_path.h"

namespace radix::client {

const probeview::Dictionary& nativeDictionary(const Object& object) { return object.content(); }

ObjectHandle makeObject(const probeview::Dictionary& dictionary) { return std::make_shared<Object>(dictionary); }

ManagerHandle CreateManager(std::string clientName, std::shared_ptr<probeview::TaskQueue> queue) {
  return CreateManager(std::move(clientName), std::move(queue), ManagerOptions{});
}

ManagerHandle CreateManager(std::string clientName, std::shared_ptr<probeview::TaskQueue> queue,
                            ManagerOptions options) {
  return makeSocketManager(std::move(clientName), std::move(queue), SocketSurroundings::ofThisProcess(), options);
}

Result PerformCommand(const ManagerHandle& manager, std::string_view command, const probeview::Dictionary& arguments,
                      ObjectHandle& reply) {
  return manager->performCommand(command, arguments, reply);
}

void RegisterEventHandler(const ManagerHandle& manager, std::string_view event, EventHandler handler) {
  manager->registerEventHandler(event, std::move(handler));
}

void EventsOn(const ManagerHandle& manager) { manager->eventsOn(); }

void EventsOff(const ManagerHandle& manager) { manager->eventsOff(); }

ConnectionState Connection(const ManagerHandle& manager) { return manager->connection(); }

}  // namespace radix::client
