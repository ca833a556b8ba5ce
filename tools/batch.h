// SPDX-License-Identifier: Apache-2.0
//
// Sessions with another program: a line in, a line of JSON out, flushed at once, so that the other end can wait for its
// answer. Shared by every subcommand that has --batch.
#pragma once

#include <cstddef>
#include <cstdint>
#include <iosfwd>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "values/line_sink.h"

namespace probeview {

// Takes lines apart. A line may hold any bytes; one of more than batchLineLengthLimit is read past without being kept.
inline constexpr std::size_t batchLineLengthLimit = 64u << 20;

class BatchInput {
 public:
  explicit BatchInput(std::istream& input, std::size_t lineLengthLimit = batchLineLengthLimit)
      : input_(input), lineLengthLimit_(lineLengthLimit) {}

  // The next line that is neither blank nor a comment (its first character is '#'), without its line end; false at the
  // end of the input. A last line needs no line end.
  bool next();
  // Valid until the next call of next().
  std::string_view line() const { return line_; }
  // The line was longer than the limit; line() is empty.
  bool tooLong() const { return tooLong_; }

 private:
  bool readLine();

  std::istream& input_;
  std::size_t lineLengthLimit_;
  std::string line_;
  bool tooLong_ = false;
};

// Writes lines of JSON, each flushed.
class BatchOutput {
 public:
  explicit BatchOutput(std::ostream& output) : output_(output) {}
  void line(std::string_view json);
  // {"error":…}
  void error(std::string_view what);
  // Nobody reads any more.
  bool closed() const;

 private:
  std::ostream& output_;
};

// Keeps lines, for an answer that carries them.
class CollectedLines final : public LineSink {
 public:
  void line(std::string_view text) override { lines_.emplace_back(text); }
  const std::vector<std::string>& lines() const { return lines_; }
  void clear() { lines_.clear(); }

 private:
  std::vector<std::string> lines_;
};
// As an array of strings, from the line with that index on.
void appendJson(const CollectedLines& lines, std::string& out, std::size_t first = 0);

// Splits at blanks and tabs; none of the words is empty. A carriage return is a blank, too. No more words than
// mostWords are returned: no command takes as many, and a line can have millions.
inline constexpr std::size_t mostWords = 8;
std::vector<std::string_view> splitWords(std::string_view line);

// Bytes from hexadecimal digits in either case; "-" is no bytes at all. Absent: an odd number of digits, or another
// character.
std::optional<std::vector<std::uint8_t>> parseHex(std::string_view text);

}  // namespace probeview
