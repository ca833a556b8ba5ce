// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "radix/client.h"

namespace radix::client {

// A typed key and value message as the service sends it.
class Object {
 public:
  explicit Object(probeview::Dictionary content, EventHold hold = {})
      : content_(std::move(content)), hold_(std::move(hold)) {}
  const probeview::Dictionary& content() const { return content_; }
  const EventHold& hold() const { return hold_; }

 private:
  probeview::Dictionary content_;
  EventHold hold_;
};

}  // namespace radix::client
