// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>

#include "platform/event_loop.h"
#include "platform/file_descriptor.h"
#include "radix/link.h"

namespace radix {

// A link over a connected socket of the kind AF_UNIX, SOCK_SEQPACKET, on the loop's thread. The socket must not block.
std::unique_ptr<Link> makeSocketLink(probeview::EventLoop& loop, probeview::FileDescriptor socket);

}  // namespace radix
