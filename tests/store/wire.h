// SPDX-License-Identifier: Apache-2.0
//
// Payloads by hand: the few lines of the wire format that tests of the store need, apart from our own writer.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace probeview {

class Wire {
 public:
  Wire& varint(std::uint32_t number, std::uint64_t value) {
    put(std::uint64_t{number} << 3);
    put(value);
    return *this;
  }
  // A signed 32-bit number in ZigZag form.
  Wire& sint(std::uint32_t number, std::int32_t value) { return varint(number, zigZag(value)); }
  Wire& bytes(std::uint32_t number, std::string_view content) {
    put(std::uint64_t{number} << 3 | 2);
    put(content.size());
    bytes_.insert(bytes_.end(), content.begin(), content.end());
    return *this;
  }
  Wire& message(std::uint32_t number, const Wire& content) {
    return bytes(number, {reinterpret_cast<const char*>(content.bytes_.data()), content.bytes_.size()});
  }
  Wire& packed(std::uint32_t number, const std::vector<std::uint32_t>& values) {
    Wire content;
    for (const std::uint32_t value : values) content.put(value);
    return message(number, content);
  }
  Wire& packedSigned(std::uint32_t number, const std::vector<std::int32_t>& values) {
    Wire content;
    for (const std::int32_t value : values) content.put(zigZag(value));
    return message(number, content);
  }

  const std::vector<std::uint8_t>& payload() const { return bytes_; }

 private:
  static std::uint32_t zigZag(std::int32_t value) {
    return static_cast<std::uint32_t>(value) << 1 ^ (value < 0 ? 0xFFFFFFFF : 0);
  }
  void put(std::uint64_t value) {
    for (; value >= 0x80; value >>= 7) bytes_.push_back(static_cast<std::uint8_t>(value | 0x80));
    bytes_.push_back(static_cast<std::uint8_t>(value));
  }

  std::vector<std::uint8_t> bytes_;
};

}  // namespace probeview
