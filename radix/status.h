// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

namespace radix {

// The statuses of commands. Numbers go over the wire: they are only ever added to.
enum class Status : std::int32_t {
  Ok = 0,
  UnknownCommand = 1,
  BadArguments = 2,
  BadConfiguration = 3,  // the message has line and column
  CannotFill = 4,        // no source, or no trigger, for what was asked
  TooLarge = 5,          // past the limit of a frame
  NoService = 6,         // nobody answers at the socket, or no longer
  TimedOut = 7,          // the service did not answer in time
  VersionMismatch = 8,   // the two sides do not understand each other
  NotPermitted = 9,      // this user may not connect
  TooMany = 10,          // clients, or commands at once
  MalformedFrame = 11,   // what was sent is no frame
};

}  // namespace radix
