// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

#include "ui/navigation_stack.h"

namespace probeview {

// Taps through the lists to the category page of that key, as a person would, from the root page. False, with the stack
// at its root, when no rows join to the key.
bool openPage(NavigationStack& navigation, std::string_view key);

}  // namespace probeview
