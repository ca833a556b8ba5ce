// SPDX-License-Identifier: Apache-2.0
//
// The manual pages and the completion know every subcommand and option that the programs have.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <regex>
#include <set>
#include <vector>

#include "messages/metric_identifiers.h"
#include "tests/support/golden.h"
#include "tests/support/output_of.h"
#include "tests/tools/run_probectl.h"

namespace probeview {
namespace {

using ::testing::Contains;
using ::testing::HasSubstr;

// As the page is read: without the escapes of its hyphens.
std::string manual(const std::string& name) {
  return std::regex_replace(contentOf("packaging/man/" + name), std::regex(R"(\\-)"), "-");
}

// The words that a help text lists as options.
std::set<std::string> optionsOf(const std::string& help) {
  std::set<std::string> options;
  const std::regex option(R"((?:^|\n)  (?:-\w,)?(--[a-z-]+))");
  for (std::sregex_iterator match(help.begin(), help.end(), option), end; match != end; ++match) {
    options.insert((*match)[1]);
  }
  return options;
}

// The part of a page that stands under a subcommand's own headings.
std::string sectionsOf(const std::string& page, const std::string& subcommand) {
  std::string text;
  std::istringstream lines(page);
  std::string line;
  bool inside = false;
  while (std::getline(lines, line)) {
    if (line.starts_with(".SS ") || line.starts_with(".SH ")) {
      inside = line.starts_with(".SS " + subcommand + " ") || line == ".SS " + subcommand;
    }
    if (inside) text += line + "\n";
  }
  return text;
}

void requireDocumented(const Command& command, const std::string& path, const std::string& page,
                       const std::string& completion) {
  for (const Command& subcommand : command.subcommands()) {
    const std::string name = path.empty() ? subcommand.name() : path + " " + subcommand.name();
    const std::string section = sectionsOf(page, name);
    if (subcommand.subcommands().empty()) {
      EXPECT_NE(section, "") << name << " is missing in the manual";
    }
    EXPECT_THAT(completion, HasSubstr(subcommand.name()));
    for (const std::string& option : subcommand.longOptions()) {
      if (option == "help") continue;
      EXPECT_THAT(section, HasSubstr("--" + option)) << name;
      EXPECT_THAT(completion, HasSubstr("--" + option)) << name;
    }
    requireDocumented(subcommand, name, page, completion);
  }
}

TEST(Manual, ProbectlsPageAndCompletionKnowEverySubcommandAndOption) {
  std::istringstream input;
  std::ostringstream output;
  Tool tool{.input = input, .output = output, .errors = output, .socketPath = {}, .run = {}};
  const CommandLine grammar = makeProbectlGrammar(tool);
  const std::string page = manual("probectl.1");
  const std::string completion = contentOf("packaging/completion/probectl");
  requireDocumented(grammar, "", page, completion);
  for (const std::string& option : optionsOf(probectl({"--help"}).output)) {
    EXPECT_THAT(page, HasSubstr(option));
    EXPECT_THAT(completion, HasSubstr(option));
  }
}

TEST(Manual, TheOtherProgramsPagesAndCompletionsKnowEveryOption) {
  struct Program {
    std::string path;
    std::string name;
    std::string page;
  };
  std::vector<Program> programs{{RADIXD, "radixd", "radixd.8"}, {PROBEVIEW, "probeview", "probeview.1"}};
#ifdef PICTURES
  programs.push_back({PICTURES, "probeview-pictures", "probeview-pictures.1"});
#endif
  for (const Program& each : programs) {
    const std::set<std::string> options = optionsOf(outputOf(each.path + " --help"));
    EXPECT_THAT(options, Contains("--version"));
    const std::string completion = contentOf("packaging/completion/" + each.name);
    for (const std::string& option : options) {
      EXPECT_THAT(manual(each.page), HasSubstr(option)) << each.page;
      EXPECT_THAT(completion, HasSubstr(option)) << each.name;
    }
  }
}

TEST(Manual, EachPageStatesItsExitStatuses) {
  for (const char* page : {"probectl.1", "radixd.8", "probeview.1"}) {
    EXPECT_THAT(manual(page), HasSubstr(".SH EXIT STATUS\n.TP\n.B 0\n")) << page;
  }
}

// What the completion of a program offers for those words, of which the last is being typed.
std::string offered(const std::string& program, const std::string& words) {
  std::string function = "_" + program;
  std::ranges::replace(function, '-', '_');
  return outputOf("bash -c '. packaging/completion/" + program + "; COMP_WORDS=(" + words +
                  "); COMP_CWORD=$((${#COMP_WORDS[@]} - 1)); " + function + "; echo \"${COMPREPLY[@]}\"' 2>&1");
}

// As it is called by its path.
std::string offered(const std::string& words) { return offered("probectl", PROBECTL " " + words); }

TEST(Completion, OffersSubcommandsAndOptions) {
  EXPECT_EQ(offered("\"\""), "status watch pages query metrics config decode store names --socket --version --help\n");
  EXPECT_EQ(offered("st"), "status store\n");
  EXPECT_EQ(offered("--socket /tmp/x wa"), "watch\n");
  EXPECT_EQ(offered("--socket = /tmp/x wa"), "watch\n");
  EXPECT_EQ(offered("config push --socket = resources/kiv"), "resources/kiv_test_lte.deviceconfig\n");
  EXPECT_EQ(offered("watch --p"), "--personal\n");
  EXPECT_EQ(offered("watch --c"), "--changes --count\n");
  EXPECT_EQ(offered("config \"\""), "push clear --help\n");
  EXPECT_EQ(offered("config push resources/kiv"), "resources/kiv_test_lte.deviceconfig\n");
  EXPECT_EQ(offered("watch --count \"\""), "\n");
  EXPECT_EQ(offered("names \"\""), "metrics classes pages --help\n");
}

TEST(Completion, OffersEveryMetricClassAndPageThatTheProgramKnows) {
  EXPECT_EQ(offered("query K_SIM"), "K_SIM_FILE_INFO\n");
  EXPECT_EQ(offered("query K_SIM_FILE_INFO K_"), "\n");
  EXPECT_EQ(offered("watch K_SIM_FILE_INFO K_LTE_RR"), "K_LTE_RRC_STATE\n");
  EXPECT_EQ(offered("metrics K_LTE_RR"), "K_LTE_RRC_STATE\n");
  EXPECT_EQ(offered("decode KCellularLteRrc"), "KCellularLteRrcState\n");
  const std::string metrics = offered("decode K_");
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    EXPECT_THAT(" " + metrics, testing::ContainsRegex(" " + std::string(metric.name) + "[ \n]"));
  }
  EXPECT_EQ(offered("pages \"\""), "Device LTE UMTS GSM\n");
  EXPECT_EQ(offered("pages lte r"), "RRC\n");
  EXPECT_EQ(offered("pages LTE RRC \"\""), "State\n");
  EXPECT_EQ(offered("pages LTE Serving Cell \"\""), "Info Meas\n");
}

TEST(Completion, KnowsTheOtherPrograms) {
  EXPECT_EQ(offered("probeview", "probeview --t"), "--terminal\n");
  EXPECT_EQ(offered("probeview", "probeview --log resources/kiv"), "resources/kiv_test_lte.deviceconfig\n");
  EXPECT_EQ(offered("radixd", "radixd --s"), "--socket --source\n");
  EXPECT_EQ(offered("radixd", "radixd --source s"), "scenario\n");
  EXPECT_EQ(offered("radixd", "radixd --source scenario : c"), "city\n");
  EXPECT_EQ(offered("radixd", "radixd --source trace : resources/kiv"), "resources/kiv_test_lte.deviceconfig\n");
  EXPECT_EQ(offered("radixd", "radixd --log-level w"), "warning\n");
  const std::string pictures = std::filesystem::path(PROBECTL).parent_path().string() + "/probeview-pictures";
  EXPECT_EQ(offered("probeview-pictures", pictures + " --look d"), "dark\n");
  EXPECT_EQ(offered("probeview-pictures", pictures + " --page \"LTE\\ RRC\""), "LTE\\ RRC\\ State\n");
}

}  // namespace
}  // namespace probeview
