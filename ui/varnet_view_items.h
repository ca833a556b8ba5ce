// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <map>
#include <string>
#include <vector>

namespace probeview {

// The fixed vocabulary of the lists. Its texts are a contract: a technology and a category, joined by one blank, are
// the key of a category page (ui/category_page.h).
struct VarnetViewItems {
  VarnetViewItems();

  // The technologies, in the order of the launch list.
  const std::vector<std::string> launchViewItemNames;
  // From a technology to its categories, in the order of its list. To be looked up, never walked: for the order of
  // technologies walk launchViewItemNames.
  const std::map<std::string, std::vector<std::string>, std::less<>> firstLevelViewItems;
};

// The one that the launch page reads; made on first use.
const VarnetViewItems& launchViewItems();

// A technology and a category, joined by one blank.
std::string pageKey(const std::string& technology, const std::string& category);
// The keys of all category pages, in the order of the lists.
std::vector<std::string> navigablePageKeys();

}  // namespace probeview
