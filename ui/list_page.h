// SPDX-License-Identifier: Apache-2.0
//
// A list page without a toolkit: the list's content, a title, the hook before navigating and the call to reload.
// A front takes one snapshot per reload (ui/page_snapshot.h) and draws it; it decides nothing. Main thread.
#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "ui/list_content.h"

namespace probeview {

// Rows are as high as their content needs.
inline constexpr double automaticDimension = -1.0;

// The identifiers of the metrics that fill a page; empty where none does.
using PageFeed = std::vector<std::int64_t>;

class ListPage : public ListContent {
 public:
  ListPage() = default;
  ListPage(const ListPage&) = delete;
  ListPage& operator=(const ListPage&) = delete;

  // For the navigation bar; never part of the list.
  virtual std::string title() const = 0;

  // What fills the page; absent for one that shows no metric of its own, such as the lists that lead to others.
  virtual std::optional<PageFeed> feed() const { return std::nullopt; }

  virtual double heightForRowAtIndexPath(std::size_t /*section*/, std::size_t /*row*/) const {
    return automaticDimension;
  }
  virtual double estimatedHeightForRowAtIndexPath(std::size_t /*section*/, std::size_t /*row*/) const {
    return automaticDimension;
  }

  // Called once by the navigation stack, when the page has been made and its properties are set.
  virtual void viewDidLoad() {}
  virtual void didReceiveMemoryWarning() {}

  // The hook before navigating: hands the tapped cell's text on to the page below. The sender is null when something
  // else than a cell navigates.
  virtual void prepareForNavigation(const ListCell* /*sender*/, ListPage& /*destination*/) {}

  // The list that draws this page; called on the main queue when all rows are to be asked again. Replaces the one
  // before it; an empty function removes it.
  void setReloadObserver(std::function<void()> observer) { reload_->observer = std::move(observer); }

 protected:
  // Asks the list to reload, if the page still lives by then: made to be posted to a queue.
  std::function<void()> reloadTask() const {
    return [reload = std::weak_ptr<Reload>(reload_)] {
      const auto alive = reload.lock();
      if (!alive) return;
      // A copy, so that the observer may replace itself.
      if (const auto observer = alive->observer) observer();
    };
  }

 private:
  struct Reload {
    std::function<void()> observer;
  };
  std::shared_ptr<Reload> reload_ = std::make_shared<Reload>();
};

}  // namespace probeview
