// SPDX-License-Identifier: Apache-2.0
//
// What the terminal's screen says besides the pages, and how it says it where only ASCII can be shown. Pure: knows
// widths, no terminal.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "ui/status.h"

namespace probeview::terminal {

enum class CharacterSet : std::uint8_t { Unicode, Ascii };

// What a locale whose encoding bears that name (nl_langinfo(CODESET)) can show.
CharacterSet characterSetOf(std::string_view encoding);

// The text in ASCII, of the same width: our own marks by what is most like them, what has no likeness by "?".
std::wstring inAscii(std::wstring_view text);

// One character wide.
wchar_t statusMark(Status::Kind kind, CharacterSet characterSet);

// The keys that matter most, in the widest form that fits into the width; empty where none does.
std::wstring keyHints(bool canGoBack, int width);

// A line of the list of keys; what is left of the column and what is right of it. Both empty: a blank line.
struct HelpLine {
  std::wstring sign;
  std::wstring meaning;
};
inline constexpr int helpColumn = 17;
// All keys, then what the marks of the status line mean.
std::vector<HelpLine> helpLines(CharacterSet characterSet);

}  // namespace probeview::terminal
