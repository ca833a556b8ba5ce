// SPDX-License-Identifier: Apache-2.0
#include "ui/qt/window.h"

#include <QGuiApplication>
#include <QTimer>
#include <chrono>

#include "ui/qt/appearance.h"
#include "ui/qt/qt_main_queue.h"
#include "ui/qt/viewer.h"
#include "ui/qt/window_engine.h"

namespace probeview::qt {

namespace {

// How long the first frame waits for the desktop portal, so that a dark desktop sees no light flash.
constexpr std::chrono::milliseconds portalPatience{50};

class WindowFront final : public Front {
 public:
  WindowFront(int& argc, char** argv) : application_(argc, argv), appearance_(sessionBus()) {
    chooseRenderer();
    QGuiApplication::setDesktopFileName(QStringLiteral("probeview"));
  }

  TaskQueue& mainQueue() override { return mainQueue_; }
  Scheduler& scheduler() override { return scheduler_; }

  int run(NavigationStack& navigation, const StatusSource& status) override {
    Viewer viewer(navigation, status, scheduler_, appearance_);
    Window window(viewer);
    const auto show = [&window] { window.quickWindow().setVisible(true); };
    if (appearance_.settled()) {
      show();
    } else {
      QObject::connect(&appearance_, &Appearance::nowSettled, &window.quickWindow(), show);
      QTimer::singleShot(portalPatience, &window.quickWindow(), show);
    }
    return QGuiApplication::exec();
  }

 private:
  QGuiApplication application_;
  Appearance appearance_;
  QtMainQueue mainQueue_;
  QtScheduler scheduler_;
};

}  // namespace

std::unique_ptr<Front> makeWindowFront(int& argc, char** argv) {
  prepareWindows();
  return std::make_unique<WindowFront>(argc, argv);
}

}  // namespace probeview::qt
