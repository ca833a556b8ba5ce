// SPDX-License-Identifier: Apache-2.0
//
// A long drive through the real service into the real window, with a restless hand on it.
#include <gtest/gtest.h>

#include <QGuiApplication>
#include <QQmlEngine>
#include <QQuickWindow>
#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdlib>
#include <iostream>
#include <memory>
#include <optional>
#include <random>
#include <set>
#include <string>
#include <vector>

#include "app/application.h"
#include "platform/console_log.h"
#include "platform/system_log.h"
#include "tests/app/radixd_process.h"
#include "tests/ui/qt/live_memory.h"
#include "tests/ui/qt/window_walks.h"
#include "ui/qt/window.h"
#include "ui/varnet_view_items.h"

namespace probeview {
namespace {

using namespace std::chrono_literals;

// How much longer than asked the drive may take before something stands still.
constexpr auto patience = 120s;
// The tour takes three seconds of it on an idle machine.
constexpr auto roundLength = 12s;
// What may be alive at the last look and was not at the one that ends the first third of the drive. In a drive of two
// hours 3100 records come in between, and one allocation for each would be three times as many. What grows without a
// leak has an end: the toolkit keeps what it draws for the first time, such as glyphs, the pool of values keeps its
// blocks, the store holds now more, now fewer cells. That came to 190 to 390 allocations and 38 to 297 kB on a busy
// machine, and in a drive of eight hours to nothing more after the fourth; a leak of 3 kB a record is 9 MB.
constexpr std::ptrdiff_t mostGrownAllocations = 1000;
constexpr std::ptrdiff_t mostGrownBytes = 1024 * 1024;

// Reads every line and keeps none; there is at least one for each record.
class CountingSink final : public LineSink {
 public:
  void line(std::string_view) override { ++lines; }
  std::atomic<std::size_t> lines = 0;
};

// What is alive when a round has ended and the launch list rests in the window. A look allocates nothing that stays.
struct Look {
  LiveMemory memory;
  std::size_t lines;
  std::size_t pages;
};

// What happens in the window, in rounds: the first half of a round is the hand's, then comes a tour, and what is
// left of it the launch list rests; then a look is taken.
class Drive {
 public:
  using Clock = std::chrono::steady_clock;

  Drive(MetricSession& session, QQuickWindow& window, const CountingSink& console, Clock::duration round, unsigned seed)
      : session_(session), window_(window), console_(console), round_(round), hand_(window, seed), tour_(window) {}

  const std::vector<Look>& looks() const { return looks_; }

  // To be called often. A tour that takes longer on a busy machine takes nothing from the hand.
  void turn() {
    const auto passed = Clock::now() - roundBegan_;
    if (doing_ == Doing::Wandering) {
      hand_.move();
      if (passed < round_ / 2) return;
      window_.resize(360, 720);
      tour_.begin();
      // The hand meets pages that slide as they do for a user; the tour need not wait for them.
      slideFor(shortSlide);
      doing_ = Doing::Touring;
    } else if (doing_ == Doing::Touring) {
      if (tour_.goOn()) return;
      rested_ = 0;
      doing_ = Doing::Resting;
    } else if (++rested_ >= restsAtLeast && passed >= round_) {
      look();
      slideFor(usualSlide_);
      roundBegan_ = Clock::now();
      doing_ = Doing::Wandering;
    }
  }

 private:
  enum class Doing { Wandering, Touring, Resting };
  // Milliseconds.
  static constexpr int shortSlide = 10;
  // Turns until the last page has been released and a reload that waited for a flick has come.
  static constexpr int restsAtLeast = 20;

  QObject& theme() const { return *window_.property("theme").value<QObject*>(); }
  void slideFor(int milliseconds) { theme().setProperty("slide", milliseconds); }

  void look() {
    const auto keys = navigablePageKeys();
    EXPECT_EQ(tour_.pages(), std::set<std::string>(keys.begin(), keys.end()));
    EXPECT_GE(tour_.details(), 5);
    EXPECT_EQ(session_.navigation().depth(), 1u);
    // What nobody uses any more but the script engine would collect some time later.
    QQmlEngine* const engine = qmlEngine(&window_);
    engine->collectGarbage();
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    engine->collectGarbage();
    const auto* viewer = window_.property("viewer").value<QObject*>();
    EXPECT_EQ(viewer->findChildren<qt::PageModel*>().size(), 1) << "models of pages that are gone";
    looks_.push_back({liveMemory(), console_.lines, tour_.pages().size()});
  }

  MetricSession& session_;
  QQuickWindow& window_;
  const CountingSink& console_;
  const Clock::duration round_;
  Clock::time_point roundBegan_ = Clock::now();
  testing_ui::Hand hand_;
  testing_ui::Tour tour_;
  const int usualSlide_ = theme().property("slide").toInt();
  Doing doing_ = Doing::Wandering;
  int rested_ = 0;
  std::vector<Look> looks_;
};

TEST(LiveMemory, SeesWhatEveryRecordLeaves) {
  if (!liveMemoryIsCounted()) GTEST_SKIP() << "the sanitizer owns the allocator";
  std::vector<std::unique_ptr<char[]>> left(1000);
  const LiveMemory before = liveMemory();
  for (auto& one : left) one = std::make_unique<char[]>(3000);
  const LiveMemory after = liveMemory();
  EXPECT_EQ(after.allocations - before.allocations, 1000u);
  EXPECT_GE(after.bytes - before.bytes, 3'000'000u);
  left.clear();
  left.shrink_to_fit();
  EXPECT_LT(liveMemory().bytes, before.bytes);
}

TEST(WindowSoak, ARestlessHandStopsNothingLosesNothingAndLeaksNothing) {
  // Seconds of real time; the drive runs a hundred times as fast. 72 seconds are a drive of two hours.
  const auto* asked = std::getenv("PROBEVIEW_SOAK_SECONDS");
  const auto length = std::chrono::milliseconds(std::chrono::seconds(asked ? std::atoi(asked) : 6));
  const bool isLong = length >= 60s;
  const auto* chosen = std::getenv("PROBEVIEW_SEED");
  const auto seed = chosen ? static_cast<unsigned>(std::strtoul(chosen, nullptr, 10)) : std::random_device{}();
  SCOPED_TRACE("PROBEVIEW_SEED=" + std::to_string(seed));

  qputenv("QT_QPA_PLATFORM", "offscreen");
  qputenv("QT_QUICK_BACKEND", "software");
  auto& console = *new CountingSink;
  setConsoleLog(console);
  setSystemLog(*new SystemLog("probeview", SystemLog::Echo::None));
  RadixdProcess radixd("scenario:city,speed=100");
  ASSERT_TRUE(radixd.start());

  char name[] = "test";
  char* argv[] = {name, nullptr};
  int argc = 1;
  const auto front = qt::makeWindowFront(argc, argv);
  const int rounds = std::max(1, static_cast<int>(length / roundLength));
  std::optional<Drive> drive;
  std::uint64_t lost = 1;
  bool connected = false;
  bool filled = false;
  const auto begin = Drive::Clock::now();
  ScheduledTaskHandle moving;
  AppDelegate delegate;
  const int status = applicationMain(delegate, *front, [&](MetricSession& session) {
    moving = front->scheduler().every(10ms, [&] {
      const auto windows = QGuiApplication::topLevelWindows();
      if (windows.isEmpty() || !windows.front()->isExposed()) return;
      auto& window = *qobject_cast<QQuickWindow*>(windows.front());
      if (!drive) drive.emplace(session, window, console, length / rounds, seed);
      filled = session.isFilled() || filled;
      drive->turn();
      const bool isStuck = Drive::Clock::now() - begin > length + patience;
      EXPECT_FALSE(isStuck) << "the tour stands still at " << navigationPath(session.navigation());
      if (!isStuck && drive->looks().size() < static_cast<std::size_t>(rounds)) return;
      moving.reset();
      const auto service = session.navigation().myRadixWrapper->serviceStatus();
      lost = service.connection.lostEvents;
      connected = service.connection.connected;
      window.close();
    });
  });
  EXPECT_EQ(status, 0);
  EXPECT_TRUE(connected);
  EXPECT_EQ(lost, 0u);
  EXPECT_GT(console.lines, 100u) << "the drive has not come to the window";
  ASSERT_TRUE(drive);
  const auto& looks = drive->looks();
  ASSERT_EQ(looks.size(), static_cast<std::size_t>(rounds));
  for (const Look& look : looks) {
    std::cout << look.lines << " lines, " << look.pages << " pages, " << look.memory.allocations
              << " live allocations of " << look.memory.bytes << " bytes\n";
  }
  // A third into the drive every page has been there, every metric has come and the hand has done all that it does.
  const Look& warm = looks[looks.size() > 3 ? looks.size() / 3 - 1 : 0];
  const Look& last = looks.back();
  const auto grown = [](std::size_t before, std::size_t after) {
    return static_cast<std::ptrdiff_t>(after) - static_cast<std::ptrdiff_t>(before);
  };
  const std::ptrdiff_t bytes = grown(warm.memory.bytes, last.memory.bytes);
  const std::ptrdiff_t allocations = grown(warm.memory.allocations, last.memory.allocations);
  RecordProperty("pages_seen", static_cast<int>(last.pages));
  RecordProperty("lines_between_the_looks", static_cast<int>(last.lines - warm.lines));
  RecordProperty("live_allocations_grown_by", static_cast<int>(allocations));
  RecordProperty("live_bytes_grown_by", static_cast<int>(bytes));
  RecordProperty("live_bytes_at_the_end", static_cast<int>(last.memory.bytes));
  if (!isLong) return;
  EXPECT_TRUE(filled) << "every metric that the service can fill has come";
  if (!liveMemoryIsCounted()) return;
  EXPECT_LT(allocations, mostGrownAllocations);
  EXPECT_LT(bytes, mostGrownBytes);
}

}  // namespace
}  // namespace probeview
