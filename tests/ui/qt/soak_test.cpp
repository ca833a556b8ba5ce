// SPDX-License-Identifier: Apache-2.0
//
// A long drive through the real service into the real window, with a restless hand on it.
#include <gtest/gtest.h>

#include <QGuiApplication>
#include <QTest>
#include <QWindow>
#include <chrono>
#include <cstdlib>
#include <fstream>
#include <optional>
#include <random>
#include <set>
#include <string>

#include "app/application.h"
#include "platform/console_log.h"
#include "platform/system_log.h"
#include "tests/app/radixd_process.h"
#include "ui/qt/window.h"

namespace probeview {
namespace {

using namespace std::chrono_literals;

std::size_t residentKilobytes() {
  std::ifstream status("/proc/self/status");
  for (std::string line; std::getline(status, line);) {
    if (line.starts_with("VmRSS:")) return std::strtoull(line.c_str() + 6, nullptr, 10);
  }
  return 0;
}

// The hand: taps, goes back, flicks and types at random.
class Hand {
 public:
  explicit Hand(unsigned seed) : random_(seed) {}

  void move(QWindow& window) {
    const QPoint place(window.width() / 2, below(window.height()));
    const int choice = below(100);
    if (choice < 45) {
      QTest::mouseClick(&window, Qt::LeftButton, Qt::NoModifier, place);
    } else if (choice < 60) {
      QTest::keyClick(&window, Qt::Key_Escape);
    } else if (choice < 80) {
      constexpr Qt::Key keys[] = {Qt::Key_Down, Qt::Key_Up, Qt::Key_PageDown, Qt::Key_End, Qt::Key_Return};
      QTest::keyClick(&window, keys[below(5)]);
    } else if (choice < 95) {
      QPoint tip = place;
      QTest::touchEvent(&window, finger()).press(0, tip, &window);
      const QPoint step(0, below(2) == 0 ? -40 : 40);
      for (int moves = 0; moves < 5; ++moves) QTest::touchEvent(&window, finger()).move(0, tip += step, &window);
      QTest::touchEvent(&window, finger()).release(0, tip, &window);
    } else {
      window.resize(360 + below(900), 480 + below(500));
    }
  }

 private:
  int below(int limit) { return std::uniform_int_distribution(0, limit - 1)(random_); }

  std::mt19937 random_;
  // One for all hands, because Qt keeps devices for ever.
  static QPointingDevice* finger() {
    static QPointingDevice* const screen = QTest::createTouchDevice();
    return screen;
  }
};

TEST(WindowSoak, ARestlessHandStopsNothingLosesNothingAndLeaksNothing) {
  // Seconds of real time; the drive runs a hundred times as fast. 72 seconds are a drive of two hours.
  const auto* asked = std::getenv("PROBEVIEW_SOAK_SECONDS");
  const auto seconds = std::chrono::seconds(asked ? std::atoi(asked) : 6);
  const bool isLong = seconds >= 60s;
  const auto* chosen = std::getenv("PROBEVIEW_SEED");
  const auto seed = chosen ? static_cast<unsigned>(std::strtoul(chosen, nullptr, 10)) : std::random_device{}();
  SCOPED_TRACE("PROBEVIEW_SEED=" + std::to_string(seed));

  qputenv("QT_QPA_PLATFORM", "offscreen");
  qputenv("QT_QUICK_BACKEND", "software");
  setConsoleLog(*new DiscardingSink);
  setSystemLog(*new SystemLog("probeview", SystemLog::Echo::None));
  RadixdProcess radixd("scenario:city,speed=100");
  ASSERT_TRUE(radixd.start());

  char name[] = "test";
  char* argv[] = {name, nullptr};
  int argc = 1;
  const auto front = qt::makeWindowFront(argc, argv);
  Hand hand(seed);
  std::set<std::string> pagesSeen;
  std::size_t settledMemory = 0;
  std::size_t finalMemory = 0;
  std::uint64_t lost = 1;
  bool connected = false;
  bool filled = false;
  const auto begin = std::chrono::steady_clock::now();
  ScheduledTaskHandle moving;
  const int status = applicationMain("AppDelegate", *front, [&](MetricSession& session) {
    moving = front->scheduler().every(20ms, [&] {
      const auto windows = QGuiApplication::topLevelWindows();
      if (windows.isEmpty() || !windows.front()->isExposed()) return;
      const auto passed = std::chrono::steady_clock::now() - begin;
      if (settledMemory == 0 && passed > seconds / 2) settledMemory = residentKilobytes();
      if (passed < seconds) {
        hand.move(*windows.front());
        pagesSeen.insert(windows.front()->title().toStdString());
        filled = session.isFilled() || filled;
        return;
      }
      finalMemory = residentKilobytes();
      const auto service = session.navigation().myRadixWrapper->serviceStatus();
      lost = service.connection.lostEvents;
      connected = service.connection.connected;
      windows.front()->close();
    });
  });
  EXPECT_EQ(status, 0);
  EXPECT_TRUE(connected);
  EXPECT_EQ(lost, 0u);
  // Chance leads the hand, and a busy machine slows it: no more than that it did get about.
  EXPECT_GT(pagesSeen.size(), isLong ? 10u : 2u);
  RecordProperty("pages_seen", static_cast<int>(pagesSeen.size()));
  RecordProperty("resident_kB_at_half_time", static_cast<int>(settledMemory));
  RecordProperty("resident_kB_at_the_end", static_cast<int>(finalMemory));
  if (!isLong) return;
  EXPECT_TRUE(filled) << "every metric that the service can fill has come";
  // Pages that are opened for the first time still fill the toolkit's caches, some 4 MB of them in the second half of a
  // drive on a busy machine; what every record or page leaked would be many times as much.
  EXPECT_LT(finalMemory, settledMemory + 8192);
}

}  // namespace
}  // namespace probeview
