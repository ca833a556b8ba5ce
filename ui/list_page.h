// SPDX-License-Identifier: Apache-2.0
//
// A list page without a toolkit: it answers the questions that a list asks and knows which page a tapped row leads to.
// A front asks each question once per reload, through a snapshot, and draws the answers; it decides nothing.
#pragma once

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

namespace probeview {

// A reusable list cell. A label that the page does not set stays absent and is drawn blank.
struct ListCell {
  std::string_view identifier;
  std::optional<std::string> text;
  std::optional<std::string> detail;
};

class ListPage {
 public:
  virtual ~ListPage() = default;

  // For the navigation bar; a front's matter, never part of the list.
  virtual std::string title() const = 0;

  virtual std::size_t numberOfSections() = 0;
  virtual std::optional<std::string> titleForHeaderInSection(std::size_t section) = 0;
  virtual std::size_t numberOfRowsInSection(std::size_t section) = 0;
  // The cell comes cleared. A section or row past the end stops the program.
  virtual void cellForRow(std::size_t section, std::size_t row, ListCell& cell) = 0;

  // Called once, when the page has been made and its properties are set.
  virtual void viewDidLoad() {}
  // The page that a tap on a row leads to; null when rows lead nowhere.
  virtual std::unique_ptr<ListPage> makeDestination() { return nullptr; }
  // The hook before navigating: hands the tapped cell's text on to the destination.
  virtual void prepareForNavigation(const ListCell& sender, ListPage& destination) {
    static_cast<void>(sender);
    static_cast<void>(destination);
  }
};

}  // namespace probeview
