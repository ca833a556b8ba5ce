// SPDX-License-Identifier: Apache-2.0
//
// All answers of a list, taken at one moment. A front takes one per reload: asking the store anew for every row that
// scrolls by would be slow, and rows of one picture could come from two moments.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "ui/list_content.h"

namespace probeview {

struct PageSnapshot {
  struct Section {
    std::optional<std::string> title;
    std::vector<ListCell> rows;

    friend bool operator==(const Section&, const Section&) = default;
  };
  std::vector<Section> sections;

  std::size_t rowCount() const;  // of all sections
  friend bool operator==(const PageSnapshot&, const PageSnapshot&) = default;
};

// Asks each question once: the number of sections; then, section by section, the title, the number of rows and the
// cells. Cells come cleared, so that a cell that the page leaves alone is blank.
PageSnapshot takeSnapshot(ListContent& content);

// How a row is read out: "label, value"; a label that is absent is left out.
std::string accessibleLabel(const ListCell& cell);

// The page as plain text, one line per row:
//   EUTRA Neighbor 0
//     earfcn  1300
// Labels are padded to one column per page; a blank row stays blank. What would end a line or steer a terminal stands
// as its escape.
std::string plainText(const PageSnapshot& snapshot);

}  // namespace probeview
