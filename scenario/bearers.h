// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "messages/nas_messages.h"
#include "scenario/facts.h"
#include "scenario/random.h"

namespace probeview::scenario {

using AddressType = BearerContext::PdpType;

// One packet data connection. Addresses are of the blocks set aside for documentation (RFC 5737, RFC 3849).
struct Bearer {
  unsigned connection = 0;   // the number by which the phone's applications know it
  unsigned accessPoint = 0;  // NSAPI, or EPS bearer identity: 5 to 15
  std::string name;          // of the access point
  AddressType::Value type = AddressType::PDP_TYPE_IPv4;
  std::vector<std::uint8_t> address;  // 4, 16 or 20 bytes
  AddressType::Value primaryDnsType = AddressType::PDP_TYPE_IPv4;
  std::vector<std::uint8_t> primaryDns;
  AddressType::Value secondaryDnsType = AddressType::PDP_TYPE_IPv4;
  std::vector<std::uint8_t> secondaryDns;
  bool keepsAddress = false;  // when the technology changes
};

// The packet data connections: one for the internet as long as the phone is registered, one for voice where there is
// voice over IMS, one for messages or positioning now and then.
class Bearers {
 public:
  explicit Bearers(std::uint64_t seed) : random_(seed, 4) {}

  const std::vector<Bearer>& active() const { return active_; }

  // attaches: how often the phone has attached to EPS, each time with new addresses.
  void advance(Milliseconds now, unsigned attaches, bool packetService, bool voiceOverIms, Facts& facts);

 private:
  Bearer make(unsigned connection, const std::string& name, AddressType::Value type);
  bool has(const std::string& name) const;
  void drop(const std::string& name);

  Random random_;
  std::vector<Bearer> active_;
  unsigned attaches_ = 0;
  Milliseconds extraAt_ = 4000;
  bool extraOn_ = false;
  bool extraIsMessages_ = false;
};

}  // namespace probeview::scenario
