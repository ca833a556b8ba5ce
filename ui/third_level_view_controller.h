// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ui/list_page.h"
#include "ui/varnet_view_items.h"

namespace probeview {

// Reserved for a drill-down below the category page: one empty row, whatever its properties hold. Nothing fills them.
class ThirdLevelViewController final : public ListPage {
 public:
  static constexpr std::string_view cellIdentifier = "ThirdClickView";

  std::optional<std::string> firstSelection;
  std::optional<std::string> secondSelection;
  std::optional<std::string> seguedThroughRow;
  VarnetViewItems tableViewFields;

  std::string title() const override { return "Detail"; }
  std::size_t numberOfSectionsInTableView() override { return 1; }
  std::optional<std::string> titleForHeaderInSection(std::size_t) override { return std::nullopt; }
  std::size_t numberOfRowsInSection(std::size_t) override { return 1; }
  void cellForRowAtIndexPath(std::size_t, std::size_t, ListCell& cell) override { cell.identifier = cellIdentifier; }
};

}  // namespace probeview
