// SPDX-License-Identifier: Apache-2.0
#include "ui/qt/pictures.h"

#include <QEventLoop>
#include <QGuiApplication>
#include <QImage>
#include <QPainter>
#include <QPainterPath>
#include <QSaveFile>
#include <QTimer>
#include <chrono>
#include <ostream>
#include <utility>

#include "ui/open_page.h"
#include "ui/qt/appearance.h"
#include "ui/qt/qt_main_queue.h"
#include "ui/qt/viewer.h"
#include "ui/qt/window_engine.h"

namespace probeview::qt {

namespace {

using namespace std::chrono_literals;

// What is waited for at most, and how often is asked.
constexpr auto patience = 15s;
constexpr auto askInterval = 100ms;

// The screen of a usual phone, and what surrounds it on the sheet. Pixels.
constexpr QSize screen(360, 720);
constexpr int distance = 28;
constexpr int cornerRadius = 22;
constexpr QColor paper(0xc9, 0xd2, 0xd8);
constexpr QColor rim(0x5a, 0x68, 0x70);

class PicturesFrontOnQt final : public PicturesFront {
 public:
  PicturesFrontOnQt(int& argc, char** argv, PicturesOptions options, std::ostream& errors)
      : application_(argc, argv),
        appearance_(QDBusConnection(QStringLiteral("no bus: pictures look alike everywhere"))),
        options_(std::move(options)),
        errors_(errors) {}

  TaskQueue& mainQueue() override { return mainQueue_; }
  Scheduler& scheduler() override { return scheduler_; }
  void waitUntil(std::function<bool()> isFilled) override { isFilled_ = std::move(isFilled); }

  int run(NavigationStack& navigation, const StatusSource& status) override {
    waitForContent();
    std::vector<QImage> lights;
    std::vector<QImage> darks;
    const auto take = [&] { draw(navigation, status, lights, darks); };
    navigation.popToRoot();
    take();
    for (const auto& key : options_.pageKeys) {
      if (!openPage(navigation, key)) {
        errors_ << "there is no page \"" << key
                << "\"; name a technology and one of its categories, as in \"LTE NAS\"\n";
        return 1;
      }
      if (&key == &options_.pageKeys.front()) {
        // The list on the way to the first page.
        navigation.pop();
        take();
        openPage(navigation, key);
      }
      take();
      navigation.popToRoot();
    }
    std::vector<std::vector<QImage>> rows;
    if (options_.light) rows.push_back(std::move(lights));
    if (options_.dark) rows.push_back(std::move(darks));
    return write(sheet(rows));
  }

 private:
  void waitForContent() {
    if (!isFilled_) return;
    QEventLoop turn;
    const auto asking = scheduler_.every(askInterval, [&] {
      if (isFilled_()) turn.quit();
    });
    const auto end = scheduler_.after(patience, [&] { turn.quit(); });
    turn.exec();
  }

  // The page that the stack stands on, in both looks.
  void draw(NavigationStack& navigation, const StatusSource& status, std::vector<QImage>& lights,
            std::vector<QImage>& darks) {
    Viewer viewer(navigation, status, scheduler_, appearance_);
    Window window(viewer);
    window.quickWindow().resize(screen);
    window.quickWindow().setVisible(true);
    for (const bool dark : {false, true}) {
      window.theme().setProperty("dark", dark);
      awaitFrame(window.quickWindow());
      (dark ? darks : lights).push_back(window.quickWindow().grabWindow());
    }
  }

  static void awaitFrame(QQuickWindow& window) {
    QEventLoop turn;
    QObject::connect(&window, &QQuickWindow::frameSwapped, &turn, &QEventLoop::quit);
    window.update();
    turn.exec();
  }

  static QImage sheet(const std::vector<std::vector<QImage>>& rows) {
    const auto columns = static_cast<int>(rows.front().size());
    const auto lines = static_cast<int>(rows.size());
    QImage sheet(columns * (screen.width() + distance) + distance, lines * (screen.height() + distance) + distance,
                 QImage::Format_RGB32);
    sheet.fill(paper);
    QPainter painter(&sheet);
    painter.setRenderHint(QPainter::Antialiasing);
    QPoint place(distance, distance);
    for (const auto& row : rows) {
      for (const auto& picture : row) {
        QPainterPath outline;
        outline.addRoundedRect(QRectF(place, QSizeF(screen)), cornerRadius, cornerRadius);
        painter.save();
        painter.setClipPath(outline);
        painter.drawImage(place, picture);
        painter.restore();
        painter.setPen(QPen(rim, 1.5));
        painter.drawPath(outline);
        place.rx() += screen.width() + distance;
      }
      place = QPoint(distance, place.y() + screen.height() + distance);
    }
    return sheet;
  }

  int write(const QImage& picture) {
    QSaveFile file(QString::fromStdString(options_.outputPath));
    if (file.open(QIODevice::WriteOnly) && picture.save(&file, "PNG") && file.commit()) return 0;
    errors_ << "the picture " << options_.outputPath << " cannot be written: " << file.errorString().toStdString()
            << "; name another file\n";
    return 1;
  }

  QGuiApplication application_;
  Appearance appearance_;
  QtMainQueue mainQueue_;
  QtScheduler scheduler_;
  PicturesOptions options_;
  std::ostream& errors_;
  std::function<bool()> isFilled_;
};

}  // namespace

std::unique_ptr<PicturesFront> makePicturesFront(int& argc, char** argv, PicturesOptions options,
                                                 std::ostream& errors) {
  // No display is needed, and none is used where there is one.
  qputenv("QT_QPA_PLATFORM", "offscreen");
  qputenv("QT_QUICK_BACKEND", "software");
  prepareWindows();
  return std::make_unique<PicturesFrontOnQt>(argc, argv, std::move(options), errors);
}

}  // namespace probeview::qt
