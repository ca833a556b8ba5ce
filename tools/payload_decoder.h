// SPDX-License-Identifier: Apache-2.0
//
// Decoding one payload by hand: by the name of its message class, or by the metric that carries it.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "tools/batch.h"
#include "values/dictionary.h"

namespace probeview {

struct DecodedPayload {
  std::string_view className;
  bool ok = false;  // false: it ends too early or holds what cannot be skipped; the rest tells what was decoded
  Dictionary dictionary;
  std::vector<std::uint8_t> reencoded;
  CollectedLines log;  // what the decoder had to say
};

// Where the payload is of no class: why, and, for a person, which names are near ("; did you mean …?", or empty).
struct DecodeResult {
  std::optional<DecodedPayload> payload;
  std::string error;
  std::string hint;
};

// The reference is a class ("KCellularLteRrcState"), a metric ("K_LTE_RRC_STATE") or its identifier, decimal or 0x….
DecodeResult decodePayload(std::string_view reference, std::span<const std::uint8_t> bytes);

}  // namespace probeview
