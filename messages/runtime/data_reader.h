// SPDX-License-Identifier: Apache-2.0
//
// Reads wire data, value by value. Messages are decoded by readFrom(); the operations here are for what is no message,
// and are made of the same parts (wire_format.h).
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

#include "messages/runtime/wire_format.h"
#include "values/line_sink.h"

namespace probeview {

class PBCodable;

class PBDataReader {
 public:
  // The payload must outlive the reader. What decoding has to say ("valid metricId tag", "Unknown tag: 13:7") goes to
  // the log, if there is one.
  explicit PBDataReader(std::span<const std::uint8_t> payload, LineSink* log = nullptr) noexcept
      : begin_(payload.empty() ? noData : payload.data()),
        position_(begin_),
        limit_(begin_ + payload.size()),
        log_(log) {}

  std::size_t position() const noexcept { return static_cast<std::size_t>(position_ - begin_); }
  // The position at which reading ends: that of the record being read.
  std::size_t length() const noexcept { return static_cast<std::size_t>(limit_ - begin_); }
  bool hasError() const noexcept { return hasError_; }
  bool hasMoreData() const noexcept { return position_ < limit_ && !hasError_; }
  LineSink* log() const noexcept { return log_; }

  // Past the length: sets the error flag and yields 0.
  std::uint8_t readByte() noexcept;
  // 0 when the data ends inside the varint (sets the error flag) or it runs past ten bytes (does not).
  std::uint64_t readVarint() noexcept;

 private:
  friend class PBCodable;
  friend struct PBReaderOperations;

  // No data has an address too: null means failure wherever a position is returned.
  static constexpr std::uint8_t noData[1] = {};

  const std::uint8_t* begin_;
  const std::uint8_t* position_;
  const std::uint8_t* limit_;
  LineSink* log_;
  bool hasError_ = false;
};

// The limit that a nested record interrupts.
struct PBReaderMark {
  std::size_t length = 0;
};

// A length-delimited value, a view of the payload; empty, with the error flag set, when it runs past the record's end.
std::span<const std::uint8_t> PBReaderReadData(PBDataReader& reader) noexcept;
std::string_view PBReaderReadString(PBDataReader& reader) noexcept;
// Reads a length and limits the reader to that many bytes; false, and no limit set, when they run past the record's
// end.
bool PBReaderPlaceMark(PBDataReader& reader, PBReaderMark& mark) noexcept;
// Ends the nested record: reading goes on behind it, whether all of it was read or not.
void PBReaderRecallMark(PBDataReader& reader, const PBReaderMark& mark) noexcept;
// False, with the error flag set, when the value cannot be skipped.
bool PBReaderSkipValueWithTag(PBDataReader& reader, std::uint32_t fieldNumber, std::uint32_t wireType) noexcept;

}  // namespace probeview
