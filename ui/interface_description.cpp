// SPDX-License-Identifier: Apache-2.0
#include "ui/interface_description.h"

#include "ui/first_level_view_controller.h"
#include "ui/second_level_view_controller.h"
#include "ui/third_level_view_controller.h"
#include "ui/varnet_view_controller.h"

namespace probeview {

namespace {

struct Wire {
  std::string_view cellIdentifier;
  std::unique_ptr<ListPage> (*makeDestination)(const PageEnvironment& environment);
  bool showsDisclosure;
};

template <typename Page>
std::unique_ptr<ListPage> make(const PageEnvironment& environment) {
  return std::make_unique<Page>(environment);
}

constexpr Wire wires[] = {
    {VarnetViewController::cellIdentifier, make<FirstLevelViewController>, true},
    {FirstLevelViewController::cellIdentifier, make<SecondLevelViewController>, true},
    {SecondLevelViewController::cellIdentifier,
     [](const PageEnvironment&) -> std::unique_ptr<ListPage> { return std::make_unique<ThirdLevelViewController>(); },
     false},
};

const Wire* wireFrom(std::string_view cellIdentifier) {
  for (const Wire& wire : wires) {
    if (wire.cellIdentifier == cellIdentifier) return &wire;
  }
  return nullptr;
}

}  // namespace

std::unique_ptr<ListPage> InterfaceDescription::makeRootPage() const {
  return std::make_unique<VarnetViewController>();
}

std::unique_ptr<ListPage> InterfaceDescription::makeDestination(std::string_view cellIdentifier) const {
  const Wire* wire = wireFrom(cellIdentifier);
  return wire != nullptr ? wire->makeDestination(environment_) : nullptr;
}

bool showsDisclosure(std::string_view cellIdentifier) {
  const Wire* wire = wireFrom(cellIdentifier);
  return wire != nullptr && wire->showsDisclosure;
}

}  // namespace probeview
