// SPDX-License-Identifier: Apache-2.0
#include "ui/navigation_stack.h"

#include <utility>

namespace probeview {

NavigationStack::NavigationStack(InterfaceDescription description)
    : NavigationStack(description, description.makeRootPage()) {}

NavigationStack::NavigationStack(InterfaceDescription description, std::unique_ptr<ListPage> rootPage)
    : description_(description) {
  push(std::move(rootPage));
}

NavigationStack::~NavigationStack() {
  // From the top down, as if every page were popped.
  while (!pages_.empty()) pages_.pop_back();
}

void NavigationStack::didReceiveMemoryWarning() {
  for (const auto& page : pages_) page->didReceiveMemoryWarning();
}

bool NavigationStack::tap(const ListCell& cell) {
  auto destination = description_.makeDestination(cell.identifier);
  if (!destination) return false;
  topPage().prepareForNavigation(&cell, *destination);
  push(std::move(destination));
  return true;
}

bool NavigationStack::pop() {
  if (pages_.size() == 1) return false;
  if (observer_ != nullptr) observer_->willPop(topPage());
  pages_.pop_back();
  return true;
}

void NavigationStack::popToRoot() {
  while (pop()) {
  }
}

void NavigationStack::push(std::unique_ptr<ListPage> page) {
  pages_.push_back(std::move(page));
  topPage().viewDidLoad();
  if (observer_ != nullptr) observer_->didPush(topPage());
}

std::optional<PageFeed> feedOfTopPage(const NavigationStack& navigation) {
  for (std::size_t index = navigation.depth(); index > 0; --index) {
    if (auto feed = navigation.page(index - 1).feed()) return feed;
  }
  return std::nullopt;
}

std::string navigationPath(const NavigationStack& navigation) {
  std::string path;
  for (std::size_t index = 0; index < navigation.depth(); ++index) {
    if (index > 0) path += " › ";
    path += navigation.page(index).title();
  }
  return path;
}

}  // namespace probeview
