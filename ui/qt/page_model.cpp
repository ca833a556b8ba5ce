// SPDX-License-Identifier: Apache-2.0
#include "ui/qt/page_model.h"

#include <algorithm>
#include <utility>

#include "ui/interface_description.h"

namespace probeview::qt {

namespace {

QString textOf(const std::optional<std::string>& text) { return text ? QString::fromStdString(*text) : QString(); }

}  // namespace

PageModel::PageModel(ListPage& page, QObject* parent)
    : QAbstractListModel(parent),
      page_(&page),
      title_(QString::fromStdString(page.title())),
      shown_(takeSnapshot(page)) {
  countRows();
  page.setReloadObserver([this] { reload(); });
}

PageModel::~PageModel() { detach(); }

void PageModel::detach() {
  if (page_ != nullptr) page_->setReloadObserver({});
  page_ = nullptr;
  reloadDue_ = false;
}

void PageModel::setHeld(bool held) {
  if (held_ == held) return;
  held_ = held;
  emit heldChanged();
  if (!held_ && reloadDue_) reload();
}

QString PageModel::sectionTitle(int section) const {
  const auto number = static_cast<std::size_t>(section);
  return number < shown_.sections.size() ? textOf(shown_.sections[number].title) : QString();
}

int PageModel::rowAfter(int row) const {
  for (int next = row + 1; next < rowCount(); ++next) {
    if (cell(next) != nullptr) return next;
  }
  return -1;
}

int PageModel::rowBefore(int row) const {
  for (int next = row - 1; next >= 0; --next) {
    if (cell(next) != nullptr) return next;
  }
  return -1;
}

const ListCell* PageModel::cell(int row) const {
  if (row < 0 || row >= rowCount()) return nullptr;
  const auto place = placeOf(row);
  const auto& rows = shown_.sections[place.section].rows;
  return rows.empty() ? nullptr : &rows[place.row];
}

int PageModel::rowCount(const QModelIndex& parent) const { return parent.isValid() ? 0 : starts_.back(); }

QVariant PageModel::data(const QModelIndex& index, int role) const {
  if (!checkIndex(index, CheckIndexOption::IndexIsValid)) return {};
  const auto* shown = cell(index.row());
  switch (role) {
    case LabelRole:
      return shown != nullptr ? textOf(shown->text) : QString();
    case ValueRole:
      return shown != nullptr ? textOf(shown->detail) : QString();
    case HasValueRole:
      return shown != nullptr && shown->detail.has_value();
    case IsShownRole:
      return shown != nullptr;
    case DisclosureRole:
      return shown != nullptr && showsDisclosure(shown->identifier);
    case SpokenRole:
      return shown != nullptr ? QString::fromStdString(accessibleLabel(*shown)) : QString();
    case SectionRole:
      return static_cast<int>(placeOf(index.row()).section);
    default:  // Qt asks for roles of its own, as a number
      return {};
  }
}

QHash<int, QByteArray> PageModel::roleNames() const {
  return {{LabelRole, "label"},           {ValueRole, "value"},   {HasValueRole, "hasValue"}, {IsShownRole, "isShown"},
          {DisclosureRole, "disclosure"}, {SpokenRole, "spoken"}, {SectionRole, "section"}};
}

void PageModel::reload() {
  if (page_ == nullptr) return;
  reloadDue_ = held_;
  if (held_) return;
  follow(takeSnapshot(*page_));
  emit reloaded();
}

void PageModel::follow(const PageSnapshot& after) {
  // Changed rows of a section are announced as one stretch: a list view takes longer to hear of a thousand changes than
  // to read the few rows in sight once more.
  std::optional<std::pair<int, int>> changed;
  const auto announce = [&] {
    if (changed) announceChange(changed->first, changed->second);
    changed.reset();
  };
  std::size_t section = 0;
  for (const auto& edit : snapshotDifference(shown_, after)) {
    if (edit.kind != SnapshotEdit::Kind::ChangeRows || edit.section != section) announce();
    section = edit.section;
    if (edit.kind != SnapshotEdit::Kind::ChangeRows) {
      apply(edit, after);
      continue;
    }
    applyEdit(shown_, edit, after);
    const int first = start(section) + static_cast<int>(edit.first);
    const int last = first + static_cast<int>(edit.count) - 1;
    changed =
        changed ? std::pair(std::min(changed->first, first), std::max(changed->second, last)) : std::pair(first, last);
  }
  announce();
}

void PageModel::apply(const SnapshotEdit& edit, const PageSnapshot& after) {
  using Kind = SnapshotEdit::Kind;
  const auto count = static_cast<int>(edit.count);
  switch (edit.kind) {
    case Kind::RemoveRows: {
      const int first = start(edit.section) + static_cast<int>(edit.first);
      // The last row of a section stays, as the one that is not shown.
      const bool emptied = edit.count == shown_.sections[edit.section].rows.size();
      const int going = emptied ? count - 1 : count;
      if (going > 0) beginRemoveRows({}, first, first + going - 1);
      applyEdit(shown_, edit, after);
      countRows(edit.section);
      if (going > 0) endRemoveRows();
      if (emptied) announceChange(first, first);
      return;
    }
    case Kind::InsertRows: {
      const int first = start(edit.section) + static_cast<int>(edit.first);
      // The row that is not shown becomes the first one.
      const bool filled = shown_.sections[edit.section].rows.empty();
      const int coming = filled ? count - 1 : count;
      if (coming > 0) beginInsertRows({}, filled ? first + 1 : first, first + (filled ? 1 : 0) + coming - 1);
      applyEdit(shown_, edit, after);
      countRows(edit.section);
      if (coming > 0) endInsertRows();
      if (filled) announceChange(first, first);
      return;
    }
    case Kind::ChangeRows:
      return;  // see follow()
    case Kind::ChangeTitle:
      applyEdit(shown_, edit, after);
      ++titleRevision_;
      emit titlesChanged();
      return;
    case Kind::RemoveSections:
      beginRemoveRows({}, start(edit.section), start(edit.section + edit.count) - 1);
      applyEdit(shown_, edit, after);
      countRows(edit.section);
      endRemoveRows();
      return;
    case Kind::InsertSections: {
      int coming = 0;
      for (std::size_t section = edit.section; section < edit.section + edit.count; ++section) {
        coming += extent(after.sections[section]);
      }
      beginInsertRows({}, start(edit.section), start(edit.section) + coming - 1);
      applyEdit(shown_, edit, after);
      countRows(edit.section);
      endInsertRows();
      // A header may have been asked for by its number before its section came.
      ++titleRevision_;
      emit titlesChanged();
      return;
    }
  }
}

int PageModel::extent(const PageSnapshot::Section& section) {
  return std::max(1, static_cast<int>(section.rows.size()));
}

void PageModel::countRows(std::size_t fromSection) {
  starts_.resize(shown_.sections.size() + 1);
  for (std::size_t section = fromSection; section < shown_.sections.size(); ++section) {
    starts_[section + 1] = starts_[section] + extent(shown_.sections[section]);
  }
}

PageModel::Place PageModel::placeOf(int row) const {
  const auto section = std::upper_bound(starts_.begin(), starts_.end(), row) - starts_.begin() - 1;
  return {static_cast<std::size_t>(section),
          static_cast<std::size_t>(row - starts_[static_cast<std::size_t>(section)])};
}

void PageModel::announceChange(int first, int last) { emit dataChanged(index(first), index(last)); }

}  // namespace probeview::qt
