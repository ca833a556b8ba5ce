// SPDX-License-Identifier: Apache-2.0
//
// The walks over a message's field table, each written once for all messages. Internal to the runtime.
#pragma once

#include <cstddef>
#include <cstdint>

#include "messages/runtime/codable.h"
#include "messages/runtime/data_reader.h"
#include "messages/runtime/data_writer.h"

namespace probeview {

struct TableWalker {
  // decode.cpp
  static bool decode(PBCodable& message, PBDataReader& reader);
  // encode.cpp
  static void encode(const PBCodable& message, PBDataWriter& writer);
  // contents.cpp; the messages are of the class that the descriptor describes.
  static bool isPresent(const PBCodable& message, const FieldDescriptor& row) noexcept;
  // Nested messages are shared.
  static void copy(PBCodable& target, const PBCodable& source, const MessageDescriptor& descriptor);
  // Nested messages are copied. The target is empty; what it needs comes from the block if there is one.
  static void copyDeep(PBCodable& target, const PBCodable& source, const MessageDescriptor& descriptor, Block* block);
  static void move(PBCodable& target, PBCodable& source, const MessageDescriptor& descriptor) noexcept;
  static void merge(PBCodable& target, const PBCodable& source, const MessageDescriptor& descriptor);
  static bool areEqual(const PBCodable& left, const PBCodable& right, const MessageDescriptor& descriptor) noexcept;
  static std::uint64_t hash(const PBCodable& message, const MessageDescriptor& descriptor) noexcept;

  // The block for all that a decoded or copied message owns.
  static Block& blockOf(PBCodable& message) {
    if (message.block_ == nullptr) message.block_ = Block::make();
    return *message.block_;
  }

 private:
  friend struct FieldRun;
  template <std::size_t KeySize>
  static DecodingProgress decodeRun(PBCodable& message, DecodingProgress progress, const std::uint8_t* limit,
                                    const std::uint8_t* tail) noexcept;
  static DecodingProgress decodeTail(PBCodable& message, DecodingProgress progress, const std::uint8_t* limit) noexcept;
  static DecodingProgress decodeExpected(PBCodable& message, DecodingProgress progress, const std::uint8_t* limit,
                                         const Decoding& decoding) noexcept;
  static const std::uint8_t* decodeRecord(PBCodable& message, const MessageDescriptor& descriptor,
                                          const std::uint8_t* position, const std::uint8_t* limit, Decoding& decoding);
  static const std::uint8_t* decodeOthers(PBCodable& message, const MessageDescriptor& descriptor,
                                          DecodingProgress progress, const std::uint8_t* limit, Decoding& decoding);
  static PBCodable* makeElement(const MessageDescriptor& descriptor, Block& block) {
    return descriptor.makeElement(block.allocate(descriptor.size), block);
  }
};

}  // namespace probeview
