// SPDX-License-Identifier: Apache-2.0
#include "ui/open_page.h"

#include "ui/page_snapshot.h"
#include "ui/varnet_view_items.h"

namespace probeview {

bool openPage(NavigationStack& navigation, std::string_view key) {
  navigation.popToRoot();
  const auto technologies = takeSnapshot(navigation.topPage());
  for (const auto& technology : technologies.sections.front().rows) {
    navigation.tap(technology);
    const auto categories = takeSnapshot(navigation.topPage());
    for (const auto& category : categories.sections.front().rows) {
      if (pageKey(*technology.text, *category.text) == key) return navigation.tap(category);
    }
    navigation.pop();
  }
  return false;
}

}  // namespace probeview
