// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <memory>
#include <utility>

#include "platform/task_queue.h"
#include "radix/link.h"

namespace radix {

// The two ends of a connection inside one process, both on the queue's thread. Each direction has room for as many
// frames as the capacity says, as a socket has its buffer.
std::pair<std::unique_ptr<Link>, std::unique_ptr<Link>> makeInProcessLinks(probeview::TaskQueue& queue,
                                                                           std::size_t capacity = 256);

}  // namespace radix
