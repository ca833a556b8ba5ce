// SPDX-License-Identifier: Apache-2.0
#include "ui/terminal/screen_text.h"

#include <wchar.h>

#include <algorithm>
#include <utility>

#include "ui/terminal/list_layout.h"

namespace probeview::terminal {

namespace {

struct Likeness {
  wchar_t character;
  wchar_t ascii;
};

constexpr Likeness likenesses[] = {
    {L'·', L'-'}, {L'–', L'-'}, {L'…', L'~'}, {L'›', L'>'}, {L'↑', L'^'}, {L'↓', L'v'}, {L'←', L'<'}, {L'→', L'>'},
};

struct Mark {
  Likeness look;
  std::wstring_view meaning;
};

// In the order of Status::Kind.
constexpr Mark marks[] = {
    {{L'•', L'*'}, L"values come"},          {{L'…', L'.'}, L"nothing has come yet"},
    {{L'–', L'-'}, L"nothing can come"},     {{L'○', L'o'}, L"stale: overdue"},
    {{L'■', L'#'}, L"the source has ended"}, {{L'!', L'!'}, L"failed or refused"},
    {{L'×', L'x'}, L"the service is away"},
};
static_assert(std::size(marks) == statusKindNames.size());

wchar_t inSet(const Likeness& look, CharacterSet characterSet) {
  return characterSet == CharacterSet::Ascii ? look.ascii : look.character;
}

}  // namespace

CharacterSet characterSetOf(std::string_view encoding) {
  return encoding == "UTF-8" || encoding == "UTF8" || encoding == "utf-8" || encoding == "utf8" ? CharacterSet::Unicode
                                                                                                : CharacterSet::Ascii;
}

std::wstring inAscii(std::wstring_view text) {
  std::wstring out;
  for (const auto character : text) {
    const auto* const known = std::find_if(std::begin(likenesses), std::end(likenesses),
                                           [&](const Likeness& likeness) { return likeness.character == character; });
    if (character < 0x80) {
      out += character;
    } else if (known != std::end(likenesses)) {
      out += known->ascii;
    } else {
      out.append(static_cast<std::size_t>(columns({&character, 1})), L'?');
    }
  }
  return out;
}

wchar_t statusMark(Status::Kind kind, CharacterSet characterSet) {
  return inSet(marks[static_cast<std::size_t>(kind)].look, characterSet);
}

std::wstring keyHints(bool canGoBack, int width) {
  static constexpr std::wstring_view forms[][2] = {
      {L"↑↓ Return  ? keys  q quit", L"↑↓ Return  Esc back  ? keys  q quit"},
      {L"↑↓ Return ? keys q quit", L"↑↓ Return Esc back ? keys q quit"},
      {L"? keys  q quit", L"Esc back ? keys q quit"},
      {L"? keys", L"? keys"},
  };
  for (const auto& form : forms) {
    if (columns(form[canGoBack ? 1 : 0]) <= width) return std::wstring(form[canGoBack ? 1 : 0]);
  }
  return {};
}

std::vector<HelpLine> helpLines(CharacterSet characterSet) {
  std::vector<HelpLine> lines = {
      {L"↑ ↓", L"previous, next row"},
      {L"PgUp PgDn Space", L"by screens"},
      {L"Home End", L"first, last row"},
      {L"Return →", L"open the row"},
      {L"Esc Backspace ←", L"back"},
      {L"?", L"these keys"},
      {L"q Ctrl-C", L"quit"},
      {},
  };
  for (const auto& mark : marks) {
    lines.push_back({std::wstring(1, inSet(mark.look, characterSet)), std::wstring(mark.meaning)});
  }
  return lines;
}

}  // namespace probeview::terminal
