// SPDX-License-Identifier: Apache-2.0
#include <QPointer>

#include "tests/ui/qt/window_testing.h"
#include "ui/varnet_view_items.h"

namespace probeview {
namespace {

class WindowNavigation : public testing_ui::WindowTest {};

TEST_F(WindowNavigation, TheWindowStartsWithTheLaunchList) {
  show();
  EXPECT_EQ(title(), stack->topPage().title());
  EXPECT_EQ(list()->property("count").toInt(), 4);
  EXPECT_FALSE(part(window().contentItem(), "backButton")->isVisible());
}

TEST_F(WindowNavigation, ClicksGoThroughTheListsToACategoryPage) {
  store.filled[DisplayDictionary::myLTERRCStateDict] = testing_ui::dictionaryOf(3);
  show();
  goTo("LTE", "RRC State");
  EXPECT_EQ(stack->depth(), 3u);
  EXPECT_EQ(title(), "RRC State");
  EXPECT_EQ(textOf(part(window().contentItem(), "context")), "LTE");
  EXPECT_EQ(textOf(part(row("field 2"), "label")), "field 2");
  EXPECT_EQ(textOf(part(row("field 2"), "value")), "2");
}

TEST_F(WindowNavigation, TheWindowIsNamedAfterItsPageAndOnTheLaunchListAfterTheProgramAlone) {
  show();
  EXPECT_EQ(window().title().toStdString(), "probeview");
  goTo("LTE", "RRC State");
  EXPECT_EQ(window().title().toStdString(), "probeview – RRC State");
  press(Qt::Key_Escape);
  rest();
  EXPECT_EQ(window().title().toStdString(), "probeview – LTE");
  press(Qt::Key_Escape);
  rest();
  EXPECT_EQ(window().title().toStdString(), "probeview");
}

TEST_F(WindowNavigation, FingersGoTheSameWay) {
  show();
  for (const auto* label : {"UMTS", "RRC Configuration"}) {
    const QPoint place = centre(row(label));
    QTest::touchEvent(&window(), finger()).press(0, place, &window());
    QTest::touchEvent(&window(), finger()).release(0, place, &window());
    rest();
  }
  EXPECT_EQ(title(), "RRC Configuration");
  EXPECT_EQ(stack->depth(), 3u);
}

TEST_F(WindowNavigation, AValueRowOpensTheDetailPageOfOneEmptyRow) {
  show();
  goTo("LTE", "Tx Power");
  clickRow("Waiting for Update");
  rest();
  EXPECT_EQ(stack->depth(), 4u);
  EXPECT_EQ(list()->property("count").toInt(), 1);
  auto* only = row("");
  EXPECT_EQ(textOf(part(only, "label")), "");
  EXPECT_EQ(textOf(part(only, "value")), "");
  click(only);
  rest();
  EXPECT_EQ(stack->depth(), 4u) << "its row leads nowhere";
  press(Qt::Key_Escape);
  rest();
  EXPECT_EQ(title(), "Tx Power");
}

TEST_F(WindowNavigation, TheBackButtonGoesBack) {
  show();
  goTo("GSM", "Idle Config");
  click(part(window().contentItem(), "backButton"));
  rest();
  EXPECT_EQ(stack->depth(), 2u);
  EXPECT_EQ(title(), "GSM");
}

TEST_F(WindowNavigation, EscapeGoesBack) {
  show();
  goTo("GSM", "Idle Config");
  press(Qt::Key_Escape);
  rest();
  EXPECT_EQ(title(), "GSM");
}

TEST_F(WindowNavigation, AltAndLeftGoBack) {
  show();
  goTo("GSM", "Idle Config");
  press(Qt::Key_Left, Qt::AltModifier);
  rest();
  EXPECT_EQ(title(), "GSM");
}

TEST_F(WindowNavigation, TheBackKeyOfAPhoneGoesBack) {
  show();
  goTo("GSM", "Idle Config");
  press(Qt::Key_Back);
  rest();
  EXPECT_EQ(title(), "GSM");
}

TEST_F(WindowNavigation, TheBackButtonOfTheMouseGoesBack) {
  show();
  goTo("GSM", "Idle Config");
  QTest::mouseClick(&window(), Qt::BackButton, Qt::NoModifier, QPoint(180, 400));
  rest();
  EXPECT_EQ(title(), "GSM");
}

TEST_F(WindowNavigation, NothingGoesBackBeyondTheLaunchList) {
  show();
  press(Qt::Key_Escape);
  press(Qt::Key_Back);
  press(Qt::Key_Left, Qt::AltModifier);
  QTest::mouseClick(&window(), Qt::BackButton, Qt::NoModifier, QPoint(180, 400));
  rest();
  EXPECT_EQ(stack->depth(), 1u);
  EXPECT_EQ(list()->property("count").toInt(), 4);
}

TEST_F(WindowNavigation, ADoubleTapPushesOnce) {
  show();
  const QPoint place = centre(row("LTE"));
  QTest::mouseClick(&window(), Qt::LeftButton, Qt::NoModifier, place);
  QTest::mouseClick(&window(), Qt::LeftButton, Qt::NoModifier, place);
  QTest::mouseDClick(&window(), Qt::LeftButton, Qt::NoModifier, place);
  rest();
  EXPECT_EQ(stack->depth(), 2u);
  EXPECT_EQ(title(), "LTE");
}

TEST_F(WindowNavigation, ADoubleStepBackGoesBackOnce) {
  show();
  goTo("LTE", "RRC State");
  press(Qt::Key_Escape);
  press(Qt::Key_Escape);
  rest();
  EXPECT_EQ(stack->depth(), 2u);
}

TEST_F(WindowNavigation, APageDiesWhenItIsPoppedAndItsModelWhenItIsOutOfSight) {
  show();
  goTo("LTE", "Serving Cell Info");
  ASSERT_EQ(model().cell(0)->text, std::nullopt);
  console.lines.clear();
  const QPointer<qt::PageModel> leaving = &model();
  press(Qt::Key_Escape);
  EXPECT_EQ(stack->depth(), 2u);
  ASSERT_NE(leaving, nullptr) << "it is still sliding out";
  EXPECT_EQ(leaving->rowCount(), 1);
  rest();
  EXPECT_TRUE(waitUntil([&] { return leaving.isNull(); }));
  // The page complains on each question while its metric is missing: nothing asks any more.
  loop.advance(std::chrono::seconds(11));
  EXPECT_TRUE(console.lines.empty());
}

TEST_F(WindowNavigation, GoingBackAndInAgainMakesAFreshPage) {
  show();
  goTo("LTE", "RRC State");
  press(Qt::Key_Escape);
  rest();
  store.filled[DisplayDictionary::myLTERRCStateDict] = testing_ui::dictionaryOf(5);
  clickRow("RRC State");
  rest();
  EXPECT_EQ(list()->property("count").toInt(), 5);
}

TEST_F(WindowNavigation, EveryCategoryPageCanBeOpenedAndLeft) {
  show();
  std::size_t pages = 0;
  for (const auto& technology : {"Device Info", "LTE", "UMTS", "GSM"}) {
    clickRow(technology);
    rest();
    for (const auto& category : model().shown().sections[0].rows) {
      const std::string name = category.text.value();
      clickRow(name);
      rest();
      EXPECT_EQ(title(), name);
      ++pages;
      press(Qt::Key_Escape);
      rest();
    }
    press(Qt::Key_Escape);
    rest();
  }
  EXPECT_EQ(pages, navigablePageKeys().size());
}

TEST_F(WindowNavigation, AWindowOverAPageThatIsOpenAlreadyStartsThereAndGoesBackToTheRoot) {
  showAt("LTE RRC State");
  EXPECT_EQ(title(), "RRC State");
  press(Qt::Key_Escape);
  rest();
  EXPECT_EQ(title(), "LTE");
  press(Qt::Key_Escape);
  rest();
  EXPECT_EQ(stack->depth(), 1u);
  EXPECT_EQ(list()->property("count").toInt(), 4);
}

TEST_F(WindowNavigation, TheTappedRowIsStillMarkedAfterComingBack) {
  show();
  goTo("LTE", "C-DRX");
  press(Qt::Key_Escape);
  rest();
  EXPECT_EQ(list()->property("currentIndex").toInt(), 7);
}

}  // namespace
}  // namespace probeview
