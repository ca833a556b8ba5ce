// SPDX-License-Identifier: Apache-2.0
#include "tests/ui/qt/window_testing.h"

#include <QSignalSpy>
#include <utility>

#include "ui/open_page.h"

namespace probeview::testing_ui {

std::size_t HandPage::numberOfSectionsInTableView() {
  ++timesAsked;
  return content.sections.size();
}
std::optional<std::string> HandPage::titleForHeaderInSection(std::size_t section) {
  return content.sections.at(section).title;
}
std::size_t HandPage::numberOfRowsInSection(std::size_t section) { return content.sections.at(section).rows.size(); }
void HandPage::cellForRowAtIndexPath(std::size_t section, std::size_t row, ListCell& cell) {
  cell = content.sections.at(section).rows.at(row);
  cell.identifier = identifier;
}

ListCell valueRow(std::string label, std::string value) {
  ListCell cell;
  cell.text = std::move(label);
  cell.detail = std::move(value);
  return cell;
}

PageSnapshot::Section sectionOfRows(std::size_t count) {
  PageSnapshot::Section section;
  for (std::size_t row = 0; row < count; ++row) {
    section.rows.push_back(valueRow("row " + std::to_string(row), std::to_string(row)));
  }
  return section;
}

Dictionary dictionaryOf(std::size_t count) {
  Dictionary dictionary;
  for (std::size_t entry = 0; entry < count; ++entry) {
    dictionary.set(Key::copy("field " + std::to_string(entry)), Value(static_cast<std::uint32_t>(entry)));
  }
  return dictionary;
}

WindowTest::WindowTest()
    : appearance(std::make_unique<qt::Appearance>(QDBusConnection(QStringLiteral("no bus in tests")))) {}
WindowTest::~WindowTest() = default;

void WindowTest::show(QSize size) {
  close();
  stack.emplace(description);
  open(size);
}

void WindowTest::showAt(const std::string& pageKey) {
  close();
  stack.emplace(description);
  ASSERT_TRUE(openPage(*stack, pageKey));
  open({360, 720});
}

HandPage& WindowTest::showPage(std::unique_ptr<HandPage> page, QSize size) {
  HandPage& shown = *page;
  close();
  stack.emplace(description, std::move(page));
  open(size);
  return shown;
}

void WindowTest::close() {
  window_.reset();
  viewer_.reset();
  stack.reset();
}

void WindowTest::open(QSize size) {
  viewer_ = std::make_unique<qt::Viewer>(
      *stack,
      [this] {
        return Status{statusKind, statusText};
      },
      loop, *appearance);
  window_ = std::make_unique<qt::Window>(*viewer_);
  // Pages slide as they do for a user, only faster.
  theme().setProperty("slide", 30);
  window().resize(size);
  window().setVisible(true);
  ASSERT_TRUE(QTest::qWaitForWindowActive(&window()));
  rest();
}

std::string WindowTest::title() { return textOf(part(window().contentItem(), "title")); }

void WindowTest::rest() {
  auto* pages = part(window().contentItem(), "stack");
  ASSERT_NE(pages, nullptr);
  ASSERT_TRUE(waitUntil([pages] { return !pages->property("busy").toBool(); }));
  // Rows are laid out when a picture is made.
  QSignalSpy pictures(&window(), &QQuickWindow::frameSwapped);
  window().update();
  ASSERT_TRUE(waitUntil([&] { return !pictures.isEmpty(); }));
}

QQuickItem* WindowTest::pageView() {
  return part(window().contentItem(), "stack")->property("currentItem").value<QQuickItem*>();
}

QQuickItem* WindowTest::list() { return pageView()->property("list").value<QQuickItem*>(); }

QQuickItem* WindowTest::row(const std::string& label) {
  for (int index = 0; index < model().rowCount(); ++index) {
    const auto* cell = model().cell(index);
    if (!cell || cell->text.value_or("") != label) continue;
    QQuickItem* found = nullptr;
    QMetaObject::invokeMethod(list(), "itemAtIndex", Q_RETURN_ARG(QQuickItem*, found), Q_ARG(int, index));
    const QRectF sight(0, 0, list()->width(), list()->height());
    if (!found || !sight.contains(found->mapRectToItem(list(), found->boundingRect()))) {
      constexpr int contain = 4;  // ListView.Contain
      QMetaObject::invokeMethod(list(), "positionViewAtIndex", Q_ARG(int, index), Q_ARG(int, contain));
      rest();
      QMetaObject::invokeMethod(list(), "itemAtIndex", Q_RETURN_ARG(QQuickItem*, found), Q_ARG(int, index));
    }
    return found;
  }
  ADD_FAILURE() << "there is no row " << label;
  return nullptr;
}

QQuickItem* WindowTest::part(QQuickItem* whole, const char* objectName) {
  if (whole->objectName() == QLatin1String(objectName)) return whole;
  for (auto* child : whole->childItems()) {
    if (auto* found = part(child, objectName)) return found;
  }
  return nullptr;
}

std::vector<QQuickItem*> WindowTest::textsIn(QQuickItem* whole) {
  std::vector<QQuickItem*> texts;
  if (!whole->isVisible()) return texts;
  if (whole->inherits("QQuickText")) texts.push_back(whole);
  for (auto* child : whole->childItems()) {
    const auto more = textsIn(child);
    texts.insert(texts.end(), more.begin(), more.end());
  }
  return texts;
}

std::string WindowTest::textOf(QQuickItem* text) {
  // Without the places where a long name may break.
  return text ? text->property("text").toString().remove(QChar(0x200b)).toStdString() : "no such text";
}

QPoint WindowTest::centre(const QQuickItem* item) {
  return item->mapToScene(QPointF(item->width() / 2, item->height() / 2)).toPoint();
}

QPointingDevice* WindowTest::finger() {
  static QPointingDevice* const screen = QTest::createTouchDevice();
  return screen;
}

void WindowTest::click(QQuickItem* item) {
  ASSERT_NE(item, nullptr);
  QTest::mouseClick(&window(), Qt::LeftButton, Qt::NoModifier, centre(item));
}

void WindowTest::press(Qt::Key key, Qt::KeyboardModifiers modifiers) { QTest::keyClick(&window(), key, modifiers); }

void WindowTest::goTo(const std::string& technology, const std::string& category) {
  clickRow(technology);
  rest();
  clickRow(category);
  rest();
}

std::pair<std::string, double> WindowTest::standing() {
  const double y = list()->property("contentY").toDouble();
  QQuickItem* top = nullptr;
  QMetaObject::invokeMethod(list(), "itemAt", Q_RETURN_ARG(QQuickItem*, top), Q_ARG(qreal, 20.0), Q_ARG(qreal, y + 1));
  if (!top) return {"no row", 0};
  return {top->property("label").toString().toStdString(), top->y() - y};
}

void WindowTest::scrollTo(double contentY) {
  list()->setProperty("contentY", contentY);
  rest();
}

bool WindowTest::waitUntil(const std::function<bool()>& condition) { return QTest::qWaitFor(condition, 20000); }

}  // namespace probeview::testing_ui
