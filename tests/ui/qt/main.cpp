// SPDX-License-Identifier: Apache-2.0
//
// Runs the window's tests without a display, drawn by the software renderer. A warning of the toolkit is a failure:
// that is how a mistake in QML shows.
#include <gtest/gtest.h>

#include <QGuiApplication>

#include "ui/qt/window_engine.h"

namespace {

void failOnWarnings(QtMsgType type, const QMessageLogContext&, const QString& message) {
  const bool harmless =
      type == QtDebugMsg || type == QtInfoMsg || message.startsWith(QStringLiteral("QStandardPaths:"));
  if (!harmless) ADD_FAILURE() << "the toolkit warns: " << message.toStdString();
}

}  // namespace

int main(int argc, char** argv) {
  qputenv("QT_QPA_PLATFORM", "offscreen");
  qputenv("QT_QUICK_BACKEND", "software");
  testing::InitGoogleTest(&argc, argv);
  qInstallMessageHandler(failOnWarnings);
  probeview::qt::prepareWindows();
  const QGuiApplication application(argc, argv);
  return RUN_ALL_TESTS();
}
