// SPDX-License-Identifier: Apache-2.0
#include "tools/pages_command.h"

#include <algorithm>
#include <memory>
#include <ostream>
#include <string_view>
#include <vector>

#include "app/viewer.h"
#include "ui/varnet_view_items.h"
#include "values/near_matches.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

struct PagesOptions {
  std::vector<std::string> key;
  std::string logFile;
};

ExitStatus showPages(const PagesOptions& options, Tool& tool) {
  ViewerOptions viewer;
  viewer.pagesOnly = true;
  if (!options.logFile.empty()) viewer.logFile = options.logFile;
  if (!options.key.empty()) {
    // The key is one text of several words; it may come quoted or not.
    std::string key = options.key.front();
    for (std::size_t word = 1; word < options.key.size(); ++word) key += " " + options.key[word];
    const std::vector<std::string> keys = navigablePageKeys();
    const auto found =
        std::ranges::find_if(keys, [&](const std::string& known) { return editDistance(known, key) == 0; });
    if (found == keys.end()) {
      const std::vector<std::string_view> names(keys.begin(), keys.end());
      const std::string near = didYouMean(key, names);
      tool.errors << "probectl: there is no page " << quotedExcerpt(key) << near
                  << (near.empty() ? "; there" : " There") << " are:\n";
      for (const std::string& known : keys) tool.errors << "  " << known << "\n";
      return ExitStatus::UsageError;
    }
    viewer.pageKey = *found;
  }
  return runViewer(viewer, nullptr, tool.errors) == 0 ? ExitStatus::Success : ExitStatus::Failure;
}

}  // namespace

void addPagesCommand(Command program, Tool& tool) {
  Command command = program.subcommand("pages", "Show the viewer's pages as text");
  auto options = std::make_shared<PagesOptions>();
  command.option("KEY", options->key, "The page to show, as LTE Serving Cell Info, in any case; without it, all");
  command
      .option("--log", options->logFile,
              "Write the console log of every metric to this file, - for standard output; else it is dropped")
      .typeName("FILE");
  command.footer(
      "In a terminal the pages are live: arrows move, Return opens, Esc goes back, q ends. Elsewhere each page is\n"
      "printed once, when every metric has come or after 15 s.\n\n"
      "'probectl names pages' lists the keys.\n\n"
      "Examples:\n  probectl pages\n  probectl pages lte serving cell info\n  probectl pages 'UMTS RRC State' | cat");
  command.whenChosen([options, &tool] { tool.run = [options, &tool] { return showPages(*options, tool); }; });
}

}  // namespace probeview
