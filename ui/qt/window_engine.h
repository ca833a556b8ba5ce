// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <QQmlEngine>
#include <QQuickWindow>
#include <memory>

#include "ui/qt/viewer.h"

namespace probeview::qt {

// To be called before the first window: fixes the style that the window is drawn with, whatever the system or
// the environment prefers.
void prepareWindows();

// To be called once the application is there, before the first window: draws without OpenGL where there is none,
// instead of not at all. What QT_QUICK_BACKEND asks for stands above.
void chooseRenderer();

// A window, with the engine that runs its QML. Not visible yet.
class Window {
 public:
  // The viewer outlives the window.
  explicit Window(Viewer& viewer);
  ~Window();

  QQuickWindow& quickWindow() const { return *window_; }
  QQmlEngine& engine() { return engine_; }
  // The theme object that all colours and sizes come from.
  QObject& theme() const;

 private:
  QQmlEngine engine_;
  std::unique_ptr<QQuickWindow> window_;
};

}  // namespace probeview::qt
