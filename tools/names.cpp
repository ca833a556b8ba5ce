// SPDX-License-Identifier: Apache-2.0
#include "tools/names.h"

#include <memory>
#include <ostream>

#include "messages/metric_identifiers.h"
#include "messages/registry.h"
#include "ui/varnet_view_items.h"
#include "values/near_matches.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

ExitStatus showNames(const std::string& what, Tool& tool) {
  if (what == "pages") {
    for (const std::string& key : navigablePageKeys()) tool.output << key << '\n';
    return ExitStatus::Success;
  }
  for (const std::string_view name : what == "classes" ? classNames() : metricNames()) tool.output << name << '\n';
  return ExitStatus::Success;
}

}  // namespace

std::vector<std::string_view> metricNames() {
  std::vector<std::string_view> names;
  for (const MetricIdentifier& metric : metricIdentifiers()) names.push_back(metric.name);
  return names;
}

std::vector<std::string_view> classNames() {
  std::vector<std::string_view> names;
  for (const MessageDescriptor* message : messageClasses()) names.push_back(message->name);
  return names;
}

std::string unknownMetric(std::string_view text) {
  return quotedExcerpt(text) + " is no metric and no metric's identifier" + didYouMean(text, metricNames());
}

void addNamesCommand(Command program, Tool& tool) {
  Command command = program.subcommand("names", "Print the names of metrics, classes or pages, one a line");
  auto what = std::make_shared<std::string>();
  command.option("WHAT", *what, "metrics, classes or pages").required().oneOf({"metrics", "classes", "pages"});
  command.footer("What the completion of command lines offers.\n\nExamples:\n  probectl names metrics");
  command.whenChosen([what, &tool] { tool.run = [what, &tool] { return showNames(*what, tool); }; });
}

}  // namespace probeview
