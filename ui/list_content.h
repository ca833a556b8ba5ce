// SPDX-License-Identifier: Apache-2.0
//
// What a list asks of whoever fills it: four questions, no toolkit. Main thread.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace probeview {

// A reusable list cell with a main label and a detail label. A label that nobody sets stays absent and is drawn blank.
struct ListCell {
  std::string_view identifier;  // which prototype it is made from; a constant
  std::optional<std::string> text;
  std::optional<std::string> detail;

  friend bool operator==(const ListCell&, const ListCell&) = default;
};

class ListContent {
 public:
  virtual ~ListContent() = default;

  virtual std::size_t numberOfSectionsInTableView() = 0;
  // Absent: the section has no header.
  virtual std::optional<std::string> titleForHeaderInSection(std::size_t section) = 0;
  virtual std::size_t numberOfRowsInSection(std::size_t section) = 0;
  // Fills a cell that comes cleared. A section or row past the end stops the program.
  virtual void cellForRowAtIndexPath(std::size_t section, std::size_t row, ListCell& cell) = 0;
};

}  // namespace probeview
