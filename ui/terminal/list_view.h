// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <optional>

#include "ui/list_page.h"
#include "ui/page_snapshot.h"
#include "ui/terminal/list_layout.h"

namespace probeview::terminal {

// One page as a list that scrolls and has a selected row. It follows the page's reloads and keeps what is selected and
// where it stands on the screen. Pure: knows sizes, no terminal. The page must outlive it.
class ListView {
 public:
  // The function is called after each reload.
  ListView(ListPage& page, std::function<void()> didReload);
  ~ListView();
  ListView(const ListView&) = delete;
  ListView& operator=(const ListView&) = delete;

  ListPage& page() const { return page_; }
  void resize(int width, int height);

  // The lines that are on the screen: [firstLine, firstLine + height) of the layout, as far as there are any.
  const ListLayout& layout() const { return layout_; }
  std::size_t firstLine() const { return firstLine_; }
  bool hasMoreAbove() const { return firstLine_ > 0; }
  bool hasMoreBelow() const { return firstLine_ + static_cast<std::size_t>(height_) < layout_.lines.size(); }
  // Absent when the page has no rows.
  std::optional<RowPlace> selection() const { return selection_; }
  const ListCell* selectedCell() const;

  // By rows; stops at the ends.
  void moveSelection(std::ptrdiff_t rows);
  // By screens. A page whose rows are all above or below scrolls on all the same.
  void moveByScreens(int screens);
  void selectFirst();
  void selectLast();

 private:
  void reload();
  void layOutAgain();
  std::size_t flatIndex(RowPlace place) const;
  std::optional<RowPlace> placeOf(std::size_t flatIndex) const;
  void showSelection();
  std::size_t lastFirstLine() const;

  ListPage& page_;
  std::function<void()> didReload_;
  PageSnapshot shown_;
  ListLayout layout_;
  int width_ = 80;
  int height_ = 24;
  std::size_t firstLine_ = 0;
  std::optional<RowPlace> selection_;
};

}  // namespace probeview::terminal
