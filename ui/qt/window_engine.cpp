// SPDX-License-Identifier: Apache-2.0
#include "ui/qt/window_engine.h"

#include <QOpenGLContext>
#include <QQmlComponent>
#include <QQmlError>
#include <QQuickStyle>

#include "platform/fatal_error.h"

namespace probeview::qt {

void prepareWindows() {
  const QString style = QStringLiteral("Fusion");
  if (QQuickStyle::name() != style) QQuickStyle::setStyle(style);
}

void chooseRenderer() {
  if (qEnvironmentVariableIsSet("QT_QUICK_BACKEND")) return;
  QOpenGLContext context;
  if (!context.create()) QQuickWindow::setGraphicsApi(QSGRendererInterface::Software);
}

Window::Window(Viewer& viewer) {
  engine_.addImportPath(QStringLiteral("qrc:/"));
  QQmlComponent component(&engine_, QUrl(QStringLiteral("qrc:/Probeview/Main.qml")));
  QObject* made = component.createWithInitialProperties({{QStringLiteral("viewer"), QVariant::fromValue(&viewer)}});
  window_.reset(qobject_cast<QQuickWindow*>(made));
  // The QML is part of the program; what can be missing are the toolkit's own modules.
  if (!window_) fatalError("the window cannot be made: " + component.errorString().toStdString());
}

Window::~Window() = default;

QObject& Window::theme() const { return *window_->property("theme").value<QObject*>(); }

}  // namespace probeview::qt
