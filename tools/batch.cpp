// SPDX-License-Identifier: Apache-2.0
#include "tools/batch.h"

#include <istream>
#include <limits>
#include <ostream>

#include "values/json.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

constexpr bool isBlank(char character) { return character == ' ' || character == '\t' || character == '\r'; }

int digitValue(char digit) {
  if (digit >= '0' && digit <= '9') return digit - '0';
  if (digit >= 'a' && digit <= 'f') return digit - 'a' + 10;
  if (digit >= 'A' && digit <= 'F') return digit - 'A' + 10;
  return -1;
}

}  // namespace

bool BatchInput::next() {
  while (readLine()) {
    if (tooLong_) return true;
    const std::size_t first = line_.find_first_not_of(" \t\r");
    if (first != std::string::npos && line_[0] != '#') return true;
  }
  return false;
}

bool BatchInput::readLine() {
  line_.clear();
  tooLong_ = false;
  // Straight from the buffer: a line that is too long is never held in memory.
  std::streambuf& buffer = *input_.rdbuf();
  using Traits = std::char_traits<char>;
  bool any = false;
  while (true) {
    const int character = buffer.sbumpc();
    if (Traits::eq_int_type(character, Traits::eof())) return any;
    any = true;
    if (character == '\n') return true;
    if (tooLong_) continue;
    if (line_.size() == lineLengthLimit_) {
      tooLong_ = true;
      line_.clear();
      line_.shrink_to_fit();
      continue;
    }
    line_ += Traits::to_char_type(character);
  }
}

void BatchOutput::line(std::string_view json) {
  output_ << json << '\n';
  output_.flush();
}

void BatchOutput::error(std::string_view what) {
  std::string json = "{\"error\":";
  appendJsonString(what, json);
  json += '}';
  line(json);
}

bool BatchOutput::closed() const { return !output_.good(); }

void appendJson(const CollectedLines& lines, std::string& out, std::size_t first) {
  out += '[';
  for (std::size_t index = first; index < lines.lines().size(); ++index) {
    if (index > first) out += ',';
    appendJsonString(lines.lines()[index], out);
  }
  out += ']';
}

std::vector<std::string_view> splitWords(std::string_view line) {
  std::vector<std::string_view> words;
  std::size_t begin = 0;
  while (true) {
    while (begin < line.size() && isBlank(line[begin])) ++begin;
    if (begin == line.size() || words.size() == mostWords) return words;
    std::size_t end = begin;
    while (end < line.size() && !isBlank(line[end])) ++end;
    words.push_back(line.substr(begin, end - begin));
    begin = end;
  }
}

std::optional<std::vector<std::uint8_t>> parseHex(std::string_view text) {
  std::vector<std::uint8_t> bytes;
  if (text == "-") return bytes;
  if (text.empty() || text.size() % 2 != 0) return std::nullopt;
  bytes.reserve(text.size() / 2);
  for (std::size_t index = 0; index < text.size(); index += 2) {
    const int high = digitValue(text[index]);
    const int low = digitValue(text[index + 1]);
    if (high < 0 || low < 0) return std::nullopt;
    bytes.push_back(static_cast<std::uint8_t>(high << 4 | low));
  }
  return bytes;
}

}  // namespace probeview
