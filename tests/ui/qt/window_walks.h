// SPDX-License-Identifier: Apache-2.0
//
// Two who use a window from outside, as people do: a hand that does anything, and a tour that leaves nothing out.
#pragma once

#include <QQuickWindow>
#include <random>
#include <set>
#include <string>

#include "ui/qt/page_model.h"

namespace probeview::testing_ui {

// Taps, goes back, flicks, types and resizes at random.
class Hand {
 public:
  Hand(QQuickWindow& window, unsigned seed) : window_(window), random_(seed) {}

  void move();

 private:
  int below(int limit) { return std::uniform_int_distribution(0, limit - 1)(random_); }

  QQuickWindow& window_;
  std::mt19937 random_;
};

// Goes down every row of the launch list and of each technology's list into the page, and back. It asks the window's
// own functions, never the stack of pages behind it: what a page leaves in the window must be there to be found.
class Tour {
 public:
  explicit Tour(QQuickWindow& window);

  // Begins a new tour, wherever the window stands.
  void begin();
  // Takes the next step, or none while a page slides. False when the tour is over and the launch list rests.
  bool goOn();

  // What the tour has seen at rest in the window: the keys of the category pages, and how many detail pages.
  const std::set<std::string>& pages() const { return pages_; }
  int details() const { return details_; }

 private:
  const qt::PageModel& pageInSight() const;
  void open(int row);
  void back();

  QQuickWindow& window_;
  QObject& stack_;
  bool isGoingHome_ = true;
  int depthBefore_ = 0;
  int technology_ = 0;
  int category_ = 0;
  std::string technologyName_;
  std::set<std::string> pages_;
  int details_ = 0;
};

}  // namespace probeview::testing_ui
