// SPDX-License-Identifier: Apache-2.0
#include "platform/resources.h"

#include <algorithm>
#include <filesystem>
#include <system_error>
#include <utility>

namespace probeview {

namespace {

namespace files = std::filesystem;

std::vector<std::string>& chosenFolders() {
  static auto* folders = new std::vector<std::string>;
  return *folders;
}

bool liesIn(const files::path& path, const files::path& folder) {
  return std::mismatch(folder.begin(), folder.end(), path.begin(), path.end()).first == folder.end();
}

std::vector<std::string> ownFolders() {
  std::error_code error;
  const files::path executable = files::read_symlink("/proc/self/exe", error);
  if (error) return {};
  std::vector<std::string> folders{(executable.parent_path().parent_path() / "share" / "probeview").string()};
  // An installed program must not read from where somebody's sources once stood.
  if (liesIn(executable, PROBEVIEW_BUILD_FOLDER)) folders.emplace_back(PROBEVIEW_RESOURCES_FOLDER);
  return folders;
}

}  // namespace

std::optional<std::string> resourcePath(std::string_view name, std::string_view type) {
  std::string fileName(name);
  if (!type.empty()) {
    fileName += '.';
    fileName += type;
  }
  for (const std::string& folder : chosenFolders().empty() ? ownFolders() : chosenFolders()) {
    const files::path path = files::path(folder) / fileName;
    std::error_code error;
    if (files::is_regular_file(path, error)) return path.string();
  }
  return std::nullopt;
}

void setResourceFolders(std::vector<std::string> folders) { chosenFolders() = std::move(folders); }

}  // namespace probeview
