// SPDX-License-Identifier: Apache-2.0
//
// A page's rows as lines of character cells. Pure: knows widths, no terminal.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "ui/page_snapshot.h"
#include "ui/snapshot_difference.h"

namespace probeview::terminal {

// UTF-8 as characters, on one line: what would steer the terminal stands as its escape. What is ill-formed, or nothing
// that this system can show, becomes U+FFFD.
std::wstring characters(std::string_view text);
// Columns that the characters take.
int columns(std::wstring_view text);
// Breaks text at its line ends and where it is wider than the width (at blanks where there are any). At least one line.
std::vector<std::wstring> wrapped(std::wstring_view text, int width);
// The text cut to the width, its last character an ellipsis if anything was cut.
std::wstring shortened(std::wstring_view text, int width);

struct LaidOutLine {
  enum class Kind : std::uint8_t { Blank, Header, Row };
  Kind kind = Kind::Blank;
  RowPlace place;  // of a Row line
  std::wstring text;
  std::wstring detail;
  bool disclosure = false;
};

struct ListLayout {
  std::vector<LaidOutLine> lines;
  int detailColumn = 0;  // counted from the start of the text

  // The lines [first, end) of a row; empty when there is no such row.
  struct Extent {
    std::size_t first = 0;
    std::size_t end = 0;
  };
  Extent extentOf(RowPlace place) const;
};

// The width is that of a whole line; rows are indented by two columns and leave two free at the end.
ListLayout layOut(const PageSnapshot& snapshot, int width);

}  // namespace probeview::terminal
