// SPDX-License-Identifier: Apache-2.0
#include <algorithm>
#include <ctime>

#include "tests/ui/qt/window_testing.h"

namespace probeview {
namespace {

using namespace std::chrono_literals;
using testing_ui::dictionaryOf;
using testing_ui::HandPage;
using testing_ui::sectionOfRows;
using testing_ui::valueRow;

class WindowReload : public testing_ui::WindowTest {
 protected:
  // A page of one section of that many rows, scrolled to the pixel.
  HandPage& showRows(std::size_t count, double contentY) {
    auto page = std::make_unique<HandPage>();
    page->content.sections = {sectionOfRows(count)};
    HandPage& shown = showPage(std::move(page));
    scrollTo(contentY);
    return shown;
  }
  // Throws the list with a finger, so that it goes on moving by itself.
  void flick() {
    QPoint place(180, 600);
    QTest::touchEvent(&window(), finger()).press(0, place, &window());
    for (int step = 0; step < 8; ++step) {
      place -= QPoint(0, 30);
      QTest::touchEvent(&window(), finger()).move(0, place, &window());
    }
    QTest::touchEvent(&window(), finger()).release(0, place, &window());
  }
};

TEST_F(WindowReload, AllRowsAreReloadedFiveSecondsAfterThePageIsShownAndEveryFiveSecondsAfterThat) {
  store.filled[DisplayDictionary::myLTERRCStateDict] = dictionaryOf(2);
  show();
  goTo("LTE", "RRC State");
  const auto valueShown = [this] { return textOf(part(row("field 1"), "value")); };
  EXPECT_EQ(valueShown(), "1");
  for (const std::uint32_t value : {70u, 71u}) {
    auto changed = dictionaryOf(2);
    changed.set("field 1", Value(value));
    store.filled[DisplayDictionary::myLTERRCStateDict] = changed;
    loop.advance(4999999999ns);
    EXPECT_EQ(valueShown(), value == 70u ? "1" : "70");
    loop.advance(1ns);
    EXPECT_EQ(valueShown(), std::to_string(value));
  }
}

TEST_F(WindowReload, RowsThatComeAndGoAreDrawn) {
  store.filled[DisplayDictionary::myLTERRCStateDict] = dictionaryOf(2);
  show();
  goTo("LTE", "RRC State");
  store.filled[DisplayDictionary::myLTERRCStateDict] = dictionaryOf(6);
  loop.advance(5s);
  rest();
  EXPECT_EQ(textOf(part(row("field 5"), "value")), "5");
  store.filled[DisplayDictionary::myLTERRCStateDict] = dictionaryOf(1);
  loop.advance(5s);
  rest();
  EXPECT_EQ(list()->property("count").toInt(), 1);
  EXPECT_EQ(textsIn(list()).size(), 2u);
}

TEST_F(WindowReload, ACoveredPageIsReloadedToo) {
  store.filled[DisplayDictionary::myLTERRCStateDict] = dictionaryOf(1);
  show();
  goTo("LTE", "RRC State");
  const auto& covered = model();
  clickRow("field 0");
  rest();
  ASSERT_EQ(stack->depth(), 4u);
  store.filled[DisplayDictionary::myLTERRCStateDict] = dictionaryOf(3);
  loop.advance(5s);
  EXPECT_EQ(covered.rowCount(), 3);
  press(Qt::Key_Escape);
  rest();
  EXPECT_EQ(textOf(part(row("field 2"), "value")), "2");
}

TEST_F(WindowReload, ScrollPositionAndSelectionSurviveAReloadOfValues) {
  auto& page = showRows(100, 1717);
  list()->setProperty("currentIndex", 40);
  const auto before = standing();
  for (auto& cell : page.content.sections[0].rows) cell.detail = "new";
  page.reload();
  rest();
  EXPECT_EQ(standing(), before);
  EXPECT_EQ(list()->property("currentIndex").toInt(), 40);
  EXPECT_EQ(textOf(part(row("row 40"), "value")), "new");
}

TEST_F(WindowReload, ScrollPositionAndSelectionSurviveRowsThatComeAbove) {
  auto& page = showRows(100, 1717);
  list()->setProperty("currentIndex", 40);
  const auto before = standing();
  auto& rows = page.content.sections[0].rows;
  for (int row = 0; row < 7; ++row) rows.insert(rows.begin() + 3 * row, valueRow("new " + std::to_string(row), "x"));
  page.reload();
  rest();
  EXPECT_EQ(standing(), before);
  const int current = list()->property("currentIndex").toInt();
  EXPECT_EQ(model().cell(current)->text, "row 40");
}

TEST_F(WindowReload, ScrollPositionAndSelectionSurviveRowsThatGoAbove) {
  auto& page = showRows(100, 1717);
  list()->setProperty("currentIndex", 40);
  const auto before = standing();
  auto& rows = page.content.sections[0].rows;
  rows.erase(rows.begin() + 2, rows.begin() + 9);
  page.reload();
  rest();
  EXPECT_EQ(standing(), before);
  EXPECT_EQ(model().cell(list()->property("currentIndex").toInt())->text, "row 40");
}

TEST_F(WindowReload, ScrollPositionSurvivesSectionsThatComeAndGoBelow) {
  auto page = std::make_unique<HandPage>();
  for (int section = 0; section < 6; ++section) {
    page->content.sections.push_back(sectionOfRows(12));
    page->content.sections.back().title = "Neighbor " + std::to_string(section);
  }
  auto& shown = showPage(std::move(page));
  scrollTo(1300);
  const auto before = standing();
  shown.content.sections.resize(4);
  shown.reload();
  rest();
  EXPECT_EQ(standing(), before);
  shown.content.sections.resize(9, sectionOfRows(12));
  shown.reload();
  rest();
  EXPECT_EQ(standing(), before);
}

TEST_F(WindowReload, AStartedFlickSurvivesAReloadWhichWaitsUntilTheListRests) {
  auto& page = showRows(400, 300);
  flick();
  ASSERT_TRUE(list()->property("flicking").toBool()) << "the list is on its way";
  const double started = list()->property("contentY").toDouble();
  const int asked = page.timesAsked;
  page.content.sections[0].rows.insert(page.content.sections[0].rows.begin(), valueRow("new", "x"));
  page.reload();
  page.reload();
  EXPECT_TRUE(list()->property("flicking").toBool()) << "the reload did not stop it";
  EXPECT_EQ(page.timesAsked, asked) << "the page is not asked while the list moves";
  ASSERT_TRUE(waitUntil([&] { return list()->property("contentY").toDouble() > started + 50; })) << "it moves on";
  ASSERT_TRUE(waitUntil([&] { return !list()->property("moving").toBool(); }));
  EXPECT_EQ(page.timesAsked, asked + 1) << "two reloads that waited are made up for by one";
  EXPECT_EQ(list()->property("count").toInt(), 401);
}

TEST_F(WindowReload, AReloadWhileAFingerHoldsTheListWaitsForTheFinger) {
  auto& page = showRows(100, 300);
  QTest::touchEvent(&window(), finger()).press(0, QPoint(180, 500), &window());
  for (int y = 470; y >= 290; y -= 30) QTest::touchEvent(&window(), finger()).move(0, QPoint(180, y), &window());
  // Qt delivers a finger's moves once per picture.
  ASSERT_TRUE(waitUntil([&] { return list()->property("moving").toBool(); }));
  const int asked = page.timesAsked;
  page.reload();
  EXPECT_EQ(page.timesAsked, asked);
  QTest::touchEvent(&window(), finger()).move(0, QPoint(180, 290), &window());
  QTest::touchEvent(&window(), finger()).release(0, QPoint(180, 290), &window());
  ASSERT_TRUE(waitUntil([&] { return !list()->property("moving").toBool(); }));
  EXPECT_EQ(page.timesAsked, asked + 1);
}

TEST_F(WindowReload, ASectionWithoutRowsShowsItsHeader) {
  auto page = std::make_unique<HandPage>();
  page->content.sections = {sectionOfRows(2), {"nothing below me", {}}, sectionOfRows(1)};
  page->content.sections[2].title = "the last";
  auto& shown = showPage(std::move(page));
  const auto titles = [this] {
    std::vector<std::pair<double, std::string>> found;
    for (auto* text : textsIn(list())) {
      if (text->objectName() == QLatin1String("sectionTitle"))
        found.emplace_back(text->mapToScene({}).y(), textOf(text));
    }
    std::sort(found.begin(), found.end());
    std::string joined;
    for (const auto& [y, title] : found) joined += title + "|";
    return joined;
  };
  EXPECT_EQ(titles(), "nothing below me|the last|");
  shown.content.sections[1].rows = {valueRow("now", "there")};
  shown.content.sections[1].title = "one below me";
  shown.reload();
  rest();
  EXPECT_EQ(titles(), "one below me|the last|");
  EXPECT_EQ(textOf(part(row("now"), "value")), "there");
  shown.content.sections[1].rows.clear();
  shown.content.sections.resize(2);
  shown.reload();
  rest();
  EXPECT_EQ(titles(), "one below me|");
}

TEST_F(WindowReload, TheStatusLineIsAskedAnewEverySecondAndStandsOutsideTheList) {
  show();
  const auto status = [this] { return part(window().contentItem(), "statusText"); };
  EXPECT_EQ(textOf(status()), "scenario:city · 0.4 s ago");
  statusText = "Baseband service away since 12:03:10, showing what was last known";
  loop.advance(999ms);
  EXPECT_EQ(textOf(status()), "scenario:city · 0.4 s ago");
  loop.advance(1ms);
  EXPECT_EQ(textOf(status()), statusText);
  rest();
  EXPECT_GE(status()->mapToScene({}).y(), list()->mapToScene(QPointF(0, list()->height())).y());
}

TEST_F(WindowReload, TheStatusLineFollowsThePageAtOnce) {
  statusText = "of the lists";
  show();
  const auto status = [this] { return textOf(part(window().contentItem(), "statusText")); };
  EXPECT_EQ(status(), "of the lists");
  clickRow("LTE");
  rest();
  statusText = "of the page";
  EXPECT_EQ(status(), "of the lists") << "no clock has moved";
  clickRow("RRC State");
  rest();
  EXPECT_EQ(status(), "of the page");
  statusText = "of the lists again";
  press(Qt::Key_Escape);
  rest();
  EXPECT_EQ(status(), "of the lists again");
}

TEST_F(WindowReload, AReloadCostsLittle) {
  for (const std::size_t count : {std::size_t{1000}, std::size_t{10000}}) {
    SCOPED_TRACE(count);
    auto& page = showRows(count, 20000);
    const auto before = standing();
    auto& rows = page.content.sections[0].rows;
    // Every second value is new, and some rows come.
    for (std::size_t row = 0; row < rows.size(); row += 2) rows[row].detail = "new";
    for (int row = 0; row < 20; ++row) {
      rows.insert(rows.begin() + 11 * row, valueRow("new " + std::to_string(row), "x"));
    }
    // Processor time: how busy the machine is otherwise must not count.
    const auto begin = std::clock();
    page.reload();
    const double milliseconds = 1000.0 * static_cast<double>(std::clock() - begin) / CLOCKS_PER_SEC;
    RecordProperty("reload_of_" + std::to_string(count) + "_rows_ms", std::to_string(milliseconds));
    rest();
    EXPECT_EQ(standing(), before);
    // A millisecond per thousand rows is usual; the limit only catches a cost that grows with the square of the rows.
    EXPECT_LT(milliseconds, 1000);
  }
}

}  // namespace
}  // namespace probeview
