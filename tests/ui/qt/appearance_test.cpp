// SPDX-License-Identifier: Apache-2.0
//
// A desktop portal of the test's own, on a D-Bus of its own.
#include "ui/qt/appearance.h"

#include <sys/prctl.h>

#include <QColor>
#include <QDBusConnection>
#include <QFile>
#include <QGuiApplication>
#include <QPalette>
#include <QProcess>
#include <QSignalSpy>
#include <QStandardPaths>
#include <QTemporaryDir>
#include <csignal>
#include <map>

#include "tests/ui/qt/window_testing.h"

namespace probeview {
namespace {

class FakePortal final : public QObject {
  Q_OBJECT
  Q_CLASSINFO("D-Bus Interface", "org.freedesktop.portal.Settings")

 public:
  std::map<QString, QVariant> settings;

  void set(const QString& nameSpace, const QString& key, const QVariant& value) {
    settings[nameSpace + QLatin1Char('/') + key] = value;
    emit SettingChanged(nameSpace, key, QDBusVariant(value));
  }

 public slots:
  // The portal wraps what it reads twice.
  QDBusVariant Read(const QString& nameSpace, const QString& key) {
    const auto found = settings.find(nameSpace + QLatin1Char('/') + key);
    return QDBusVariant(QVariant::fromValue(QDBusVariant(found == settings.end() ? QVariant(0u) : found->second)));
  }

 signals:
  void SettingChanged(const QString& nameSpace, const QString& key, const QDBusVariant& value);
};

const QString look = QStringLiteral("org.freedesktop.appearance");
const QString scheme = QStringLiteral("color-scheme");
const QString desktop = QStringLiteral("org.gnome.desktop.interface");
const QString textScale = QStringLiteral("text-scaling-factor");
constexpr uint noPreference = 0;
constexpr uint preferDark = 1;
constexpr uint preferLight = 2;

class SystemAppearance : public testing_ui::WindowTest {
 protected:
  void SetUp() override {
    portal.settings[look + QLatin1Char('/') + scheme] = noPreference;
    portal.settings[desktop + QLatin1Char('/') + textScale] = 1.0;
    startBus();
  }
  void TearDown() override {
    QDBusConnection::disconnectFromBus(QStringLiteral("portal's side"));
    QDBusConnection::disconnectFromBus(QStringLiteral("viewer's side"));
    daemon.terminate();
    daemon.waitForFinished();
  }

  // A bus of our own, on which nothing is started by being called: the machine's own portal stays out of it.
  void startBus() {
    const QString program = QStandardPaths::findExecutable(QStringLiteral("dbus-daemon"));
    if (program.isEmpty()) GTEST_SKIP() << "dbus-daemon (Debian package dbus-daemon) is not installed";
    ASSERT_TRUE(folder.isValid());
    QFile configuration(folder.filePath(QStringLiteral("bus.conf")));
    ASSERT_TRUE(configuration.open(QIODevice::WriteOnly));
    configuration.write("<busconfig><type>session</type><listen>unix:dir=" + folder.path().toUtf8() +
                        "</listen><policy context=\"default\"><allow send_destination=\"*\"/>"
                        "<allow receive_sender=\"*\"/><allow own=\"*\"/></policy></busconfig>");
    configuration.close();
    // Also when the test itself is killed.
    daemon.setChildProcessModifier([] { ::prctl(PR_SET_PDEATHSIG, SIGKILL); });
    daemon.start(program, {QStringLiteral("--config-file=") + configuration.fileName(), QStringLiteral("--nofork"),
                           QStringLiteral("--print-address")});
    ASSERT_TRUE(daemon.waitForReadyRead()) << daemon.readAllStandardError().toStdString();
    address = QString::fromUtf8(daemon.readLine()).trimmed();
  }

  QDBusConnection viewersSide() { return QDBusConnection::connectToBus(address, QStringLiteral("viewer's side")); }

  void startPortal() {
    auto bus = QDBusConnection::connectToBus(address, QStringLiteral("portal's side"));
    ASSERT_TRUE(bus.registerObject(QString::fromLatin1(qt::Appearance::portalPath), &portal,
                                   QDBusConnection::ExportAllSlots | QDBusConnection::ExportAllSignals));
    ASSERT_TRUE(bus.registerService(QString::fromLatin1(qt::Appearance::portalService)));
  }

  void ask() {
    startPortal();
    appearance = std::make_unique<qt::Appearance>(viewersSide());
    EXPECT_FALSE(appearance->settled());
    ASSERT_TRUE(waitUntil([this] { return appearance->settled(); }));
  }

  const QTemporaryDir folder;
  QProcess daemon;
  QString address;
  FakePortal portal;
};

TEST_F(SystemAppearance, IsReadFromThePortal) {
  portal.settings[look + QLatin1Char('/') + scheme] = preferDark;
  portal.settings[desktop + QLatin1Char('/') + textScale] = 1.5;
  ask();
  EXPECT_TRUE(appearance->dark());
  EXPECT_DOUBLE_EQ(appearance->textScale(), 1.5);
}

TEST_F(SystemAppearance, TheWindowFollowsThePortalLive) {
  portal.settings[look + QLatin1Char('/') + scheme] = preferLight;
  ask();
  show();
  EXPECT_FALSE(theme().property("dark").toBool());
  const auto light = theme().property("ground").value<QColor>();
  portal.set(look, scheme, preferDark);
  ASSERT_TRUE(waitUntil([this] { return theme().property("dark").toBool(); }));
  EXPECT_NE(theme().property("ground").value<QColor>(), light);
  rest();
  EXPECT_EQ(window().grabWindow().pixelColor(180, 600), theme().property("ground").value<QColor>());
  portal.set(desktop, textScale, 1.75);
  ASSERT_TRUE(waitUntil([this] { return theme().property("textScale").toDouble() == 1.75; }));
  portal.set(look, scheme, preferLight);
  ASSERT_TRUE(waitUntil([this] { return !theme().property("dark").toBool(); }));
}

TEST_F(SystemAppearance, TextGrowsToTwiceItsSizeAndNoFurther) {
  portal.settings[desktop + QLatin1Char('/') + textScale] = 3.5;
  ask();
  EXPECT_DOUBLE_EQ(appearance->textScale(), 2.0);
}

TEST_F(SystemAppearance, SettingsOfOthersChangeNothing) {
  ask();
  QSignalSpy changes(appearance.get(), &qt::Appearance::changed);
  portal.set(QStringLiteral("org.gnome.desktop.background"), scheme, preferDark);
  portal.set(look, QStringLiteral("accent-color"), 7u);
  portal.set(look, scheme, preferDark);
  ASSERT_TRUE(waitUntil([&] { return !changes.isEmpty(); }));
  EXPECT_EQ(changes.size(), 1) << "only the last of the three counts";
}

TEST_F(SystemAppearance, WithoutAPortalQtDecides) {
  appearance = std::make_unique<qt::Appearance>(QDBusConnection(QStringLiteral("unconnected")));
  EXPECT_TRUE(appearance->settled());
  EXPECT_FALSE(appearance->dark());
  const QPalette before = QGuiApplication::palette();
  QGuiApplication::setPalette(QPalette(QColor(20, 20, 20)));
  EXPECT_TRUE(waitUntil([this] { return appearance->dark(); }));
  QGuiApplication::setPalette(before);
  EXPECT_TRUE(waitUntil([this] { return !appearance->dark(); }));
}

TEST_F(SystemAppearance, WithoutAPortalALargerSystemFontEnlargesTheText) {
  appearance = std::make_unique<qt::Appearance>(QDBusConnection(QStringLiteral("unconnected")));
  EXPECT_DOUBLE_EQ(appearance->textScale(), 1.0);
  const QFont before = QGuiApplication::font();
  QFont large = before;
  large.setPixelSize(24);
  QGuiApplication::setFont(large);
  EXPECT_TRUE(waitUntil([this] { return appearance->textScale() > 1.5; }));
  QGuiApplication::setFont(before);
}

TEST_F(SystemAppearance, ABusWithoutAPortalLeavesTheChoiceToQt) {
  appearance = std::make_unique<qt::Appearance>(viewersSide());
  EXPECT_TRUE(waitUntil([this] { return appearance->settled(); }));
  EXPECT_FALSE(appearance->dark());
  EXPECT_DOUBLE_EQ(appearance->textScale(), 1.0);
}

TEST_F(SystemAppearance, APortalThatComesLateIsFollowed) {
  appearance = std::make_unique<qt::Appearance>(viewersSide());
  ASSERT_TRUE(waitUntil([this] { return appearance->settled(); }));
  startPortal();
  portal.set(look, scheme, preferDark);
  EXPECT_TRUE(waitUntil([this] { return appearance->dark(); }));
}

TEST_F(SystemAppearance, ABusThatGoesAwayChangesNothing) {
  portal.settings[look + QLatin1Char('/') + scheme] = preferDark;
  ask();
  auto bus = viewersSide();
  daemon.terminate();
  daemon.waitForFinished();
  ASSERT_TRUE(waitUntil([&] { return !bus.isConnected(); }));
  EXPECT_TRUE(appearance->dark());
}

}  // namespace
}  // namespace probeview

#include "appearance_test.moc"
