// SPDX-License-Identifier: Apache-2.0
//
// What the runtime's functions may do with a message and nobody else. Internal to the runtime.
#pragma once

#include <cstdint>

#include "messages/runtime/codable.h"

namespace probeview {

struct MessageInternals {
  // Bit n: the scalar field of number n is present.
  static std::uint64_t& presence(PBCodable& message) noexcept { return message._has; }
  static std::uint64_t presence(const PBCodable& message) noexcept { return message._has; }

  static Block*& block(PBCodable& message) noexcept { return message.block_; }
  // The block for all that a decoded or copied message owns.
  static Block& blockFor(PBCodable& message) {
    if (message.block_ == nullptr) message.block_ = Block::make();
    return *message.block_;
  }
  static void noteOwnedMemory(PBCodable& message) { message.noteOwnedMemory(); }

  // A message of the class that the descriptor describes, in memory of the block.
  static PBCodable* makeElement(const MessageDescriptor& descriptor, Block& block) {
    return descriptor.makeElement(block.allocate(descriptor.size), block);
  }
};

}  // namespace probeview
