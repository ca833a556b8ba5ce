// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>

#include "platform/event_loop.h"
#include "radix/link.h"
#include "radix/socket_path.h"

namespace radix {

// Connects to the first socket at which a service answers.
std::unique_ptr<Connector> makeSocketConnector(probeview::EventLoop& loop, SocketSurroundings surroundings);

}  // namespace radix
