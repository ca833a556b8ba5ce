// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <memory>
#include <string>
#include <vector>

#include "ui/interface_description.h"
#include "ui/list_page.h"

namespace probeview {

// Told what happens to the stack, so that a front can follow it. Main thread.
class NavigationObserver {
 public:
  virtual ~NavigationObserver() = default;
  // The page is on top and loaded.
  virtual void didPush(ListPage& page) = 0;
  // The page, the topmost one, is about to go; it dies when this returns.
  virtual void willPop(ListPage& page) = 0;
};

// The container of the pages. It owns them: a page lives from its push to its pop, and its timer with it; a covered
// page lives on. Going back and in again makes a fresh page. Main thread; not to be called from within an observer.
class NavigationStack {
 public:
  // Starts with the description's root page.
  explicit NavigationStack(InterfaceDescription description);
  NavigationStack(InterfaceDescription description, std::unique_ptr<ListPage> rootPage);
  NavigationStack(const NavigationStack&) = delete;
  NavigationStack& operator=(const NavigationStack&) = delete;
  virtual ~NavigationStack();

  // Called once, when a front is about to show the stack.
  virtual void viewDidLoad() {}
  // Passes the warning to every page.
  virtual void didReceiveMemoryWarning();

  // At least 1.
  std::size_t depth() const { return pages_.size(); }
  // 0 is the root; the index must be below depth().
  ListPage& page(std::size_t index) const { return *pages_[index]; }
  ListPage& topPage() const { return *pages_.back(); }

  // Follows the wire of the tapped cell of the top page: makes the destination, lets the top page fill it, pushes it.
  // False when the cell leads nowhere.
  bool tap(const ListCell& cell);
  // Pushes a page that no tap leads to, its properties set.
  void push(std::unique_ptr<ListPage> page);
  // Goes back one page; false at the root, which stays.
  bool pop();
  void popToRoot();

  // At most one, which outlives its registration; null removes it. It is not told of the pages that are there already.
  void setObserver(NavigationObserver* observer) { observer_ = observer; }

 private:
  InterfaceDescription description_;
  std::vector<std::unique_ptr<ListPage>> pages_;
  NavigationObserver* observer_ = nullptr;
};

// What fills the page on top: a page that shows no metric of its own stands for the one that it was reached from.
// Absent on the lists.
std::optional<PageFeed> feedOfTopPage(const NavigationStack& navigation);

// The titles of the stack's pages, from the root to the top, as "probeview › LTE › Tx Power".
std::string navigationPath(const NavigationStack& navigation);

}  // namespace probeview
