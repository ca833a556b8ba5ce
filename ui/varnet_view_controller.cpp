// SPDX-License-Identifier: Apache-2.0
#include "ui/varnet_view_controller.h"

#include "ui/first_level_view_controller.h"
#include "ui/list_index.h"
#include "ui/varnet_view_items.h"

namespace probeview {

std::string VarnetViewController::title() const { return "probeview"; }

std::size_t VarnetViewController::numberOfSectionsInTableView() { return 1; }

std::optional<std::string> VarnetViewController::titleForHeaderInSection(std::size_t) { return std::nullopt; }

std::size_t VarnetViewController::numberOfRowsInSection(std::size_t) {
  return launchViewItems().launchViewItemNames.size();
}

void VarnetViewController::cellForRowAtIndexPath(std::size_t, std::size_t row, ListCell& cell) {
  const auto& names = launchViewItems().launchViewItemNames;
  requireIndex("row", row, names.size(), "the launch list");
  cell.identifier = cellIdentifier;
  cell.text = names[row];
}

void VarnetViewController::prepareForNavigation(const ListCell* sender, ListPage& destination) {
  auto* page = dynamic_cast<FirstLevelViewController*>(&destination);
  if (sender != nullptr && page != nullptr) page->seguedThroughRow = sender->text;
}

}  // namespace probeview
