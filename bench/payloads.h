// SPDX-License-Identifier: Apache-2.0
//
// What is measured: the same bytes for every peer.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace probeview::bench {

struct Payload {
  std::string_view message;  // the class
  std::vector<std::uint8_t> bytes;
};

struct PayloadSet {
  std::string name;  // "a" to "f", "r" for the mixed stream with its fields in reversed order
  std::string title;
  std::vector<Payload> payloads;
};

// A payload of the class, every field present, lists of two; another seed means other values.
std::vector<std::uint8_t> payloadOf(std::string_view message, std::uint64_t seed);

const std::vector<PayloadSet>& payloadSets();
const PayloadSet& payloadSet(std::string_view name);

}  // namespace probeview::bench
