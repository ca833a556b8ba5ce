// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstring>
#include <string>
#include <string_view>

namespace probeview {

// Writes to the end of a text through a plain pointer, which is what makes printing fast. What is written is collected
// here and handed over a buffer at a time. Whoever writes holds the position: it asks for room, writes at most that
// much, and goes on at the position behind it.
class TextWriter {
 public:
  explicit TextWriter(std::string& out) noexcept : out_(out) {}
  TextWriter(const TextWriter&) = delete;
  TextWriter& operator=(const TextWriter&) = delete;

  char* begin() noexcept { return buffer_; }
  void end(const char* position) { out_.append(buffer_, static_cast<std::size_t>(position - buffer_)); }

  // This much may be written behind whatever found room, without asking: a separator.
  static constexpr std::size_t spare = 2;
  // The longest text that putShort() writes where it stands.
  static constexpr std::size_t longestShort = 32;

  // Room for that many characters more, behind the position that it returns.
  template <std::size_t Count>
  [[gnu::always_inline]] char* room(char* position) {
    static_assert(Count + spare <= size);
    if (position > buffer_ + (size - spare - Count)) [[unlikely]]
      return handOver(position);
    return position;
  }

  // A text of any length.
  [[gnu::noinline]] char* put(char* position, std::string_view text) {
    if (text.size() > roomAt(position)) position = handOver(position);
    if (text.size() > roomAt(position)) {
      out_ += text;
    } else if (!text.empty()) {
      std::memcpy(position, text.data(), text.size());
      position += text.size();
    }
    return position;
  }
  // The same for keys and names, most of which are short: copied as two pieces that overlap, without a call. There is
  // room for longestShort.
  [[gnu::always_inline]] char* putShort(char* position, std::string_view text) {
    const std::size_t length = text.size();
    if (length - 16 <= 16) {
      copyBothEnds<16>(position, text);
    } else if (length - 8 <= 8) {
      copyBothEnds<8>(position, text);
    } else if (length - 4 <= 4) {
      copyBothEnds<4>(position, text);
    } else {
      return put(position, text);
    }
    return position + length;
  }

 private:
  // The longest real number fits in, and most lines.
  static constexpr std::size_t size = 4096;

  std::size_t roomAt(const char* position) const noexcept {
    return static_cast<std::size_t>(buffer_ + size - spare - position);
  }
  [[gnu::noinline]] char* handOver(const char* position) {
    end(position);
    return buffer_;
  }
  template <std::size_t Piece>
  static void copyBothEnds(char* to, std::string_view text) {
    std::memcpy(to, text.data(), Piece);
    std::memcpy(to + text.size() - Piece, text.data() + text.size() - Piece, Piece);
  }

  std::string& out_;
  char buffer_[size];
};

}  // namespace probeview
