// SPDX-License-Identifier: Apache-2.0
#include "ui/snapshot_difference.h"

#include <algorithm>
#include <map>
#include <optional>
#include <string_view>
#include <utility>

namespace probeview {

namespace {

using Rows = std::vector<ListCell>;
using Kind = SnapshotEdit::Kind;

// What a row is known by: its label, and which one it is of the rows of that label.
using RowName = std::pair<std::optional<std::string_view>, std::size_t>;

std::vector<RowName> namesOf(const Rows& rows) {
  std::map<std::optional<std::string_view>, std::size_t> seen;
  std::vector<RowName> names;
  names.reserve(rows.size());
  for (const auto& row : rows) {
    const std::optional<std::string_view> label = row.text ? std::optional<std::string_view>(*row.text) : std::nullopt;
    names.emplace_back(label, seen[label]++);
  }
  return names;
}

// For each row of the one after, the row of the one before that it is; increasing, so that a list can keep them in
// place. The most rows that can be kept: a longest increasing subsequence.
std::vector<std::optional<std::size_t>> keptRows(const Rows& before, const Rows& after) {
  std::vector<std::optional<std::size_t>> kept(after.size());
  // The usual case costs no search: the same labels in the same order.
  const auto sameLabel = [](const ListCell& left, const ListCell& right) { return left.text == right.text; };
  if (std::equal(before.begin(), before.end(), after.begin(), after.end(), sameLabel)) {
    for (std::size_t row = 0; row < kept.size(); ++row) kept[row] = row;
    return kept;
  }

  std::map<RowName, std::size_t> places;
  const auto namesBefore = namesOf(before);
  for (std::size_t row = 0; row < namesBefore.size(); ++row) places.emplace(namesBefore[row], row);
  const auto namesAfter = namesOf(after);
  std::vector<std::optional<std::size_t>> matches(after.size());
  // ends[n]: the row (of the one after) that ends the best run of n + 1 rows found so far.
  std::vector<std::size_t> ends;
  std::vector<std::optional<std::size_t>> previous(after.size());
  for (std::size_t row = 0; row < namesAfter.size(); ++row) {
    const auto place = places.find(namesAfter[row]);
    if (place == places.end()) continue;
    matches[row] = place->second;
    const auto at = std::lower_bound(ends.begin(), ends.end(), row, [&](std::size_t left, std::size_t right) {
      return matches[left] < matches[right];
    });
    if (at != ends.begin()) previous[row] = *(at - 1);
    if (at == ends.end()) {
      ends.push_back(row);
    } else {
      *at = row;
    }
  }
  for (auto row = ends.empty() ? std::nullopt : std::optional(ends.back()); row; row = previous[*row]) {
    kept[*row] = matches[*row];
  }
  return kept;
}

// Calls back for each run [first, first + count) of indexes that hold, from the last to the first or the other way.
template <typename Holds, typename Run>
void forEachRun(std::size_t size, bool backwards, Holds holds, Run run) {
  std::vector<std::pair<std::size_t, std::size_t>> runs;
  for (std::size_t index = 0; index < size; ++index) {
    if (!holds(index)) continue;
    if (!runs.empty() && runs.back().first + runs.back().second == index) {
      ++runs.back().second;
    } else {
      runs.emplace_back(index, 1);
    }
  }
  if (backwards) std::reverse(runs.begin(), runs.end());
  for (const auto& [first, count] : runs) run(first, count);
}

void appendRowEdits(std::size_t section, const Rows& before, const Rows& after, std::vector<SnapshotEdit>& edits) {
  const auto kept = keptRows(before, after);
  std::vector<bool> stays(before.size());
  for (const auto& row : kept) {
    if (row) stays[*row] = true;
  }
  const auto edit = [&](Kind kind) {
    return [&edits, kind, section](std::size_t first, std::size_t count) {
      edits.push_back({kind, section, first, count});
    };
  };
  // Removed from the end, inserted from the start: so each index is right at its turn.
  forEachRun(
      before.size(), true, [&](std::size_t row) { return !stays[row]; }, edit(Kind::RemoveRows));
  forEachRun(
      after.size(), false, [&](std::size_t row) { return !kept[row]; }, edit(Kind::InsertRows));
  forEachRun(
      after.size(), false, [&](std::size_t row) { return kept[row] && before[*kept[row]] != after[row]; },
      edit(Kind::ChangeRows));
}

template <typename Element>
auto at(std::vector<Element>& elements, std::size_t index) {
  return elements.begin() + static_cast<std::ptrdiff_t>(index);
}
template <typename Element>
auto at(const std::vector<Element>& elements, std::size_t index) {
  return elements.begin() + static_cast<std::ptrdiff_t>(index);
}

}  // namespace

std::vector<SnapshotEdit> snapshotDifference(const PageSnapshot& before, const PageSnapshot& after) {
  std::vector<SnapshotEdit> edits;
  const std::size_t common = std::min(before.sections.size(), after.sections.size());
  for (std::size_t section = 0; section < common; ++section) {
    const auto& old = before.sections[section];
    const auto& fresh = after.sections[section];
    if (old.title != fresh.title) edits.push_back({Kind::ChangeTitle, section});
    appendRowEdits(section, old.rows, fresh.rows, edits);
  }
  if (before.sections.size() > common) {
    edits.push_back({Kind::RemoveSections, common, 0, before.sections.size() - common});
  }
  if (after.sections.size() > common) {
    edits.push_back({Kind::InsertSections, common, 0, after.sections.size() - common});
  }
  return edits;
}

void applyEdit(PageSnapshot& shown, const SnapshotEdit& edit, const PageSnapshot& after) {
  auto& sections = shown.sections;
  switch (edit.kind) {
    case Kind::RemoveRows: {
      auto& rows = sections[edit.section].rows;
      rows.erase(at(rows, edit.first), at(rows, edit.first + edit.count));
      return;
    }
    case Kind::InsertRows: {
      auto& rows = sections[edit.section].rows;
      const auto& fresh = after.sections[edit.section].rows;
      rows.insert(at(rows, edit.first), at(fresh, edit.first), at(fresh, edit.first + edit.count));
      return;
    }
    case Kind::ChangeRows: {
      const auto& fresh = after.sections[edit.section].rows;
      std::copy(at(fresh, edit.first), at(fresh, edit.first + edit.count), at(sections[edit.section].rows, edit.first));
      return;
    }
    case Kind::ChangeTitle:
      sections[edit.section].title = after.sections[edit.section].title;
      return;
    case Kind::RemoveSections:
      sections.erase(at(sections, edit.section), at(sections, edit.section + edit.count));
      return;
    case Kind::InsertSections:
      sections.insert(at(sections, edit.section), at(after.sections, edit.section),
                      at(after.sections, edit.section + edit.count));
      return;
  }
}

std::optional<RowPlace> followRow(RowPlace place, const std::vector<SnapshotEdit>& edits) {
  for (const auto& edit : edits) {
    switch (edit.kind) {
      case Kind::RemoveRows:
        if (edit.section != place.section || place.row < edit.first) break;
        if (place.row < edit.first + edit.count) return std::nullopt;
        place.row -= edit.count;
        break;
      case Kind::InsertRows:
        if (edit.section == place.section && edit.first <= place.row) place.row += edit.count;
        break;
      case Kind::RemoveSections:
        if (place.section < edit.section) break;
        if (place.section < edit.section + edit.count) return std::nullopt;
        place.section -= edit.count;
        break;
      case Kind::InsertSections:
        if (edit.section <= place.section) place.section += edit.count;
        break;
      case Kind::ChangeRows:
      case Kind::ChangeTitle:
        break;
    }
  }
  return place;
}

}  // namespace probeview
