// SPDX-License-Identifier: Apache-2.0
#include "ui/terminal/list_view.h"

#include <gtest/gtest.h>

#include <wchar.h>

#include <clocale>

#include "tests/support/harmless.h"

namespace probeview::terminal {
namespace {

using Wide = std::vector<std::wstring>;

// Widths of characters come from the locale's tables.
class Characters : public testing::Test {
 protected:
  Characters() { std::setlocale(LC_CTYPE, "C.UTF-8"); }
  ~Characters() override { std::setlocale(LC_CTYPE, "C"); }
};

class TextLayout : public Characters {};

TEST_F(TextLayout, TextIsWrappedAtBlanksAndCutWhereThereAreNone) {
  EXPECT_EQ(wrapped(L"one two three", 7), (Wide{L"one two", L"three"}));
  EXPECT_EQ(wrapped(L"abcdefgh", 3), (Wide{L"abc", L"def", L"gh"}));
  EXPECT_EQ(wrapped(L"", 3), (Wide{L""}));
  EXPECT_EQ(wrapped(L"a\n\nb", 3), (Wide{L"a", L"", L"b"}));
  EXPECT_EQ(wrapped(L"exactly", 7), (Wide{L"exactly"}));
}

TEST_F(TextLayout, AFieldsNameIsWrappedAfterItsUnderscores) {
  EXPECT_EQ(wrapped(L"mo_data_ac_barring_time", 12), (Wide{L"mo_data_ac_", L"barring_time"}));
}

TEST_F(TextLayout, WideCharactersTakeTwoColumns) {
  EXPECT_EQ(columns(L"信号"), 4);
  EXPECT_EQ(wrapped(L"信号强", 4), (Wide{L"信号", L"强"}));
  EXPECT_EQ(shortened(L"信号强度", 5), L"信号…");
}

TEST_F(TextLayout, ANarrowWidthStillGetsThroughTheText) {
  EXPECT_EQ(wrapped(L"信号", 1), (Wide{L"信", L"号"}));
  EXPECT_EQ(shortened(L"abc", 1), L"…");
  EXPECT_EQ(shortened(L"abc", 0), L"");
}

TEST_F(TextLayout, ControlCharactersAreEscapedAndIllFormedTextIsReplaced) {
  EXPECT_EQ(characters("a\x1b[31mb"), L"a\\u{1b}[31mb");
  EXPECT_EQ(characters("\xc2\x9b|"), L"\\u{9b}|");
  EXPECT_EQ(characters("\xc3\x28"), L"\ufffd(");
  // A value cannot make itself more rows than it has.
  EXPECT_EQ(characters("a\nb"), L"a\\nb");
  for (const wchar_t character : characters(hostileText())) EXPECT_GE(::wcwidth(character), 0) << int{character};
  EXPECT_EQ(characters("Zürich 信"), L"Zürich 信");
  EXPECT_EQ(characters("\xf0\x9f\x93\xb6"), L"\U0001f4f6");
}

class Page final : public ListPage {
 public:
  PageSnapshot content;

  std::string title() const override { return "page"; }
  std::size_t numberOfSectionsInTableView() override { return content.sections.size(); }
  std::optional<std::string> titleForHeaderInSection(std::size_t section) override {
    return content.sections[section].title;
  }
  std::size_t numberOfRowsInSection(std::size_t section) override { return content.sections[section].rows.size(); }
  void cellForRowAtIndexPath(std::size_t section, std::size_t row, ListCell& cell) override {
    cell = content.sections[section].rows[row];
  }
  void reload() { reloadTask()(); }
};

std::vector<ListCell> rows(const std::vector<std::string>& labels) {
  std::vector<ListCell> cells;
  for (const auto& label : labels) cells.push_back({"SecondClickView", label, label + "!"});
  return cells;
}

std::string selected(const ListView& view) {
  const auto* cell = view.selectedCell();
  return cell ? cell->text.value_or("(blank)") : "(none)";
}

class Lists : public Characters {
 protected:
  Page page;
  int reloads = 0;
  std::unique_ptr<ListView> view;

  void show(int width = 40, int height = 5) {
    view = std::make_unique<ListView>(page, [this] { ++reloads; });
    view->resize(width, height);
  }
  std::ptrdiff_t lineOnScreen() const {
    return static_cast<std::ptrdiff_t>(view->layout().extentOf(*view->selection()).first) -
           static_cast<std::ptrdiff_t>(view->firstLine());
  }
};

TEST_F(Lists, TheFirstRowIsSelectedAndTheSelectionStopsAtTheEnds) {
  page.content.sections = {{"A", rows({"a", "b"})}, {"B", rows({})}, {"C", rows({"c"})}};
  show();
  EXPECT_EQ(selected(*view), "a");
  view->moveSelection(-1);
  EXPECT_EQ(selected(*view), "a");
  view->moveSelection(2);
  EXPECT_EQ(selected(*view), "c");
  view->moveSelection(1);
  EXPECT_EQ(selected(*view), "c");
  view->selectFirst();
  EXPECT_EQ(selected(*view), "a");
  view->selectLast();
  EXPECT_EQ(selected(*view), "c");
}

TEST_F(Lists, APageWithoutRowsHasNoSelection) {
  page.content.sections = {{std::nullopt, {}}};
  show();
  view->moveSelection(1);
  view->moveByScreens(1);
  view->selectLast();
  EXPECT_EQ(selected(*view), "(none)");
}

TEST_F(Lists, RowsThatComeToAnEmptyPageSelectTheFirst) {
  page.content.sections = {{std::nullopt, {}}};
  show();
  page.content.sections[0].rows = rows({"a", "b"});
  page.reload();
  EXPECT_EQ(reloads, 1);
  EXPECT_EQ(selected(*view), "a");
}

TEST_F(Lists, SectionsAreHeadedAndSetApartByABlankLine) {
  page.content.sections = {{"A", rows({"a"})}, {"B", rows({"b"})}};
  show(40, 20);
  const auto& lines = view->layout().lines;
  ASSERT_EQ(lines.size(), 5u);
  EXPECT_EQ(lines[0].kind, LaidOutLine::Kind::Header);
  EXPECT_EQ(lines[0].text, L"A");
  EXPECT_EQ(lines[1].text, L"a");
  EXPECT_EQ(lines[1].detail, L"a!");
  EXPECT_EQ(lines[2].kind, LaidOutLine::Kind::Blank);
  EXPECT_EQ(lines[3].text, L"B");
}

TEST_F(Lists, LongLabelsTakeTheRoomThatShortValuesLeave) {
  page.content.sections = {{std::nullopt, {{"SecondClickView", std::string(30, 'x'), "12"}}}};
  show(40, 20);
  EXPECT_EQ(view->layout().lines.size(), 1u);
  page.content.sections[0].rows[0].detail = std::string(30, 'y');
  page.reload();
  EXPECT_EQ(view->layout().lines.size(), 2u);
}

TEST_F(Lists, ALongValueTakesSeveralLinesOfOneRow) {
  page.content.sections = {{std::nullopt, {{"SecondClickView", "label", std::string(60, 'x')}}}};
  show(40, 20);
  const auto extent = view->layout().extentOf({0, 0});
  EXPECT_EQ(extent.end - extent.first, 3u);
  for (const auto& line : view->layout().lines) EXPECT_LE(view->layout().detailColumn + columns(line.detail), 36);
}

TEST_F(Lists, AReloadKeepsTheSelectedFieldAndItsLineOnTheScreen) {
  std::vector<std::string> labels;
  for (char name = 'a'; name <= 'z'; ++name) labels.emplace_back(1, name);
  page.content.sections = {{std::nullopt, rows(labels)}};
  show();
  view->moveSelection(12);
  view->moveSelection(-2);
  ASSERT_EQ(selected(*view), "k");
  const auto line = lineOnScreen();
  labels.insert(labels.begin(), {"1", "2", "3"});
  page.content.sections[0].rows = rows(labels);
  page.reload();
  EXPECT_EQ(selected(*view), "k");
  EXPECT_EQ(lineOnScreen(), line);
  labels.erase(labels.begin(), labels.begin() + 5);
  page.content.sections[0].rows = rows(labels);
  page.reload();
  EXPECT_EQ(selected(*view), "k");
  EXPECT_EQ(lineOnScreen(), line);
}

TEST_F(Lists, AFieldThatGoesHandsTheSelectionToTheOneThatTookItsPlace) {
  page.content.sections = {{std::nullopt, rows({"a", "b", "c"})}};
  show();
  view->moveSelection(1);
  page.content.sections[0].rows = rows({"a", "c"});
  page.reload();
  EXPECT_EQ(selected(*view), "c");
  page.content.sections[0].rows = rows({"a"});
  page.reload();
  EXPECT_EQ(selected(*view), "a");
  page.content.sections[0].rows = {};
  page.reload();
  EXPECT_EQ(selected(*view), "(none)");
}

TEST_F(Lists, TheSelectionIsAlwaysOnTheScreenWithTheHeaderAboveIt) {
  for (int section = 0; section < 10; ++section) {
    page.content.sections.push_back({"Section " + std::to_string(section), rows({"a", "b"})});
  }
  show(40, 6);
  for (int step = 0; step < 19; ++step) {
    view->moveSelection(1);
    EXPECT_GE(lineOnScreen(), 0);
    EXPECT_LT(lineOnScreen(), 6);
  }
  view->selectFirst();
  EXPECT_EQ(view->firstLine(), 0u);
  EXPECT_FALSE(view->hasMoreAbove());
  EXPECT_TRUE(view->hasMoreBelow());
  view->selectLast();
  EXPECT_TRUE(view->hasMoreAbove());
  EXPECT_FALSE(view->hasMoreBelow());
}

TEST_F(Lists, MovingByScreensReachesBothEnds) {
  for (int section = 0; section < 10; ++section) page.content.sections.push_back({"S", rows({"a", "b"})});
  show(40, 6);
  for (int step = 0; step < 20; ++step) view->moveByScreens(1);
  EXPECT_EQ(view->selection(), (RowPlace{9, 1}));
  for (int step = 0; step < 20; ++step) view->moveByScreens(-1);
  EXPECT_EQ(view->selection(), (RowPlace{0, 0}));
}

TEST_F(Lists, AScreenOfAnySizeShowsTheSelection) {
  page.content.sections = {{"Header", rows({"a", "b", "c", "d", "e", "f"})}};
  show();
  view->selectLast();
  for (const int height : {1, 2, 3, 50, 0}) {
    for (const int width : {1, 10, 200}) {
      view->resize(width, height);
      EXPECT_GE(lineOnScreen(), 0);
      EXPECT_LT(lineOnScreen(), std::max(height, 1));
    }
  }
}

}  // namespace
}  // namespace probeview::terminal
