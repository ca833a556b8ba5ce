// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace probeview {

// The path of the application's resource with this name and type ("kiv_test_lte", "deviceconfig"), absent when there is
// none. Looked for in share/probeview beside the folder of the executable, and, while the executable still stands in
// the tree that it was built in, in the resources folder of its sources. Main thread.
std::optional<std::string> resourcePath(std::string_view name, std::string_view type);

// Looks in these folders only, in their order; an empty list restores the folders above. For tests.
void setResourceFolders(std::vector<std::string> folders);

}  // namespace probeview
