// SPDX-License-Identifier: Apache-2.0
#include "ui/list_index.h"

#include <string>

#include "platform/fatal_error.h"

namespace probeview {

void requireIndex(std::string_view what, std::size_t index, std::size_t count, std::string_view list) {
  if (index < count) return;
  fatalError(std::string(what) + " " + std::to_string(index) + " asked of " + std::string(list) + ", which has " +
             std::to_string(count));
}

}  // namespace probeview
