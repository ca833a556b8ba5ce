// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <QList>
#include <QObject>
#include <QString>
#include <vector>

#include "ui/front.h"
#include "ui/navigation_stack.h"
#include "ui/qt/appearance.h"
#include "ui/qt/page_model.h"

namespace probeview::qt {

// What the window sees: the pages of a navigation stack as models, the status line, and how the system wants it all to
// look. The window opens and closes pages through it; the stack stays the one that decides. Main thread.
class Viewer final : public QObject, private NavigationObserver {
  Q_OBJECT
  Q_PROPERTY(bool dark READ dark NOTIFY appearanceChanged FINAL)
  Q_PROPERTY(double textScale READ textScale NOTIFY appearanceChanged FINAL)
  Q_PROPERTY(QString valueFamily READ valueFamily CONSTANT FINAL)
  Q_PROPERTY(QString statusText READ statusText NOTIFY statusChanged FINAL)
  // The name of the line's kind (statusKindName).
  Q_PROPERTY(QString statusKind READ statusKind NOTIFY statusChanged FINAL)
  // The pages that the stack held when the window was made, from the root on.
  Q_PROPERTY(QList<QObject*> firstPages READ firstPages CONSTANT FINAL)

 public:
  // The stack may already stand on any page. An empty status function means no status line. All outlive the viewer.
  Viewer(NavigationStack& stack, StatusSource status, Scheduler& scheduler, Appearance& appearance);
  ~Viewer() override;

  bool dark() const { return appearance_.dark(); }
  double textScale() const { return appearance_.textScale(); }
  QString valueFamily() const { return valueFamily_; }
  QString statusText() const { return QString::fromStdString(shownStatus_.text); }
  QString statusKind() const { return QString::fromUtf8(statusKindName(shownStatus_.kind)); }
  QList<QObject*> firstPages() const;
  PageModel* topPage() const { return pages_.back(); }

  // A tap on a row of the top page: the model of the page that it opened, null if it leads nowhere.
  Q_INVOKABLE QObject* open(int row);
  // Pops the top page, which dies at once; its model stays as it is until the window has slid it out of sight.
  Q_INVOKABLE void back();
  Q_INVOKABLE void release(QObject* page);

 signals:
  void appearanceChanged();
  void statusChanged();

 private:
  void didPush(ListPage& page) override;
  void willPop(ListPage& page) override;
  void refreshStatus();

  NavigationStack& stack_;
  Appearance& appearance_;
  QString valueFamily_;
  StatusSource status_;
  Status shownStatus_;
  ScheduledTaskHandle statusTimer_;
  std::vector<PageModel*> pages_;  // one per page of the stack; children of this object
};

}  // namespace probeview::qt
