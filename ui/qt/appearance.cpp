// SPDX-License-Identifier: Apache-2.0
#include "ui/qt/appearance.h"

#include <QDBusMessage>
#include <QDBusMetaType>
#include <QDBusPendingCallWatcher>
#include <QDBusPendingReply>
#include <QEvent>
#include <QFileInfo>
#include <QFontInfo>
#include <QGuiApplication>
#include <QPalette>
#include <algorithm>

namespace probeview::qt {

namespace {

const QString appearanceNamespace = QStringLiteral("org.freedesktop.appearance");
const QString colorSchemeKey = QStringLiteral("color-scheme");
const QString interfaceNamespace = QStringLiteral("org.gnome.desktop.interface");
const QString textScaleKey = QStringLiteral("text-scaling-factor");

// The largest size, in pixels, that desktops use for plain text unless their user asks for more.
constexpr double usualFontSize = 15.0;

// The portal's Read wraps its answer twice.
QVariant unwrapped(QVariant value) {
  while (value.canConvert<QDBusVariant>()) value = value.value<QDBusVariant>().variant();
  return value;
}

bool paletteIsDark() { return QGuiApplication::palette().color(QPalette::Window).lightnessF() < 0.5F; }

double fontScale() { return std::max(1.0, QFontInfo(QGuiApplication::font()).pixelSize() / usualFontSize); }

}  // namespace

Appearance::Appearance(const QDBusConnection& bus) : bus_(bus) {
  qGuiApp->installEventFilter(this);
  decide();
  if (!bus_.isConnected()) return;
  // Qt registers this type only with the first call; until then it refuses a slot that takes one.
  qDBusRegisterMetaType<QDBusVariant>();
  bus_.connect(QString::fromLatin1(portalService), QString::fromLatin1(portalPath),
               QString::fromLatin1(portalInterface), QStringLiteral("SettingChanged"), this,
               SLOT(settingChanged(QString, QString, QDBusVariant)));
  ask(appearanceNamespace, colorSchemeKey);
  ask(interfaceNamespace, textScaleKey);
}

void Appearance::ask(const QString& nameSpace, const QString& key) {
  auto call = QDBusMessage::createMethodCall(QString::fromLatin1(portalService), QString::fromLatin1(portalPath),
                                             QString::fromLatin1(portalInterface), QStringLiteral("Read"));
  call << nameSpace << key;
  ++unanswered_;
  auto* watcher = new QDBusPendingCallWatcher(bus_.asyncCall(call), this);
  connect(watcher, &QDBusPendingCallWatcher::finished, this, [this, watcher, nameSpace, key] {
    watcher->deleteLater();
    // No portal, or one that does not know the key: then Qt's own idea stays.
    const QDBusPendingReply<QDBusVariant> reply = *watcher;
    if (!reply.isError()) take(nameSpace, key, reply.value().variant());
    if (--unanswered_ == 0) emit nowSettled();
  });
}

void Appearance::settingChanged(const QString& nameSpace, const QString& key, const QDBusVariant& value) {
  take(nameSpace, key, value.variant());
}

void Appearance::take(const QString& nameSpace, const QString& key, const QVariant& value) {
  const QVariant plain = unwrapped(value);
  if (nameSpace == appearanceNamespace && key == colorSchemeKey) {
    portalScheme_ = plain.toUInt();
  } else if (nameSpace == interfaceNamespace && key == textScaleKey) {
    portalTextScale_ = plain.toDouble();
  } else {
    return;
  }
  decide();
}

void Appearance::decide() {
  const bool dark = portalScheme_ == 1 || (portalScheme_ != 2 && paletteIsDark());
  const double scale = std::clamp(portalTextScale_ > 0 ? portalTextScale_ : fontScale(), 0.8, 2.0);
  if (dark == dark_ && scale == textScale_) return;
  dark_ = dark;
  textScale_ = scale;
  emit changed();
}

bool Appearance::eventFilter(QObject* watched, QEvent* event) {
  if (watched == qGuiApp &&
      (event->type() == QEvent::ApplicationPaletteChange || event->type() == QEvent::ApplicationFontChange)) {
    decide();
  }
  return QObject::eventFilter(watched, event);
}

QDBusConnection sessionBus() {
  const QString runtimeFolder = qEnvironmentVariable("XDG_RUNTIME_DIR");
  const bool hasBus = qEnvironmentVariableIsSet("DBUS_SESSION_BUS_ADDRESS") ||
                      (!runtimeFolder.isEmpty() && QFileInfo::exists(runtimeFolder + QStringLiteral("/bus")));
  return hasBus ? QDBusConnection::sessionBus() : QDBusConnection(QStringLiteral("no session bus"));
}

}  // namespace probeview::qt
