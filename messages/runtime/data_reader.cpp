// SPDX-License-Identifier: Apache-2.0
#include "messages/runtime/data_reader.h"

namespace probeview {

std::uint8_t PBDataReader::readByte() noexcept {
  if (position_ < limit_) return *position_++;
  hasError_ = true;
  return 0;
}

std::uint64_t PBDataReader::readVarint() noexcept {
  const wire::Varint varint = wire::readVarint(position_, limit_);
  hasError_ = hasError_ || varint.next == nullptr;
  position_ = varint.next == nullptr ? limit_ : varint.next;
  return varint.value;
}

// The reader's operations stand outside its class, under the names that they have always had.
struct PBReaderOperations {
  static std::span<const std::uint8_t> readData(PBDataReader& reader) noexcept {
    const std::uint64_t size = reader.readVarint();
    if (reader.hasError_ || size > static_cast<std::uint64_t>(reader.limit_ - reader.position_)) {
      reader.hasError_ = true;
      return {};
    }
    const std::uint8_t* data = reader.position_;
    reader.position_ += size;
    return {data, static_cast<std::size_t>(size)};
  }

  static bool placeMark(PBDataReader& reader, PBReaderMark& mark) noexcept {
    const std::uint64_t size = reader.readVarint();
    if (reader.hasError_ || size > static_cast<std::uint64_t>(reader.limit_ - reader.position_)) {
      reader.hasError_ = true;
      return false;
    }
    mark.length = reader.length();
    reader.limit_ = reader.position_ + size;
    return true;
  }

  static void recallMark(PBDataReader& reader, const PBReaderMark& mark) noexcept {
    reader.position_ = reader.limit_;
    reader.limit_ = reader.begin_ + mark.length;
  }

  static bool skip(PBDataReader& reader, std::uint32_t wireType) noexcept {
    const std::uint8_t* next = wire::skipValue(reader.position_, reader.limit_, wireType);
    if (next == nullptr) {
      reader.hasError_ = true;
      return false;
    }
    reader.position_ = next;
    return true;
  }
};

std::span<const std::uint8_t> PBReaderReadData(PBDataReader& reader) noexcept {
  return PBReaderOperations::readData(reader);
}

std::string_view PBReaderReadString(PBDataReader& reader) noexcept {
  const std::span<const std::uint8_t> data = PBReaderOperations::readData(reader);
  return {reinterpret_cast<const char*>(data.data()), data.size()};
}

bool PBReaderPlaceMark(PBDataReader& reader, PBReaderMark& mark) noexcept {
  return PBReaderOperations::placeMark(reader, mark);
}

void PBReaderRecallMark(PBDataReader& reader, const PBReaderMark& mark) noexcept {
  PBReaderOperations::recallMark(reader, mark);
}

bool PBReaderSkipValueWithTag(PBDataReader& reader, std::uint32_t /*fieldNumber*/, std::uint32_t wireType) noexcept {
  return PBReaderOperations::skip(reader, wireType);
}

}  // namespace probeview
