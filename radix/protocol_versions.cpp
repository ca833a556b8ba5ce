// SPDX-License-Identifier: Apache-2.0
#include "radix/protocol_versions.h"

namespace radix {

std::optional<std::string> versionTrouble(const ProtocolSide& own, const ProtocolSide& peer) {
  const bool isOwnTooOld = own.versions.spoken < peer.versions.oldest;
  const bool isPeerTooOld = peer.versions.spoken < own.versions.oldest;
  if (!isOwnTooOld && !isPeerTooOld) return std::nullopt;
  std::string text(peer.name);
  text += " speaks version " + std::to_string(peer.versions.spoken) + " of the protocol and needs " +
          std::to_string(peer.versions.oldest) + ", this ";
  text += own.name;
  text += " speaks " + std::to_string(own.versions.spoken) + " and needs " + std::to_string(own.versions.oldest) +
          ": update the ";
  text += isOwnTooOld ? own.name : peer.name;
  return text;
}

}  // namespace radix
