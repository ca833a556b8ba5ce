// SPDX-License-Identifier: Apache-2.0
#include "ui/first_level_view_controller.h"

#include "platform/fatal_error.h"
#include "ui/list_index.h"
#include "ui/second_level_view_controller.h"

namespace probeview {

FirstLevelViewController::FirstLevelViewController(const PageEnvironment& environment)
    : myMetricValidator(environment.metricValidator) {}

std::string FirstLevelViewController::title() const { return seguedThroughRow.value_or(""); }

std::size_t FirstLevelViewController::numberOfSectionsInTableView() { return 1; }

std::optional<std::string> FirstLevelViewController::titleForHeaderInSection(std::size_t) { return std::nullopt; }

std::size_t FirstLevelViewController::numberOfRowsInSection(std::size_t) { return categories().size(); }

void FirstLevelViewController::cellForRowAtIndexPath(std::size_t, std::size_t row, ListCell& cell) {
  const std::vector<std::string>& names = categories();
  requireIndex("row", row, names.size(), *seguedThroughRow);
  cell.identifier = cellIdentifier;
  cell.text = names[row];
}

void FirstLevelViewController::prepareForNavigation(const ListCell* sender, ListPage& destination) {
  auto* page = dynamic_cast<SecondLevelViewController*>(&destination);
  if (sender == nullptr || page == nullptr) return;
  page->firstSelection = seguedThroughRow;
  page->seguedThroughRow = sender->text;
}

const std::vector<std::string>& FirstLevelViewController::categories() const {
  if (!seguedThroughRow) fatalError("a category list was asked for its rows before it was told its technology");
  const auto found = tableViewFields.firstLevelViewItems.find(*seguedThroughRow);
  if (found == tableViewFields.firstLevelViewItems.end()) {
    fatalError("there is no category list for \"" + *seguedThroughRow + "\"");
  }
  return found->second;
}

}  // namespace probeview
