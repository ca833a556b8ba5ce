// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <utility>

#include "radix/client.h"

namespace radix::client {

// A typed key and value message of the service. An event's holds on to whatever counts the events that wait.
class Object {
 public:
  explicit Object(probeview::Dictionary content, std::shared_ptr<const void> hold = {})
      : content_(std::move(content)), hold_(std::move(hold)) {}
  const probeview::Dictionary& content() const { return content_; }

 private:
  probeview::Dictionary content_;
  std::shared_ptr<const void> hold_;
};

}  // namespace radix::client
