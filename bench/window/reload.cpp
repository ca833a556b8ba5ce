// SPDX-License-Identifier: Apache-2.0
//
// reload [ROUNDS]   how long a page of 1000 rows takes to reload: the page asked anew, the difference to what it showed
//                   before, the list told of it; with nothing changed, one value in ten, all values, and one row more
//                   at the top. In ms of processor time; one JSON object. Drawing comes later and only for rows in
//                   sight.
#include <QDBusConnection>
#include <QGuiApplication>
#include <QTest>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "bench/road/processor_time.h"
#include "platform/manual_loop.h"
#include "store/metric_validator.h"
#include "ui/interface_description.h"
#include "ui/navigation_stack.h"
#include "ui/open_page.h"
#include "ui/qt/viewer.h"
#include "ui/qt/window_engine.h"
#include "ui/second_level_view_controller.h"
#include "ui/status.h"

namespace {

using namespace probeview;

constexpr int rowCount = 1000;

// A store whose page of LTE RRC states has as many rows as wanted.
class LongStore final : public MetricValidator {
 public:
  explicit LongStore(LineSink& log)
      : MetricValidator(Surroundings{.wrapper = nullptr, .console = log, .systemLog = log}) {}
  const std::optional<Dictionary>& displayDictionary(DisplayDictionary which) const override {
    return which == DisplayDictionary::myLTERRCStateDict ? rows : MetricValidator::displayDictionary(which);
  }
  std::optional<Dictionary> rows;
};

Dictionary rowsOf(int first, int count, int generation, int changeEvery) {
  Dictionary rows;
  for (int row = first; row < first + count; ++row) {
    const bool changes = changeEvery != 0 && row % changeEvery == 0;
    rows.set(Key::copy("field " + std::to_string(row)),
             Value(static_cast<std::uint32_t>(row + (changes ? generation * 10000 : 0))));
  }
  return rows;
}

struct Change {
  const char* name;
  int changeEvery;
  bool growsAtTop;
};

constexpr Change changes[] = {
    {"nothing", 0, false}, {"one value in ten", 10, false}, {"all values", 1, false}, {"a row at the top", 0, true}};

// Draws, and waits until it is drawn.
void settle(QQuickWindow& window) {
  window.update();
  QTest::qWait(20);
}

}  // namespace

int main(int argc, char** argv) {
  const int rounds = argc > 1 ? std::atoi(argv[1]) : 31;
  qputenv("QT_QPA_PLATFORM", "offscreen");
  qputenv("QT_QUICK_BACKEND", "software");
  qt::prepareWindows();
  QGuiApplication application(argc, argv);
  DiscardingSink log;
  LongStore store(log);
  ManualLoop loop;
  const PageEnvironment environment{loop, loop, log, store};
  const InterfaceDescription description{environment};
  store.rows = rowsOf(1, rowCount, 0, 0);
  NavigationStack stack(description);
  const bool isOpen = openPage(stack, "LTE RRC State");
  qt::Appearance appearance(QDBusConnection(QStringLiteral("no bus in benchmarks")));
  qt::Viewer viewer(
      stack, [] { return Status{.text = "bench"}; }, loop, appearance);
  qt::Window window(viewer);
  window.quickWindow().setVisible(true);
  if (rounds < 1 || !isOpen || viewer.topPage()->rowCount() != rowCount ||
      !QTest::qWaitForWindowExposed(&window.quickWindow())) {
    std::fprintf(stderr, "reload: expected a number of rounds, and a window that shows a page of %d rows\n", rowCount);
    return 2;
  }
  settle(window.quickWindow());
  int generation = 0;
  std::printf("{");
  for (const Change& change : changes) {
    std::printf("%s\"%s\": [", &change == changes ? "" : ", ", change.name);
    for (int round = 0; round < rounds; ++round) {
      ++generation;
      store.rows = change.growsAtTop && generation % 2 == 0 ? rowsOf(0, rowCount, 0, 0)
                                                            : rowsOf(1, rowCount, generation, change.changeEvery);
      const double begin = bench::threadSeconds();
      loop.advance(SecondLevelViewController::reloadInterval);
      std::printf("%s%.4f", round == 0 ? "" : ", ", (bench::threadSeconds() - begin) * 1e3);
      settle(window.quickWindow());
    }
    std::printf("]");
  }
  std::printf("}\n");
  return 0;
}
