// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>

#include "radix/manager.h"
#include "radix/socket_path.h"

namespace radix::client {

// A manager that speaks to the service over its socket, with a thread of its own for the connection.
std::shared_ptr<Manager> makeSocketManager(std::string clientName, std::shared_ptr<probeview::TaskQueue> queue,
                                           SocketSurroundings surroundings, ManagerOptions options = {});

}  // namespace radix::client
