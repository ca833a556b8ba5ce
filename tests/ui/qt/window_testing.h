// SPDX-License-Identifier: Apache-2.0
//
// What the tests of the window share: a window over a store that is filled by hand, with a clock that only the test
// moves, and the hands that click, type and flick.
#pragma once

#include <QQuickItem>
#include <QString>
#include <QTest>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "tests/ui/testing.h"
#include "ui/navigation_stack.h"
#include "ui/qt/appearance.h"
#include "ui/qt/viewer.h"
#include "ui/qt/window_engine.h"

namespace probeview::testing_ui {

// A page whose content a test decides.
class HandPage final : public ListPage {
 public:
  std::string name = "Page by hand";
  std::string_view identifier = "SecondClickView";
  PageSnapshot content;
  int timesAsked = 0;

  // As if the page's own timer had fired.
  void reload() { reloadTask()(); }

  std::string title() const override { return name; }
  std::size_t numberOfSectionsInTableView() override;
  std::optional<std::string> titleForHeaderInSection(std::size_t section) override;
  std::size_t numberOfRowsInSection(std::size_t section) override;
  void cellForRowAtIndexPath(std::size_t section, std::size_t row, ListCell& cell) override;
};

ListCell valueRow(std::string label, std::string value);
// A section of rows "row 0" … with the values "0" ….
PageSnapshot::Section sectionOfRows(std::size_t count);
// One dictionary of that many entries "field 0": 0 ….
Dictionary dictionaryOf(std::size_t count);

class WindowTest : public PagesTest {
 protected:
  WindowTest();
  ~WindowTest() override;

  // Shows the window over the launch list, or over a page of the test's own, and waits for its first picture. A window
  // that is there already goes.
  void show(QSize size = {360, 720});
  // The same, with that page opened before.
  void showAt(const std::string& pageKey);
  HandPage& showPage(std::unique_ptr<HandPage> page, QSize size = {360, 720});

  QQuickWindow& window() { return window_->quickWindow(); }
  QObject& theme() { return window_->theme(); }
  qt::PageModel& model() { return *viewer_->topPage(); }
  std::string title();

  // Waits until the stack of pages rests.
  void rest();
  // The visible page, its list, the row of a label; rows are brought into sight first.
  QQuickItem* pageView();
  QQuickItem* list();
  QQuickItem* row(const std::string& label);
  // Null where the item, or none below it, has that name.
  static QQuickItem* part(QQuickItem* whole, const char* objectName);
  // Every text that is drawn below the item.
  static std::vector<QQuickItem*> textsIn(QQuickItem* whole);
  static std::string textOf(QQuickItem* text);

  static QPoint centre(const QQuickItem* item);
  // A touch screen; one for all tests, because Qt keeps devices for ever.
  static QPointingDevice* finger();
  void click(QQuickItem* item);
  void clickRow(const std::string& label) { click(row(label)); }
  void press(Qt::Key key, Qt::KeyboardModifiers modifiers = Qt::NoModifier);
  // "LTE", then "RRC State", each waited for.
  void goTo(const std::string& technology, const std::string& category);

  // Where the list stands: the label of its topmost row and how far that row is from the list's top, in pixels.
  std::pair<std::string, double> standing();
  void scrollTo(double contentY);
  bool waitUntil(const std::function<bool()>& condition);

  // Without a bus, until a test brings one.
  std::unique_ptr<qt::Appearance> appearance;
  Status::Kind statusKind = Status::Kind::Live;
  std::string statusText = "scenario:city · 0.4 s ago";
  std::optional<NavigationStack> stack;

 private:
  void open(QSize size);
  void close();

  std::unique_ptr<qt::Viewer> viewer_;
  std::unique_ptr<qt::Window> window_;
};

}  // namespace probeview::testing_ui
