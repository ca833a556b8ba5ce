// SPDX-License-Identifier: Apache-2.0
#include "ui/page_snapshot.h"

#include <algorithm>
#include <string_view>

#include "values/plain_text.h"

namespace probeview {

namespace {

// Characters, not bytes, so that columns line up.
std::size_t characterCount(std::string_view text) {
  return static_cast<std::size_t>(
      std::count_if(text.begin(), text.end(), [](char byte) { return (byte & 0xc0) != 0x80; }));
}

}  // namespace

std::size_t PageSnapshot::rowCount() const {
  std::size_t count = 0;
  for (const auto& section : sections) count += section.rows.size();
  return count;
}

PageSnapshot takeSnapshot(ListContent& content) {
  PageSnapshot snapshot;
  const std::size_t sectionCount = content.numberOfSectionsInTableView();
  snapshot.sections.reserve(sectionCount);
  for (std::size_t section = 0; section < sectionCount; ++section) {
    auto& taken = snapshot.sections.emplace_back();
    taken.title = content.titleForHeaderInSection(section);
    taken.rows.resize(content.numberOfRowsInSection(section));
    for (std::size_t row = 0; row < taken.rows.size(); ++row)
      content.cellForRowAtIndexPath(section, row, taken.rows[row]);
  }
  return snapshot;
}

std::string accessibleLabel(const ListCell& cell) {
  if (!cell.detail) return cell.text.value_or("");
  if (!cell.text) return *cell.detail;
  return *cell.text + ", " + *cell.detail;
}

std::string plainText(const PageSnapshot& snapshot) {
  std::size_t labelWidth = 0;
  for (const auto& section : snapshot.sections) {
    for (const auto& row : section.rows) {
      if (row.text && row.detail) labelWidth = std::max(labelWidth, characterCount(onOneLine(*row.text)));
    }
  }
  std::string out;
  for (const auto& section : snapshot.sections) {
    if (section.title) out += onOneLine(*section.title) + "\n";
    for (const auto& row : section.rows) {
      const std::string label = onOneLine(row.text.value_or(""));
      std::string line = "  " + label;
      if (row.detail) {
        const std::size_t written = characterCount(label);
        line.append((written < labelWidth ? labelWidth - written : 0) + 2, ' ');
        appendOnOneLine(*row.detail, line);
      }
      line.erase(line.find_last_not_of(' ') + 1);
      out += line + "\n";
    }
  }
  return out;
}

}  // namespace probeview
