// SPDX-License-Identifier: Apache-2.0
#include "platform/command_line.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sstream>

namespace probeview {
namespace {

using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::StartsWith;

struct Answer {
  std::optional<int> status;
  std::string output;
  std::string errors;
};

Answer read(CommandLine& line, const std::vector<std::string>& arguments) {
  std::ostringstream output;
  std::ostringstream errors;
  const std::optional<int> status = line.parse(arguments, output, errors);
  return {status, output.str(), errors.str()};
}

TEST(CommandLineReading, WhatIsUnderstoodStandsInTheVariables) {
  CommandLine line("tool", "Does things.");
  std::string word;
  std::optional<std::string> given, absent;
  std::vector<std::string> each;
  std::uint64_t number = 0;
  bool flag = false, other = false;
  line.option("WORD", word, "A word");
  line.option("--given", given, "A value");
  line.option("--absent", absent, "Another value");
  line.option("--each", each, "Several values").oneEachTime();
  line.option("--number", number, "A number");
  line.flag("--flag", flag, "A flag");
  line.flag("--other", other, "Another flag");
  const Answer answer =
      read(line, {"--each", "1", "here", "--each=2", "--given", "", "--number", "18446744073709551615", "--flag"});
  EXPECT_EQ(answer.status, std::nullopt) << answer.errors;
  EXPECT_EQ(word, "here");
  EXPECT_EQ(given, "");
  EXPECT_EQ(absent, std::nullopt);
  EXPECT_THAT(each, ElementsAre("1", "2"));
  EXPECT_EQ(number, 18446744073709551615u);
  EXPECT_TRUE(flag);
  EXPECT_FALSE(other);
}

TEST(CommandLineReading, HelpAndTheOneVersionAreShownWithStatusZero) {
  CommandLine line("tool", "Does things.");
  std::string path = "usual";
  line.option("--path", path, "Where").typeName("PATH").showDefault();
  line.footer("Exit status: 0.");
  const Answer help = read(line, {"--help"});
  EXPECT_EQ(help.status, 0);
  EXPECT_THAT(help.output, StartsWith("Does things.\nUsage: tool [OPTIONS]\n"));
  EXPECT_THAT(help.output, HasSubstr("--path PATH=usual"));
  EXPECT_THAT(help.output, HasSubstr("\nExit status: 0.\n"));
  EXPECT_EQ(help.errors, "");
  const Answer version = read(line, {"--version"});
  EXPECT_EQ(version.status, 0);
  EXPECT_EQ(version.output, "tool " PROBEVIEW_VERSION "\n");
}

TEST(CommandLineReading, WhatIsNotUnderstoodIsSaidWithStatusTwo) {
  CommandLine line("tool", "Does things.");
  bool left = false, right = false;
  std::string look;
  line.flag("--left", left, "A side").excludes(line.flag("--right", right, "Another side"));
  line.option("--look", look, "A look").oneOf({"light", "dark"}).check([](const std::string& value) {
    return value == "dark" ? std::string("it is too dark") : std::string();
  });
  for (const std::vector<std::string>& arguments :
       {std::vector<std::string>{"--unknown"}, {"word"}, {"--left", "--right"}, {"--look"}, {"--look", "blue"}}) {
    const Answer answer = read(line, arguments);
    EXPECT_EQ(answer.status, usageErrorStatus) << arguments.front();
    EXPECT_EQ(answer.output, "");
    EXPECT_THAT(answer.errors, HasSubstr("\nRun with --help for more information.\n"));
  }
  EXPECT_THAT(read(line, {"--look", "dark"}).errors, HasSubstr("it is too dark"));
}

TEST(CommandLineReading, AnErrorQuotesItsArgumentOnOneLineAndWithoutWhatSteersATerminal) {
  CommandLine line("tool", "Does things.");
  const Answer answer = read(line, {"a\x1b[2J\nradixd: error: forged\xe2\x80\xae"});
  EXPECT_EQ(answer.status, usageErrorStatus);
  EXPECT_EQ(answer.errors,
            "The following argument was not expected: a\\u{1b}[2J\\nradixd: error: forged\\u{202e}\n"
            "Run with --help for more information.\n");
}

TEST(CommandLineReading, ASubcommandIsChosenWhenTheWholeLineIsUnderstood) {
  CommandLine line("tool", "Does things.");
  line.requireSubcommand();
  Command add = line.subcommand("add", "Adds");
  bool dry = false;
  add.flag("--dry", dry, "Only says so");
  int chosen = 0;
  add.whenChosen([&] {
    if (dry) throw UsageError("a dry addition is none");
    ++chosen;
  });
  EXPECT_EQ(read(line, {}).status, usageErrorStatus);
  EXPECT_EQ(read(line, {"add", "--unknown"}).status, usageErrorStatus);
  EXPECT_EQ(chosen, 0);
  EXPECT_EQ(read(line, {"add"}).status, std::nullopt);
  EXPECT_EQ(chosen, 1);
  EXPECT_THAT(read(line, {"add", "--dry"}).errors, StartsWith("a dry addition is none\n"));
  EXPECT_EQ(chosen, 1);
}

TEST(CommandLineReading, WhatHasBeenDeclaredCanBeAskedFor) {
  CommandLine line("tool", "Does things.");
  bool flag = false;
  Command add = line.subcommand("add", "Adds");
  add.flag("-d,--dry", flag, "Only says so");
  add.subcommand("more", "Adds more");
  EXPECT_EQ(line.name(), "tool");
  ASSERT_EQ(line.subcommands().size(), 1u);
  EXPECT_EQ(line.subcommands()[0].name(), "add");
  EXPECT_THAT(line.subcommands()[0].longOptions(), ElementsAre("help", "dry"));
  EXPECT_EQ(line.subcommands()[0].subcommands()[0].name(), "more");
}

TEST(CommandLineReading, TheArgumentsAreWhatStandsBehindTheProgramsName) {
  const char* const three[] = {"tool", "a", "b", nullptr};
  EXPECT_THAT(argumentsOf(3, three), ElementsAre("a", "b"));
  EXPECT_THAT(argumentsOf(0, three + 3), ElementsAre());
}

}  // namespace
}  // namespace probeview
