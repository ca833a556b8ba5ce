// SPDX-License-Identifier: Apache-2.0
//
// What stands behind a manager handle. The library's own manager speaks to a service over a socket; tests put their own
// in its place.
#pragma once

#include "radix/client.h"

namespace radix::client {

class Manager {
 public:
  virtual ~Manager() = default;
  virtual Result performCommand(std::string_view command, const probeview::Dictionary& arguments,
                                ObjectHandle& reply) = 0;
  virtual void registerEventHandler(std::string_view event, EventHandler handler) = 0;
  virtual void eventsOn() = 0;
  virtual void eventsOff() = 0;
  virtual ConnectionState connection() const = 0;
};

}  // namespace radix::client
