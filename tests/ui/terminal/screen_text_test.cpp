// SPDX-License-Identifier: Apache-2.0
#include "ui/terminal/screen_text.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <clocale>
#include <set>

#include "ui/terminal/list_layout.h"

namespace probeview::terminal {
namespace {

// Widths of characters come from the locale's tables.
class ScreenText : public testing::Test {
 protected:
  ScreenText() { std::setlocale(LC_CTYPE, "C.UTF-8"); }
  ~ScreenText() override { std::setlocale(LC_CTYPE, "C"); }

  static bool isAscii(std::wstring_view text) {
    return std::all_of(text.begin(), text.end(), [](wchar_t character) { return character >= 32 && character < 127; });
  }
};

TEST_F(ScreenText, OnlyALocaleOfUtf8GetsMoreThanAscii) {
  EXPECT_EQ(characterSetOf("UTF-8"), CharacterSet::Unicode);
  EXPECT_EQ(characterSetOf("utf8"), CharacterSet::Unicode);
  EXPECT_EQ(characterSetOf("ANSI_X3.4-1968"), CharacterSet::Ascii);
  EXPECT_EQ(characterSetOf("ISO-8859-1"), CharacterSet::Ascii);
  EXPECT_EQ(characterSetOf(""), CharacterSet::Ascii);
}

TEST_F(ScreenText, OurMarksHaveALikenessInAsciiAndOthersAQuestionMarkForEachColumn) {
  EXPECT_EQ(inAscii(L"probeview › LTE"), L"probeview > LTE");
  EXPECT_EQ(inAscii(L"scenario:city · 0.4 s ago"), L"scenario:city - 0.4 s ago");
  EXPECT_EQ(inAscii(L"↑↓←→ cut…"), L"^v<> cut~");
  EXPECT_EQ(inAscii(L"Zürich 信号"), L"Z?rich ????");
  EXPECT_EQ(inAscii(L"e\u0301"), L"e") << "what takes no column leaves none";
  EXPECT_EQ(inAscii(L"~ plain text stays -"), L"~ plain text stays -");
}

TEST_F(ScreenText, EveryKindOfStatusHasAMarkOfItsOwnOneColumnWideInBothCharacterSets) {
  for (const auto characterSet : {CharacterSet::Unicode, CharacterSet::Ascii}) {
    std::set<wchar_t> marks;
    for (std::size_t kind = 0; kind < statusKindNames.size(); ++kind) {
      const wchar_t mark = statusMark(static_cast<Status::Kind>(kind), characterSet);
      marks.insert(mark);
      EXPECT_EQ(columns({&mark, 1}), 1) << statusKindNames[kind];
      if (characterSet == CharacterSet::Ascii) {
        EXPECT_TRUE(isAscii({&mark, 1}));
      }
    }
    EXPECT_EQ(marks.size(), statusKindNames.size());
  }
}

TEST_F(ScreenText, TheKeyHintsTakeTheWidestFormThatFits) {
  EXPECT_EQ(keyHints(true, 60), L"↑↓ Return  Esc back  ? keys  q quit");
  EXPECT_EQ(keyHints(false, 60), L"↑↓ Return  ? keys  q quit");
  // What a terminal of 40 columns has room for beside the ends of the line.
  EXPECT_EQ(keyHints(true, 32), L"↑↓ Return Esc back ? keys q quit");
  for (int width = 0; width < 80; ++width) {
    for (const bool canGoBack : {false, true}) {
      const auto hints = keyHints(canGoBack, width);
      EXPECT_LE(columns(hints), width);
      EXPECT_EQ(hints.empty(), width < 6) << width;
      if (!hints.empty()) {
        EXPECT_NE(hints.find(L"? keys"), std::wstring::npos) << "the rest is found there";
      }
    }
  }
}

TEST_F(ScreenText, TheListOfKeysFitsATerminalOf40By20) {
  for (const auto characterSet : {CharacterSet::Unicode, CharacterSet::Ascii}) {
    const auto lines = helpLines(characterSet);
    EXPECT_LE(lines.size(), 16u);
    for (const auto& [sign, meaning] : lines) {
      EXPECT_LT(columns(sign), helpColumn);
      EXPECT_LE(columns(meaning), 40 - 3 - helpColumn);
    }
    // The marks are explained as they are drawn.
    for (std::size_t kind = 0; kind < statusKindNames.size(); ++kind) {
      const std::wstring mark(1, statusMark(static_cast<Status::Kind>(kind), characterSet));
      EXPECT_EQ(std::count_if(lines.begin(), lines.end(), [&](const HelpLine& line) { return line.sign == mark; }), 1);
    }
  }
}

}  // namespace
}  // namespace probeview::terminal
