// SPDX-License-Identifier: Apache-2.0
//
// Collects wire data. Messages are encoded by writeTo(); the operations here are for what is no message, and are made
// of the same parts (wire_format.h).
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "messages/runtime/wire_format.h"

namespace probeview {

class PBCodable;

class PBDataWriter {
 public:
  // What has been written so far; valid until the next write.
  std::span<const std::uint8_t> bytes() const noexcept { return {buffer_.data(), size_}; }
  std::size_t size() const noexcept { return size_; }
  // Hands the bytes over and begins anew.
  std::vector<std::uint8_t> takeBytes();
  // Begins anew, keeping the memory.
  void clear() noexcept { size_ = 0; }

  // Where the next bytes go, with room for that many. What is written there counts once committed.
  std::uint8_t* reserve(std::size_t count) {
    if (buffer_.size() - size_ < count) grow(count);
    return buffer_.data() + size_;
  }
  void commit(const std::uint8_t* end) noexcept { size_ = static_cast<std::size_t>(end - buffer_.data()); }
  // Closes a length-delimited record that began at the offset with one byte kept free for its length.
  void closeRecord(std::size_t offset);

 private:
  void grow(std::size_t count);

  std::vector<std::uint8_t> buffer_;  // its size is the room that there is
  std::size_t size_ = 0;
};

// Written in place of a field number: the value stands without a key, as the elements of a packed record do.
inline constexpr std::uint32_t PBDataWriterNoField = 0xFFFFFFFF;

void PBDataWriterWriteUint64Field(PBDataWriter& writer, std::uint64_t value, std::uint32_t fieldNumber);
void PBDataWriterWriteUint32Field(PBDataWriter& writer, std::uint32_t value, std::uint32_t fieldNumber);
void PBDataWriterWriteInt32Field(PBDataWriter& writer, std::int32_t value, std::uint32_t fieldNumber);
void PBDataWriterWriteSint32Field(PBDataWriter& writer, std::int32_t value, std::uint32_t fieldNumber);
void PBDataWriterWriteBOOLField(PBDataWriter& writer, bool value, std::uint32_t fieldNumber);
void PBDataWriterWriteDataField(PBDataWriter& writer, std::span<const std::uint8_t> value, std::uint32_t fieldNumber);
void PBDataWriterWriteStringField(PBDataWriter& writer, std::string_view value, std::uint32_t fieldNumber);
void PBDataWriterWriteSubmessage(PBDataWriter& writer, const PBCodable& message, std::uint32_t fieldNumber);

// An open length-delimited record; its length is filled in when it is closed.
struct PBWriterMark {
  std::size_t offset = 0;
};
void PBDataWriterPlaceMark(PBDataWriter& writer, PBWriterMark& mark, std::uint32_t fieldNumber);
void PBDataWriterRecallMark(PBDataWriter& writer, const PBWriterMark& mark);

}  // namespace probeview
