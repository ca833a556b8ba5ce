// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <vector>

#include "ui/list_page.h"
#include "ui/page_environment.h"
#include "ui/varnet_view_items.h"

namespace probeview {

// The categories of one technology.
class FirstLevelViewController final : public ListPage {
 public:
  static constexpr std::string_view cellIdentifier = "FirstClickView";

  explicit FirstLevelViewController(const PageEnvironment& environment = {});

  // The technology that was tapped on the launch list. Absent, or a name that has no categories, stops the program as
  // soon as a row is asked for; only the launch list's hand-over sets it.
  std::optional<std::string> seguedThroughRow;
  VarnetViewItems tableViewFields;
  // Every page holds the store; this one does not read it.
  const MetricValidator& myMetricValidator;

  std::string title() const override;
  std::size_t numberOfSectionsInTableView() override;
  std::optional<std::string> titleForHeaderInSection(std::size_t section) override;
  std::size_t numberOfRowsInSection(std::size_t section) override;
  void cellForRowAtIndexPath(std::size_t section, std::size_t row, ListCell& cell) override;
  // Hands technology and tapped category to a SecondLevelViewController; any other sender or destination is left alone.
  void prepareForNavigation(const ListCell* sender, ListPage& destination) override;

 private:
  const std::vector<std::string>& categories() const;
};

}  // namespace probeview
