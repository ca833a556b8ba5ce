// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "ui/list_page.h"

namespace probeview {

// The launch list: one row per radio technology. It has no state of its own.
class VarnetViewController final : public ListPage {
 public:
  static constexpr std::string_view cellIdentifier = "LaunchView";

  std::string title() const override;
  std::size_t numberOfSectionsInTableView() override;
  std::optional<std::string> titleForHeaderInSection(std::size_t section) override;
  std::size_t numberOfRowsInSection(std::size_t section) override;
  void cellForRowAtIndexPath(std::size_t section, std::size_t row, ListCell& cell) override;
  // Hands the tapped technology to a FirstLevelViewController; any other sender or destination is left alone.
  void prepareForNavigation(const ListCell* sender, ListPage& destination) override;
};

}  // namespace probeview
