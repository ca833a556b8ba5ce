// SPDX-License-Identifier: Apache-2.0
//
// metrics_page [FOLDER]: writes the published schema and the page of metrics into the repository at FOLDER, by default
// the current one.
#include <filesystem>
#include <fstream>
#include <iostream>

#include "schema/pages.h"

int main(int argc, char** argv) {
  const std::filesystem::path root = argc > 1 ? argv[1] : ".";
  for (const probeview::Page& page : probeview::schemaPages()) {
    const std::filesystem::path path = root / page.path;
    std::error_code error;
    std::filesystem::create_directories(path.parent_path(), error);
    std::ofstream file(path, std::ios::binary);
    if (!(file << page.content).flush()) {
      std::cerr << "metrics_page: cannot write " << path.string() << ": is the folder there and writable?\n";
      return 1;
    }
  }
  return 0;
}
