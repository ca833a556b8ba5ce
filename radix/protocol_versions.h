// SPDX-License-Identifier: Apache-2.0
//
// Which versions of the protocol speak with each other. Each side says in its greeting which one it speaks and the
// oldest with which it can still work. Two sides talk when neither is older than the oldest of the other; then both
// keep to what the older of the two knows. Otherwise the service refuses, and the client that is newer than it likes
// goes away; both say which side to update.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace radix {

struct ProtocolVersions {
  std::uint32_t spoken = 1;
  std::uint32_t oldest = 1;
};

// One of the two, as it is called in words: "client" or "service".
struct ProtocolSide {
  std::string_view name;
  ProtocolVersions versions;
};

// Absent when the two talk, else why they do not and what to do: "client speaks version 2 of the protocol and …, this
// service …: update the client". It begins with the peer, so that the caller can put an article before it.
std::optional<std::string> versionTrouble(const ProtocolSide& own, const ProtocolSide& peer);

}  // namespace radix
