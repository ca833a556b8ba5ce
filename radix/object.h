// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "radix/client.h"

namespace radix::client {

// A typed key and value message as the service sends it.
class Object {
 public:
  explicit Object(probeview::Dictionary content) : content_(std::move(content)) {}
  const probeview::Dictionary& content() const { return content_; }

 private:
  probeview::Dictionary content_;
};

}  // namespace radix::client
