// SPDX-License-Identifier: Apache-2.0
//
// How the dictionaries of commands and replies stand in their frames.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <vector>

#include "values/dictionary.h"

namespace radix {

// With its order and the exact type of each value.
std::vector<std::uint8_t> encodeDictionary(const probeview::Dictionary& dictionary);
// Entries of types that the reader does not know are left out. Absent when the bytes are no dictionary, or one nested
// deeper than anybody needs.
std::optional<probeview::Dictionary> decodeDictionary(std::span<const std::uint8_t> bytes);

}  // namespace radix
