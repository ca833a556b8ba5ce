// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <QDBusConnection>
#include <QDBusVariant>
#include <QObject>
#include <QString>

namespace probeview::qt {

// How the system wants its windows to look: dark or light, and how large text is to be. Followed live from the desktop
// portal (org.freedesktop.portal.Settings); where there is none, from Qt's own palette and font. Main thread.
class Appearance final : public QObject {
  Q_OBJECT

 public:
  static constexpr auto portalService = "org.freedesktop.portal.Desktop";
  static constexpr auto portalPath = "/org/freedesktop/portal/desktop";
  static constexpr auto portalInterface = "org.freedesktop.portal.Settings";

  // The bus may be unconnected.
  explicit Appearance(const QDBusConnection& bus);

  bool dark() const { return dark_; }
  // 0.8 to 2; 1 is the usual size.
  double textScale() const { return textScale_; }
  // Whether the portal has answered, or there is none to wait for.
  bool settled() const { return unanswered_ == 0; }

 signals:
  void changed();
  // Once.
  void nowSettled();

 protected:
  // The application's palette and font events.
  bool eventFilter(QObject* watched, QEvent* event) override;

 private slots:
  void settingChanged(const QString& nameSpace, const QString& key, const QDBusVariant& value);

 private:
  void ask(const QString& nameSpace, const QString& key);
  void take(const QString& nameSpace, const QString& key, const QVariant& value);
  void decide();

  QDBusConnection bus_;
  int unanswered_ = 0;
  // What the portal says: 1 dark, 2 light, 0 no preference; a factor, 0 unknown.
  uint portalScheme_ = 0;
  double portalTextScale_ = 0;
  bool dark_ = false;
  double textScale_ = 1;
};

// The session's bus, unconnected where there is none: without an address the bus library would start one.
QDBusConnection sessionBus();

}  // namespace probeview::qt
