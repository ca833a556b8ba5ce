// SPDX-License-Identifier: Apache-2.0
//
// The two fronts on Qt as a program uses them: each brings the application, the main queue and the event loop.
#include <QGuiApplication>
#include <QImage>
#include <QTemporaryDir>
#include <QTest>
#include <QWindow>
#include <sstream>

#include "tests/ui/testing.h"
#include "ui/open_page.h"
#include "ui/qt/pictures.h"
#include "ui/qt/window.h"

namespace probeview {
namespace {

using namespace std::chrono_literals;

class FrontTest : public testing::Test {
 protected:
  FrontTest() {
    qputenv("QT_QPA_PLATFORM", "offscreen");
    qputenv("QT_QUICK_BACKEND", "software");
    qunsetenv("DBUS_SESSION_BUS_ADDRESS");
    store.filled[DisplayDictionary::myLTERRCStateDict] = Dictionary{{"state", Value::text("CONNECTED")}};
  }

  std::string output() const { return folder.filePath(QStringLiteral("pages.png")).toStdString(); }
  std::unique_ptr<qt::PicturesFront> pictures(qt::PicturesOptions options) {
    if (options.outputPath.empty()) options.outputPath = output();
    return qt::makePicturesFront(argc, argv, std::move(options), errors);
  }
  int run(Front& front) {
    const PageEnvironment environment{front.mainQueue(), front.scheduler(), console, store};
    NavigationStack stack{InterfaceDescription(environment)};
    return front.run(stack, [] { return Status{Status::Kind::Live, "scenario:city · 0.4 s ago"}; });
  }

  char name[5] = "test";
  char* argv[2] = {name, nullptr};
  int argc = 1;
  testing_ui::RememberedLines console;
  testing_ui::RememberedLines systemLog;
  testing_ui::HandFilledStore store{console, systemLog};
  const QTemporaryDir folder;
  std::ostringstream errors;
};

TEST_F(FrontTest, TheWindowEndsTheProgramWithStatus0WhenItIsClosed) {
  const auto front = qt::makeWindowFront(argc, argv);
  bool wasVisible = false;
  const auto closing = front->scheduler().every(5ms, [&] {
    for (auto* window : QGuiApplication::topLevelWindows()) {
      if (!window->isExposed()) continue;
      wasVisible = true;
      window->close();
    }
  });
  EXPECT_EQ(run(*front), 0);
  EXPECT_TRUE(wasVisible);
}

TEST_F(FrontTest, ControlQEndsTheProgramWithStatus0) {
  const auto front = qt::makeWindowFront(argc, argv);
  bool wasVisible = false;
  const auto typing = front->scheduler().every(5ms, [&] {
    for (auto* window : QGuiApplication::topLevelWindows()) {
      if (!window->isExposed()) continue;
      wasVisible = true;
      QTest::keyClick(window, Qt::Key_Q, Qt::ControlModifier);
    }
  });
  EXPECT_EQ(run(*front), 0);
  EXPECT_TRUE(wasVisible);
}

TEST_F(FrontTest, ThePagesOfTheWindowLiveOnItsMainQueue) {
  const auto front = qt::makeWindowFront(argc, argv);
  const PageEnvironment environment{front->mainQueue(), front->scheduler(), console, store};
  NavigationStack stack{InterfaceDescription(environment)};
  ASSERT_TRUE(openPage(stack, "LTE Serving Cell Info"));
  std::size_t complaints = 0;
  // The page complains each time that it is asked while its metric is missing: at once, and at each reload.
  const auto closing = front->scheduler().every(20ms, [&] {
    complaints = console.lines.size();
    if (complaints >= 2) QGuiApplication::quit();
  });
  front->run(stack, [] { return Status{}; });
  EXPECT_GE(complaints, 2u);
}

TEST_F(FrontTest, PicturesShowThePagesInBothLooks) {
  qt::PicturesOptions options;
  options.pageKeys = {"LTE RRC State", "GSM Idle Config"};
  EXPECT_EQ(run(*pictures(options)), 0);
  EXPECT_EQ(errors.str(), "");
  const QImage sheet(QString::fromStdString(output()));
  // The launch list, the category list and two pages beside each other, light above dark.
  EXPECT_EQ(sheet.size(), QSize(4 * (360 + 28) + 28, 2 * (720 + 28) + 28));
  EXPECT_GT(sheet.pixelColor(200, 600).lightness(), 200);
  EXPECT_LT(sheet.pixelColor(200, 1300).lightness(), 60);
}

TEST_F(FrontTest, PicturesShowOneLookWhenOneIsAskedFor) {
  qt::PicturesOptions options;
  options.pageKeys = {"LTE RRC State"};
  options.light = false;
  EXPECT_EQ(run(*pictures(options)), 0);
  const QImage sheet(QString::fromStdString(output()));
  EXPECT_EQ(sheet.size(), QSize(3 * (360 + 28) + 28, 720 + 28 + 28));
  EXPECT_LT(sheet.pixelColor(200, 600).lightness(), 60);
}

TEST_F(FrontTest, PicturesWaitUntilThereIsSomethingToShow) {
  qt::PicturesOptions options;
  options.pageKeys = {"LTE RRC State"};
  const auto front = pictures(options);
  int asked = 0;
  front->waitUntil([&] { return ++asked == 3; });
  EXPECT_EQ(run(*front), 0);
  EXPECT_EQ(asked, 3);
}

TEST_F(FrontTest, APageThatDoesNotExistIsRefused) {
  qt::PicturesOptions options;
  options.pageKeys = {"LTE Weather"};
  EXPECT_EQ(run(*pictures(options)), 1);
  EXPECT_EQ(errors.str(),
            "there is no page \"LTE Weather\"; name a technology and one of its categories, as in \"LTE NAS\"\n");
}

TEST_F(FrontTest, APictureThatCannotBeWrittenIsReported) {
  qt::PicturesOptions options;
  options.outputPath = folder.filePath(QStringLiteral("no such folder/pages.png")).toStdString();
  options.pageKeys = {"LTE RRC State"};
  EXPECT_EQ(run(*pictures(options)), 1);
  EXPECT_NE(errors.str().find("no such folder/pages.png cannot be written: "), std::string::npos) << errors.str();
}

}  // namespace
}  // namespace probeview
