// SPDX-License-Identifier: Apache-2.0
//
// What a field means: the end of its row. Decoding, encoding and printing know nothing of it, so meanings stand in a
// table of their own beside the rows.
#pragma once

#include <string_view>

#include "messages/runtime/quantity.h"

namespace probeview {

// What the viewer makes of a field that it does not show as it is.
struct ViewerNote {
  std::string_view text;
  bool converts = false;  // the value of its quantity is shown, not the number; the text says where
};

// The mark of a field that tells who the subscriber is or where the device can be reached.
struct PersonalMark {};
inline constexpr PersonalMark personal;

// Of a message class. Tables that are not published leave it empty.
struct MessageMeaning {
  std::string_view text = {};
  std::string_view pages = {};  // which show it, or why none does; empty for nested messages
};

struct FieldMeaning {
  constexpr FieldMeaning() = default;
  // The marks and notes follow in any order.
  template <typename... Marks>
  constexpr FieldMeaning(const Quantity& itsQuantity, std::string_view itsText, const Marks&... marks)
      : text(itsText), quantity(&itsQuantity) {
    (add(marks), ...);
  }
  // Of bytes, texts and nested messages, which are no numbers.
  template <typename... Marks>
  constexpr explicit FieldMeaning(std::string_view itsText, const Marks&... marks) : text(itsText) {
    (add(marks), ...);
  }

  std::string_view text;               // without what the quantity says: unit, range and clause
  const Quantity* quantity = nullptr;  // null where the field is no number
  ViewerNote viewer = {};
  bool isPersonal = false;

 private:
  constexpr void add(const PersonalMark&) { isPersonal = true; }
  constexpr void add(const ViewerNote& note) { viewer = note; }
};

}  // namespace probeview
