// SPDX-License-Identifier: Apache-2.0
#include "ui/terminal/list_view.h"

#include <algorithm>
#include <utility>

namespace probeview::terminal {

ListView::ListView(ListPage& page, std::function<void()> didReload)
    : page_(page), didReload_(std::move(didReload)), shown_(takeSnapshot(page)), selection_(placeOf(0)) {
  layOutAgain();
  page_.setReloadObserver([this] { reload(); });
}

ListView::~ListView() { page_.setReloadObserver({}); }

void ListView::resize(int width, int height) {
  width_ = width;
  height_ = std::max(height, 1);
  layOutAgain();
  showSelection();
}

const ListCell* ListView::selectedCell() const {
  return selection_ ? &shown_.sections[selection_->section].rows[selection_->row] : nullptr;
}

void ListView::moveSelection(std::ptrdiff_t rows) {
  const auto count = static_cast<std::ptrdiff_t>(shown_.rowCount());
  if (count == 0) return;
  const auto from = selection_ ? static_cast<std::ptrdiff_t>(flatIndex(*selection_)) : 0;
  selection_ = placeOf(static_cast<std::size_t>(std::clamp<std::ptrdiff_t>(from + rows, 0, count - 1)));
  showSelection();
}

void ListView::moveByScreens(int screens) {
  if (!selection_) return;
  // The line a screen further on, and the row that it belongs to or that is nearest in the direction of the move.
  const auto extent = layout_.extentOf(*selection_);
  const auto last = static_cast<std::ptrdiff_t>(layout_.lines.size()) - 1;
  const auto wanted = std::clamp<std::ptrdiff_t>(
      static_cast<std::ptrdiff_t>(extent.first) + static_cast<std::ptrdiff_t>(screens) * height_, 0, last);
  const std::ptrdiff_t step = screens > 0 ? 1 : -1;
  for (auto line = wanted; line >= 0 && line <= last; line += step) {
    const auto& candidate = layout_.lines[static_cast<std::size_t>(line)];
    if (candidate.kind != LaidOutLine::Kind::Row) continue;
    selection_ = candidate.place;
    return showSelection();
  }
  screens > 0 ? selectLast() : selectFirst();
}

void ListView::selectFirst() {
  selection_ = placeOf(0);
  showSelection();
}

void ListView::selectLast() {
  const auto count = shown_.rowCount();
  selection_ = count > 0 ? placeOf(count - 1) : std::nullopt;
  showSelection();
}

void ListView::reload() {
  auto fresh = takeSnapshot(page_);
  const auto edits = snapshotDifference(shown_, fresh);
  if (!edits.empty()) {
    // The selected row stays on the line of the screen on which it is.
    std::optional<std::ptrdiff_t> lineOnScreen;
    std::size_t index = 0;
    if (selection_) {
      lineOnScreen =
          static_cast<std::ptrdiff_t>(layout_.extentOf(*selection_).first) - static_cast<std::ptrdiff_t>(firstLine_);
      index = flatIndex(*selection_);
      selection_ = followRow(*selection_, edits);
    }
    shown_ = std::move(fresh);
    const auto count = shown_.rowCount();
    // A row that went hands its selection to the one that took its place.
    if (!selection_ && count > 0) selection_ = placeOf(std::min(index, count - 1));
    layOutAgain();
    if (selection_ && lineOnScreen) {
      const auto line = static_cast<std::ptrdiff_t>(layout_.extentOf(*selection_).first) - *lineOnScreen;
      firstLine_ = std::min(static_cast<std::size_t>(std::max<std::ptrdiff_t>(line, 0)), lastFirstLine());
    }
    showSelection();
  }
  didReload_();
}

void ListView::layOutAgain() {
  layout_ = layOut(shown_, width_);
  firstLine_ = std::min(firstLine_, lastFirstLine());
}

std::size_t ListView::flatIndex(RowPlace place) const {
  std::size_t index = place.row;
  for (std::size_t section = 0; section < place.section; ++section) index += shown_.sections[section].rows.size();
  return index;
}

std::optional<RowPlace> ListView::placeOf(std::size_t flatIndex) const {
  for (std::size_t section = 0; section < shown_.sections.size(); ++section) {
    const auto count = shown_.sections[section].rows.size();
    if (flatIndex < count) return RowPlace{section, flatIndex};
    flatIndex -= count;
  }
  return std::nullopt;
}

void ListView::showSelection() {
  if (!selection_) return;
  auto [first, end] = layout_.extentOf(*selection_);
  // A header belongs to the row below it.
  while (first > 0 && layout_.lines[first - 1].kind == LaidOutLine::Kind::Header) --first;
  const auto height = static_cast<std::size_t>(height_);
  if (end > firstLine_ + height) firstLine_ = end - height;
  if (first < firstLine_) firstLine_ = first;
  firstLine_ = std::min(firstLine_, lastFirstLine());
}

std::size_t ListView::lastFirstLine() const {
  const auto height = static_cast<std::size_t>(height_);
  return layout_.lines.size() > height ? layout_.lines.size() - height : 0;
}

}  // namespace probeview::terminal
