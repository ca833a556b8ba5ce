// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <array>
#include <cstddef>

namespace probeview {

// A row that says at which place of another order it stands, from 0.
template <typename Content>
struct Placed {
  std::size_t place;
  Content content;
};

// The contents in that order. A place that is taken twice or left free does not compile.
template <typename Content, std::size_t count>
consteval std::array<Content, count> arranged(const Placed<Content> (&rows)[count]) {
  std::array<Content, count> contents{};
  std::array<bool, count> taken{};
  for (const Placed<Content>& row : rows) {
    if (row.place >= count) throw "a place lies behind one that is free";
    if (taken[row.place]) throw "a place is taken twice";
    taken[row.place] = true;
    contents[row.place] = row.content;
  }
  return contents;
}

}  // namespace probeview
