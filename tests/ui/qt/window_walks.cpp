// SPDX-License-Identifier: Apache-2.0
#include "tests/ui/qt/window_walks.h"

#include <QTest>

#include "ui/varnet_view_items.h"

namespace probeview::testing_ui {

namespace {

// One for all hands, because Qt keeps devices for ever.
QPointingDevice* finger() {
  static QPointingDevice* const screen = QTest::createTouchDevice();
  return screen;
}

}  // namespace

void Hand::move() {
  const QPoint place(window_.width() / 2, below(window_.height()));
  const int choice = below(100);
  if (choice < 45) {
    QTest::mouseClick(&window_, Qt::LeftButton, Qt::NoModifier, place);
  } else if (choice < 60) {
    QTest::keyClick(&window_, Qt::Key_Escape);
  } else if (choice < 80) {
    constexpr Qt::Key keys[] = {Qt::Key_Down, Qt::Key_Up, Qt::Key_PageDown, Qt::Key_End, Qt::Key_Return};
    QTest::keyClick(&window_, keys[below(5)]);
  } else if (choice < 95) {
    QPoint tip = place;
    QTest::touchEvent(&window_, finger()).press(0, tip, &window_);
    const QPoint step(0, below(2) == 0 ? -40 : 40);
    for (int moves = 0; moves < 5; ++moves) QTest::touchEvent(&window_, finger()).move(0, tip += step, &window_);
    QTest::touchEvent(&window_, finger()).release(0, tip, &window_);
  } else {
    window_.resize(360 + below(900), 480 + below(500));
  }
}

Tour::Tour(QQuickWindow& window) : window_(window), stack_(*window.findChild<QObject*>("stack")) {}

void Tour::begin() {
  isGoingHome_ = true;
  technology_ = 0;
  pages_.clear();
  details_ = 0;
}

bool Tour::goOn() {
  if (stack_.property("busy").toBool()) return true;
  const int depth = stack_.property("depth").toInt();
  const bool isDeeper = depth > depthBefore_;
  depthBefore_ = depth;
  isGoingHome_ = isGoingHome_ && depth > 1;
  if (isGoingHome_) {
    back();
    return true;
  }
  const auto& page = pageInSight();
  if (depth == 1) {
    if (page.cell(technology_) == nullptr) return false;
    category_ = 0;
    open(technology_++);
  } else if (depth == 2 && page.cell(category_) != nullptr) {
    technologyName_ = page.title().toStdString();
    open(category_++);
  } else if (depth == 3 && isDeeper) {
    pages_.insert(pageKey(technologyName_, page.title().toStdString()));
    // Now and then further, into a row of the page.
    if (pages_.size() % 4 == 1) {
      open(page.rowAfter(-1));
    } else {
      back();
    }
  } else {
    if (depth == 4) ++details_;
    back();
  }
  return true;
}

const qt::PageModel& Tour::pageInSight() const {
  const auto* view = stack_.property("currentItem").value<QObject*>();
  return *qobject_cast<const qt::PageModel*>(view->property("page").value<QObject*>());
}

void Tour::open(int row) { QMetaObject::invokeMethod(&window_, "open", Q_ARG(QVariant, row)); }
void Tour::back() { QMetaObject::invokeMethod(&window_, "back"); }

}  // namespace probeview::testing_ui
