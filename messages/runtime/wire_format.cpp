// SPDX-License-Identifier: Apache-2.0
#include "messages/runtime/wire_format.h"

namespace probeview::wire {

Varint readLongVarint(const std::uint8_t* position, const std::uint8_t* limit) noexcept {
  const std::ptrdiff_t available = limit - position;
  if (available >= 8) {
    const Varint varint = readUpToEightBytes(position);
    if (varint.next != nullptr) return varint;
  }
  const int readable = available < static_cast<std::ptrdiff_t>(longestVarint) ? static_cast<int>(available)
                                                                              : static_cast<int>(longestVarint);
  std::uint64_t result = 0;
  for (int index = 0; index < readable; ++index) {
    const std::uint64_t byte = position[index];
    result |= (byte & 0x7F) << (7 * index);
    if (byte < 0x80) return {position + index + 1, result};
  }
  return {readable == static_cast<int>(longestVarint) ? position + longestVarint : nullptr, 0};
}

const std::uint8_t* skipValue(const std::uint8_t* position, const std::uint8_t* limit, std::uint32_t type) noexcept {
  std::uint64_t size = 0;
  switch (static_cast<WireType>(type)) {
    case WireType::Varint:
      return readVarint(position, limit).next;
    case WireType::LengthDelimited: {
      const Varint length = readVarint(position, limit);
      if (length.next == nullptr) return nullptr;
      position = length.next;
      size = length.value;
      break;
    }
    case WireType::Fixed64:
      size = 8;
      break;
    case WireType::Fixed32:
      size = 4;
      break;
    case WireType::StartGroup:
    case WireType::EndGroup:
      return nullptr;
  }
  // The two types that have no name, 6 and 7, come here with nothing to skip.
  if (type > static_cast<std::uint32_t>(WireType::Fixed32)) return nullptr;
  return size <= static_cast<std::uint64_t>(limit - position) ? position + size : nullptr;
}

}  // namespace probeview::wire
