// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string_view>

#include "ui/list_page.h"
#include "ui/page_environment.h"

namespace probeview {

// How the pages are wired: which one comes first, and which one a tap on a kind of cell leads to. The pages themselves
// only fill the destination.
class InterfaceDescription {
 public:
  explicit InterfaceDescription(const PageEnvironment& environment = {}) : environment_(environment) {}

  std::unique_ptr<ListPage> makeRootPage() const;
  // Null when cells of this kind lead nowhere.
  std::unique_ptr<ListPage> makeDestination(std::string_view cellIdentifier) const;

 private:
  PageEnvironment environment_;
};

// Whether cells of this kind are drawn with the mark that says that they lead to another list. Value rows lead to the
// detail page without the mark: it has nothing to show yet.
bool showsDisclosure(std::string_view cellIdentifier);

}  // namespace probeview
