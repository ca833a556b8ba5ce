// SPDX-License-Identifier: Apache-2.0
//
// What the field tables do not say: what a field means, in which unit and range, and what the viewer makes of it.
#pragma once

#include <span>
#include <string_view>

namespace probeview {

struct FieldFacts {
  std::string_view message;  // the class, such as "RxInfo"
  std::string_view field;    // its key, such as "rssi"
  std::string_view meaning;  // with unit and range
  std::string_view viewer;   // what the viewer changes; empty when it shows the value as it is
};

struct MessageFacts {
  std::string_view message;
  std::string_view meaning;
  std::string_view dictionary;  // the display dictionary of the store; empty when there is none
  std::string_view pages;       // where it appears; empty for nested messages
};

// Null when there is none.
const FieldFacts* factsOfField(std::string_view message, std::string_view field) noexcept;
const MessageFacts* factsOfMessage(std::string_view message) noexcept;

std::span<const FieldFacts> allFieldFacts() noexcept;
std::span<const MessageFacts> allMessageFacts() noexcept;

}  // namespace probeview
