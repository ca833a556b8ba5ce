// SPDX-License-Identifier: Apache-2.0
//
// What changed between two snapshots of a page, as edits that a list can follow without losing its scroll position or
// its selection.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "ui/page_snapshot.h"

namespace probeview {

struct SnapshotEdit {
  enum class Kind : std::uint8_t {
    RemoveRows,      // rows [first, first + count) of the section go
    InsertRows,      // the after-snapshot's rows [first, first + count) of the section come
    ChangeRows,      // the same rows with other content
    ChangeTitle,     // of the section
    RemoveSections,  // sections [section, section + count) go, with their rows
    InsertSections,  // the after-snapshot's sections [section, section + count) come, with their rows
  };
  Kind kind;
  std::size_t section;
  std::size_t first = 0;
  std::size_t count = 0;

  friend bool operator==(const SnapshotEdit&, const SnapshotEdit&) = default;
};

// The edits that turn the one into the other when applied in order, each to the result of the one before it. Sections
// are the same by their number, rows within a section by their label (the n-th of several that read alike). A row
// whose label stays is never removed unless rows changed their order.
std::vector<SnapshotEdit> snapshotDifference(const PageSnapshot& before, const PageSnapshot& after);

// Applies one edit of a difference; the rows and sections that come are taken from the after-snapshot.
void applyEdit(PageSnapshot& shown, const SnapshotEdit& edit, const PageSnapshot& after);

// Where a row is.
struct RowPlace {
  std::size_t section = 0;
  std::size_t row = 0;

  friend auto operator<=>(const RowPlace&, const RowPlace&) = default;
};

// Where a row of the one snapshot is in the other; absent when it is gone.
std::optional<RowPlace> followRow(RowPlace place, const std::vector<SnapshotEdit>& edits);

}  // namespace probeview
