// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string_view>

namespace probeview {

// Stops the program unless index < count: a list that asks past its own counts is broken. "row 4 asked of LTE NAS,
// which has 4".
void requireIndex(std::string_view what, std::size_t index, std::size_t count, std::string_view list);

}  // namespace probeview
