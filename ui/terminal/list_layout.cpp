// SPDX-License-Identifier: Apache-2.0
#include "ui/terminal/list_layout.h"

#include <wchar.h>

#include <algorithm>

#include "ui/interface_description.h"
#include "values/plain_text.h"

namespace probeview::terminal {

namespace {

constexpr wchar_t replacement = L'\ufffd';
constexpr wchar_t ellipsis = L'…';
constexpr int gap = 2;  // between label and value

int columnsOf(wchar_t character) { return std::max(::wcwidth(character), 0); }

// How many characters of the text fit into the width; at least one, so that there is always a way on.
std::size_t fitting(std::wstring_view text, int width) {
  int used = 0;
  std::size_t count = 0;
  while (count < text.size() && used + columnsOf(text[count]) <= width) used += columnsOf(text[count++]);
  return std::max<std::size_t>(count, 1);
}

// Where to break a line of which so many characters fit: at the last blank (one just past the end is as good), else
// after the last underscore of a field's name, else where the room ends.
std::size_t breakBefore(std::wstring_view line, std::size_t fits) {
  const auto blank = line.substr(0, fits + 1).rfind(L' ');
  if (blank != std::wstring_view::npos && blank > 0) return blank;
  const auto underscore = line.substr(0, fits).rfind(L'_');
  return underscore != std::wstring_view::npos && underscore > 0 ? underscore + 1 : fits;
}

}  // namespace

std::wstring characters(std::string_view text) {
  const std::string shown = onOneLine(text);
  std::wstring out;
  for (std::string_view rest = shown; !rest.empty();) {
    const auto [code, size] = firstCharacter(rest);
    const auto character = static_cast<wchar_t>(code);
    out += ::wcwidth(character) >= 0 ? character : replacement;
    rest.remove_prefix(size);
  }
  return out;
}

int columns(std::wstring_view text) {
  int count = 0;
  for (const auto character : text) count += columnsOf(character);
  return count;
}

std::vector<std::wstring> wrapped(std::wstring_view text, int width) {
  std::vector<std::wstring> lines;
  while (true) {
    const auto lineEnd = std::min(text.find(L'\n'), text.size());
    auto line = text.substr(0, lineEnd);
    while (columns(line) > width) {
      std::size_t count = fitting(line, width);
      count = breakBefore(line, count);
      lines.emplace_back(line.substr(0, count));
      line.remove_prefix(count);
      if (!line.empty() && line.front() == L' ') line.remove_prefix(1);
    }
    if (!line.empty() || lineEnd == 0) lines.emplace_back(line);
    if (lineEnd == text.size()) return lines;
    text.remove_prefix(lineEnd + 1);
  }
}

std::wstring shortened(std::wstring_view text, int width) {
  if (columns(text) <= width) return std::wstring(text);
  if (width < 1) return {};
  std::wstring cut(width == 1 ? std::wstring_view{} : text.substr(0, fitting(text, width - 1)));
  cut += ellipsis;
  return cut;
}

ListLayout::Extent ListLayout::extentOf(RowPlace place) const {
  const auto isOfRow = [&](const LaidOutLine& line) {
    return line.kind == LaidOutLine::Kind::Row && line.place == place;
  };
  const auto first = std::find_if(lines.begin(), lines.end(), isOfRow);
  const auto end = std::find_if_not(first, lines.end(), isOfRow);
  return {static_cast<std::size_t>(first - lines.begin()), static_cast<std::size_t>(end - lines.begin())};
}

ListLayout layOut(const PageSnapshot& snapshot, int width) {
  const int room = std::max(width - 4, 8);
  int labelWidth = 0;
  int detailWidth = 0;
  for (const auto& section : snapshot.sections) {
    for (const auto& row : section.rows) {
      if (!row.text || !row.detail) continue;
      labelWidth = std::max(labelWidth, columns(characters(*row.text)));
      detailWidth = std::max(detailWidth, columns(characters(*row.detail)));
    }
  }
  // A long label leaves the value half of the line, or less if that is all that values need.
  labelWidth = std::min(labelWidth, std::max({room / 2 - gap, room - gap - detailWidth, 1}));

  ListLayout layout;
  layout.detailColumn = labelWidth > 0 ? labelWidth + gap : 0;
  for (std::size_t section = 0; section < snapshot.sections.size(); ++section) {
    const auto& [title, rows] = snapshot.sections[section];
    if (section > 0) layout.lines.emplace_back();
    if (title) {
      for (auto& line : wrapped(characters(*title), room)) {
        layout.lines.push_back({LaidOutLine::Kind::Header, {}, std::move(line), {}, false});
      }
    }
    for (std::size_t row = 0; row < rows.size(); ++row) {
      const auto& cell = rows[row];
      const auto label = wrapped(characters(cell.text.value_or("")), cell.detail ? labelWidth : room);
      const auto detail = wrapped(characters(cell.detail.value_or("")), room - layout.detailColumn);
      for (std::size_t line = 0; line < std::max(label.size(), detail.size()); ++line) {
        layout.lines.push_back({LaidOutLine::Kind::Row,
                                {section, row},
                                line < label.size() ? label[line] : L"",
                                line < detail.size() ? detail[line] : L"",
                                line == 0 && showsDisclosure(cell.identifier)});
      }
    }
  }
  return layout;
}

}  // namespace probeview::terminal
