// SPDX-License-Identifier: Apache-2.0
#include "ui/qt/viewer.h"

#include <QFontDatabase>
#include <QFontInfo>
#include <utility>

#include "ui/status_line.h"

namespace probeview::qt {

namespace {

// Digits of equal width, so that a value that changes does not dance. Empty if this machine has no such font.
QString equalWidthFamily() {
  const QFontInfo info(QFontDatabase::systemFont(QFontDatabase::FixedFont));
  return info.fixedPitch() ? info.family() : QString();
}

}  // namespace

Viewer::Viewer(NavigationStack& stack, StatusSource status, Scheduler& scheduler, Appearance& appearance)
    : stack_(stack), appearance_(appearance), valueFamily_(equalWidthFamily()), status_(std::move(status)) {
  for (std::size_t page = 0; page < stack_.depth(); ++page) pages_.push_back(new PageModel(stack_.page(page), this));
  stack_.setObserver(this);
  connect(&appearance, &Appearance::changed, this, &Viewer::appearanceChanged);
  if (!status_) return;
  refreshStatus();
  statusTimer_ = scheduler.every(StatusLine::refreshInterval, [this] { refreshStatus(); });
}

Viewer::~Viewer() { stack_.setObserver(nullptr); }

void Viewer::refreshStatus() {
  if (!status_) return;
  auto status = status_();
  if (shownStatus_ == status) return;
  shownStatus_ = std::move(status);
  emit statusChanged();
}

QList<QObject*> Viewer::firstPages() const { return QList<QObject*>(pages_.begin(), pages_.end()); }

QObject* Viewer::open(int row) {
  const auto* tapped = topPage()->cell(row);
  if (tapped == nullptr) return nullptr;
  // A copy: the page may reload while its destination is made.
  const ListCell cell = *tapped;
  return stack_.tap(cell) ? topPage() : nullptr;
}

void Viewer::back() {
  // The line speaks of the page that is on top.
  if (stack_.pop()) refreshStatus();
}

void Viewer::release(QObject* page) {
  if (page != nullptr) page->deleteLater();
}

void Viewer::didPush(ListPage& page) {
  pages_.push_back(new PageModel(page, this));
  refreshStatus();
}

void Viewer::willPop(ListPage&) {
  pages_.back()->detach();
  pages_.pop_back();
}

}  // namespace probeview::qt
