// SPDX-License-Identifier: Apache-2.0
#include "scenario/bearers.h"

#include <algorithm>

namespace probeview::scenario {
namespace {

using Bytes = std::vector<std::uint8_t>;

constexpr unsigned firstAccessPoint = 4;  // identities below 5 are reserved (3GPP TS 24.007, 11.2.3.1.5)
const char* const internetName = "internet.example";
const char* const imsName = "ims";
const char* const messagesName = "mms.example";
const char* const positioningName = "supl.example";

Bytes ipv4(std::uint8_t block, std::uint8_t host) {
  // 192.0.2.0/24 or 198.51.100.0/24
  return block == 192 ? Bytes{192, 0, 2, host} : Bytes{198, 51, 100, host};
}

Bytes ipv6(std::uint16_t network, std::uint64_t host) {
  Bytes bytes{
      0x20, 0x01, 0x0D, 0xB8, 0, 0, static_cast<std::uint8_t>(network >> 8), static_cast<std::uint8_t>(network)};
  for (int shift = 56; shift >= 0; shift -= 8) bytes.push_back(static_cast<std::uint8_t>(host >> shift));
  return bytes;
}

}  // namespace

Bearer Bearers::make(unsigned connection, const std::string& name, AddressType::Value type) {
  Bearer bearer;
  bearer.connection = connection;
  bearer.accessPoint = firstAccessPoint + connection;
  bearer.name = name;
  bearer.type = type;
  const auto host = static_cast<std::uint8_t>(random_.integerBetween(2, 200));
  const auto network = static_cast<std::uint16_t>(random_.integerBetween(0x100, 0xFFF));
  if (type != AddressType::PDP_TYPE_IPv6) bearer.address = ipv4(192, host);
  if (type != AddressType::PDP_TYPE_IPv4) {
    const Bytes six = ipv6(network, random_.next() & 0xFDFFFFFFFFFFFFFFU);
    bearer.address.insert(bearer.address.end(), six.begin(), six.end());
  }
  if (type == AddressType::PDP_TYPE_IPv6) {
    bearer.primaryDnsType = bearer.secondaryDnsType = AddressType::PDP_TYPE_IPv6;
    bearer.primaryDns = ipv6(0, 0x35);
    bearer.secondaryDns = ipv6(1, 0x35);
  } else {
    bearer.primaryDns = ipv4(198, 53);
    bearer.secondaryDns = ipv4(198, 54);
    if (type == AddressType::PDP_TYPE_IPv4v6) {
      bearer.secondaryDnsType = AddressType::PDP_TYPE_IPv6;
      bearer.secondaryDns = ipv6(0, 0x35);
    }
  }
  bearer.keepsAddress = connection == 1;
  return bearer;
}

bool Bearers::has(const std::string& name) const {
  return std::any_of(active_.begin(), active_.end(), [&](const Bearer& bearer) { return bearer.name == name; });
}

void Bearers::drop(const std::string& name) {
  active_.erase(std::remove_if(active_.begin(), active_.end(), [&](const Bearer& b) { return b.name == name; }),
                active_.end());
}

void Bearers::advance(Milliseconds now, unsigned attaches, bool packetService, bool voiceOverIms, Facts& facts) {
  bool changed = false;
  if (attaches != attaches_) {
    attaches_ = attaches;
    active_.clear();
    changed = true;
  }
  if (packetService && attaches_ > 0 && !has(internetName)) {
    active_.insert(active_.begin(), make(1, internetName, AddressType::PDP_TYPE_IPv4v6));
    changed = true;
  }
  const bool wantsIms = packetService && voiceOverIms;
  if (wantsIms != has(imsName)) {
    if (wantsIms) {
      active_.push_back(make(2, imsName, AddressType::PDP_TYPE_IPv6));
    } else {
      drop(imsName);
    }
    changed = true;
  }
  if (packetService && attaches_ > 0 && now >= extraAt_) {
    const char* name = extraIsMessages_ ? messagesName : positioningName;
    if (extraOn_) {
      drop(name);
      extraOn_ = false;
      extraAt_ = now + stepTime * random_.integerBetween(1000, 4000);
    } else {
      extraIsMessages_ = random_.chance(0.5);
      active_.push_back(make(3, extraIsMessages_ ? messagesName : positioningName, AddressType::PDP_TYPE_IPv4));
      extraOn_ = true;
      extraAt_ = now + stepTime * random_.integerBetween(200, 800);
    }
    changed = true;
  }
  if (changed) facts.learn(Fact::Bearers, now);
}

}  // namespace probeview::scenario
