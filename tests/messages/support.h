// SPDX-License-Identifier: Apache-2.0
//
// What the tests of messages share: bytes from hexadecimal, a log that remembers, encoding and decoding in one call.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "messages/runtime/codable.h"
#include "messages/runtime/data_reader.h"
#include "messages/runtime/data_writer.h"
#include "values/line_sink.h"
#include "values/printer.h"

namespace probeview {

using Bytes = std::vector<std::uint8_t>;

// "08 01" and "0801" alike.
inline Bytes bytesOf(std::string_view hexadecimal) {
  Bytes bytes;
  int digits = 0;
  unsigned value = 0;
  for (const char character : hexadecimal) {
    if (character == ' ') continue;
    const unsigned digit = character <= '9' ? static_cast<unsigned>(character - '0')
                                            : static_cast<unsigned>((character | 0x20) - 'a' + 10);
    value = value << 4 | digit;
    if (++digits == 2) {
      bytes.push_back(static_cast<std::uint8_t>(value));
      digits = 0;
      value = 0;
    }
  }
  return bytes;
}

inline std::string hexOf(std::span<const std::uint8_t> bytes) {
  std::string text;
  appendHex({reinterpret_cast<const char*>(bytes.data()), bytes.size()}, text);
  return text;
}

class LineLog : public LineSink {
 public:
  void line(std::string_view text) override { lines.emplace_back(text); }
  std::vector<std::string> lines;
};

inline bool decode(PBCodable& message, std::span<const std::uint8_t> payload, LineSink* log = nullptr) {
  PBDataReader reader(payload, log);
  return message.readFrom(reader);
}

inline bool decode(PBCodable& message, std::string_view hexadecimal, LineSink* log = nullptr) {
  return decode(message, bytesOf(hexadecimal), log);
}

inline Bytes encoded(const PBCodable& message) {
  PBDataWriter writer;
  message.writeTo(writer);
  return writer.takeBytes();
}

inline std::string encodedHex(const PBCodable& message) { return hexOf(encoded(message)); }

inline std::string shown(const PBCodable& message) { return printed(message.dictionaryRepresentation()); }

}  // namespace probeview
