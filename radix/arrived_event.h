// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstddef>
#include <optional>

#include "radix/client.h"
#include "radix/frames.h"
#include "values/dictionary.h"

namespace radix::client {

// An event on its way from the connection to its handler. It is made into what the handler is given as soon as it has
// come, and from then on handed on and never copied.
struct ArrivedEvent {
  EventKind kind = EventKind::Metric;
  Group group = 0;
  probeview::Dictionary content{};
  std::size_t foreignBytes = 0;  // how much of it is payload and origin, whose size others choose

  // All that it holds.
  std::size_t size() const {
    return sizeof *this + content.size() * sizeof(probeview::Dictionary::Entry) + foreignBytes;
  }
};

// The age is that of the record when it left the service, if the service says it.
ArrivedEvent arrivedEvent(const Event& event, std::optional<std::chrono::milliseconds> age);
// The event as it is handed over, so long after it has come; the hold goes with it.
ObjectHandle objectOf(ArrivedEvent event, std::chrono::nanoseconds waited, std::shared_ptr<const void> hold);

}  // namespace radix::client
