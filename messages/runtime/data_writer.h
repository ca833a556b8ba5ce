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
  // The same in the middle of writing: the position that has been reached, which may have moved, with that room behind.
  std::uint8_t* reserve(std::uint8_t* position, std::size_t count) {
    if (static_cast<std::size_t>(buffer_.data() + buffer_.size() - position) >= count) return position;
    commit(position);
    return reserve(count);
  }
  void commit(const std::uint8_t* end) noexcept { size_ = offsetOf(end); }
  std::size_t offsetOf(const std::uint8_t* position) const noexcept {
    return static_cast<std::size_t>(position - buffer_.data());
  }
  // Closes a length-delimited record that began at the offset, with one byte kept free for its length, and ends at the
  // position. Returns the position behind the record, which may have moved.
  std::uint8_t* closeRecord(std::uint8_t* position, std::size_t offset) {
    const std::size_t length = offsetOf(position) - offset - 1;
    // Most records are shorter than 128 bytes and their length fits where it was left room.
    if (length >= 0x80) return closeLongRecord(position, offset);
    buffer_[offset] = static_cast<std::uint8_t>(length);
    return position;
  }

 private:
  void grow(std::size_t count);
  std::uint8_t* closeLongRecord(std::uint8_t* position, std::size_t offset);

  std::vector<std::uint8_t> buffer_;  // its size is the room that there is
  std::size_t size_ = 0;
};

// Written in place of a field number, a submessage's or a record's too: the value stands without a key, as the elements
// of a packed record do.
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
