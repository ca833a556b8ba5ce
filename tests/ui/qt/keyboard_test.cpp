// SPDX-License-Identifier: Apache-2.0
#include "tests/ui/qt/window_testing.h"

namespace probeview {
namespace {

class WindowKeyboard : public testing_ui::WindowTest {
 protected:
  bool ringed(const std::string& label) { return part(row(label), "focusRing")->isVisible(); }
  int current() { return list()->property("currentIndex").toInt(); }
};

TEST_F(WindowKeyboard, ArrowsAndReturnReachAPage) {
  show();
  press(Qt::Key_Down);
  press(Qt::Key_Down);
  press(Qt::Key_Return);
  rest();
  EXPECT_EQ(title(), "LTE");
  EXPECT_EQ(current(), 0) << "whoever comes by keyboard finds the first row marked";
  press(Qt::Key_Down);
  press(Qt::Key_Enter);
  rest();
  EXPECT_EQ(title(), "RRC State");
}

TEST_F(WindowKeyboard, NothingIsMarkedBeforeTheFirstKey) {
  show();
  EXPECT_EQ(current(), -1);
  press(Qt::Key_Return);
  rest();
  EXPECT_EQ(stack->depth(), 1u);
}

TEST_F(WindowKeyboard, TheFocusIsSeenWhileTheKeyboardIsUsedAndOnlyThen) {
  show();
  press(Qt::Key_Down);
  rest();
  EXPECT_TRUE(ringed("Device Info"));
  // A touch that opens nothing: between the title and the list.
  QTest::mouseClick(&window(), Qt::LeftButton, Qt::NoModifier, QPoint(180, 650));
  rest();
  EXPECT_FALSE(ringed("Device Info"));
  press(Qt::Key_Down);
  rest();
  EXPECT_TRUE(ringed("LTE"));
  EXPECT_FALSE(ringed("Device Info"));
}

TEST_F(WindowKeyboard, TheEndsOfTheListStopTheArrows) {
  show();
  press(Qt::Key_Up);
  EXPECT_EQ(current(), 3) << "from nothing marked, up goes to the last row";
  press(Qt::Key_Down);
  EXPECT_EQ(current(), 3);
  press(Qt::Key_Home);
  EXPECT_EQ(current(), 0);
  press(Qt::Key_Up);
  EXPECT_EQ(current(), 0);
  press(Qt::Key_End);
  EXPECT_EQ(current(), 3);
}

TEST_F(WindowKeyboard, TheMarkedRowComesIntoSight) {
  store.filled[DisplayDictionary::myLTERRCStateDict] = testing_ui::dictionaryOf(60);
  show();
  goTo("LTE", "RRC State");
  for (int step = 0; step < 30; ++step) press(Qt::Key_Down);
  rest();
  EXPECT_EQ(current(), 29);
  auto* marked = list()->property("currentItem").value<QQuickItem*>();
  const QRectF place = marked->mapRectToItem(list(), marked->boundingRect());
  EXPECT_GE(place.top(), 0);
  EXPECT_LE(place.bottom(), list()->height());
  press(Qt::Key_End);
  rest();
  EXPECT_EQ(current(), 59);
  press(Qt::Key_PageUp);
  rest();
  EXPECT_LT(current(), 59);
  EXPECT_GT(current(), 30);
  press(Qt::Key_PageDown);
  press(Qt::Key_PageDown);
  rest();
  EXPECT_EQ(current(), 59);
}

TEST_F(WindowKeyboard, TheMarkedRowIsNeverBehindTheHeaderThatStaysOnTop) {
  auto page = std::make_unique<testing_ui::HandPage>();
  for (int section = 0; section < 3; ++section) {
    page->content.sections.push_back(testing_ui::sectionOfRows(15));
    page->content.sections.back().title = "Neighbor " + std::to_string(section);
  }
  showPage(std::move(page));
  press(Qt::Key_End);
  for (int step = 44; step >= 0; --step) {
    rest();
    ASSERT_EQ(current(), step);
    auto* marked = list()->property("currentItem").value<QQuickItem*>();
    const QRectF place = marked->mapRectToItem(list(), marked->boundingRect());
    for (auto* text : textsIn(list())) {
      if (text->objectName() != QLatin1String("sectionTitle")) continue;
      auto* header = text->parentItem();
      const QRectF covered = header->mapRectToItem(list(), header->boundingRect()).adjusted(0, 0.5, 0, -0.5);
      EXPECT_FALSE(covered.intersects(place)) << textOf(text) << " covers row " << step;
    }
    EXPECT_GE(place.top(), 0);
    EXPECT_LE(place.bottom(), list()->height());
    press(Qt::Key_Up);
  }
}

TEST_F(WindowKeyboard, ARowThatIsNotShownIsSkipped) {
  auto page = std::make_unique<testing_ui::HandPage>();
  page->content.sections = {testing_ui::sectionOfRows(1), {"no rows here", {}}, testing_ui::sectionOfRows(1)};
  showPage(std::move(page));
  press(Qt::Key_Down);
  press(Qt::Key_Down);
  EXPECT_EQ(current(), 2);
  press(Qt::Key_Up);
  EXPECT_EQ(current(), 0);
}

TEST_F(WindowKeyboard, TabReachesTheBackButtonAndReturnPressesIt) {
  show();
  clickRow("LTE");
  rest();
  press(Qt::Key_Tab);
  auto* back = part(window().contentItem(), "backButton");
  ASSERT_TRUE(back->hasActiveFocus());
  EXPECT_TRUE(back->property("visualFocus").toBool());
  press(Qt::Key_Return);
  rest();
  EXPECT_EQ(stack->depth(), 1u);
  EXPECT_TRUE(list()->hasActiveFocus()) << "the list has the keyboard again";
}

TEST_F(WindowKeyboard, EveryKeyThatLeadsBackGoesBackOnePage) {
  show();
  for (const auto& [key, modifier] :
       std::initializer_list<std::pair<Qt::Key, Qt::KeyboardModifiers>>{{Qt::Key_Escape, Qt::NoModifier},
                                                                        {Qt::Key_Left, Qt::NoModifier},
                                                                        {Qt::Key_Backspace, Qt::NoModifier},
                                                                        {Qt::Key_Left, Qt::AltModifier},
                                                                        {Qt::Key_Back, Qt::NoModifier}}) {
    SCOPED_TRACE(key);
    goTo("LTE", "RRC State");
    press(key, modifier);
    rest();
    EXPECT_EQ(stack->depth(), 2u);
    press(key, modifier);
    rest();
    EXPECT_EQ(stack->depth(), 1u);
    press(key, modifier);
    rest();
    EXPECT_EQ(stack->depth(), 1u) << "the first page stays";
    EXPECT_TRUE(window().isVisible());
  }
}

TEST_F(WindowKeyboard, ControlQAndControlWCloseTheWindowFromAnyPage) {
  for (const auto key : {Qt::Key_Q, Qt::Key_W}) {
    show();
    press(key);
    EXPECT_TRUE(window().isVisible()) << "not without Control";
    goTo("LTE", "RRC State");
    press(key, Qt::ControlModifier);
    EXPECT_TRUE(waitUntil([this] { return !window().isVisible(); }));
  }
}

TEST_F(WindowKeyboard, EscapeGoesBackFromTheBackButtonToo) {
  show();
  clickRow("LTE");
  rest();
  press(Qt::Key_Tab);
  ASSERT_TRUE(part(window().contentItem(), "backButton")->hasActiveFocus());
  press(Qt::Key_Escape);
  rest();
  EXPECT_EQ(stack->depth(), 1u);
}

}  // namespace
}  // namespace probeview
