// SPDX-License-Identifier: Apache-2.0
//
// What a program understands of its command line: options, flags, words and subcommands, each with its line of --help.
//
//   CommandLine line("radixd", "Serves metrics of the phone's radio.");
//   std::optional<std::string> socket;
//   line.option("--socket", socket, "Where to listen").typeName("PATH").check(radix::socketPathTrouble);
//   if (const auto status = line.parse(argumentsOf(argc, argv), std::cout, std::cerr)) return *status;
//
// The library that reads command lines takes the compiler seconds in each file that includes it; command_line.cpp is
// the only one. What is declared keeps references to the variables that take the values; they must live until the
// command line has been read. Main thread.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <iosfwd>
#include <memory>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>
#include <vector>

namespace CLI {
class App;
class Option;
}  // namespace CLI

namespace probeview {

// The exit status of a program whose command line is not understood.
inline constexpr int usageErrorStatus = 2;

// Thrown by what Command::whenChosen() calls: why the command line as a whole is not understood.
struct UsageError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

// One option, flag or word that has been declared, to say more of it. A copy says it of the same one.
class CommandOption {
 public:
  explicit CommandOption(CLI::Option& option) : option_(&option) {}

  // How --help calls the value, as in "--socket PATH".
  CommandOption typeName(const std::string& name);
  CommandOption required();
  // Of an option that keeps several values: it takes one each time that it is given, not all that follow it.
  CommandOption oneEachTime();
  // The same, but --help shows it as an option of one value, and values that follow it are taken too.
  CommandOption shownAsOne();
  // What is wrong with a value; empty when nothing is.
  CommandOption check(std::function<std::string(const std::string& value)> fault);
  CommandOption oneOf(const std::vector<std::string>& values);
  // Not to be given together with the other one.
  CommandOption excludes(CommandOption other);
  // What the variable holds now stands in --help as the default.
  CommandOption showDefault();

 private:
  CLI::Option* option_;
};

// A program's command line, or one of its subcommands. A copy is the same one.
class Command {
 public:
  // A name with hyphens is an option ("--socket"), any other a word at its place ("METRIC").
  CommandOption option(const std::string& name, std::string& value, const std::string& description);
  CommandOption option(const std::string& name, std::optional<std::string>& value, const std::string& description);
  CommandOption option(const std::string& name, std::vector<std::string>& values, const std::string& description);
  CommandOption option(const std::string& name, std::uint64_t& value, const std::string& description);
  CommandOption flag(const std::string& name, bool& value, const std::string& description);
  // One that changes nothing, to be required.
  CommandOption flag(const std::string& name, const std::string& description);

  Command subcommand(const std::string& name, const std::string& description);
  // Without one of its subcommands the command is not understood.
  void requireSubcommand();
  // Called when the command line names this subcommand and has been understood as a whole.
  void whenChosen(std::function<void()> choose);
  // What --help ends with.
  void footer(const std::string& text);

  // What has been declared, for those who hold it against something else.
  std::string name() const;
  std::vector<Command> subcommands() const;
  std::vector<std::string> longOptions() const;  // without their hyphens

 protected:
  explicit Command(CLI::App& app) : app_(&app) {}
  CLI::App* app_;
};

class CommandLine final : public Command {
 public:
  // Knows --version, which shows the program's name with the one version number, and --help.
  CommandLine(const std::string& program, const std::string& description);

  // What --help says of these two, where that is not what the library says of them; before any subcommand is declared,
  // as those take over what is said of --help.
  void describeHelpAndVersion(const std::string& help, const std::string& version);
  // How far the descriptions of --help stand from its left margin.
  void helpColumn(std::size_t column);

  // Reads the arguments (without the program's name). Absent: they are understood, and the variables hold them. Else
  // the exit status: 0 when help or version was asked for and shown; usageErrorStatus when the arguments are not
  // understood, with the reason on the second stream. It may quote them, on one line and without what steers a
  // terminal.
  std::optional<int> parse(std::span<const std::string> arguments, std::ostream& output, std::ostream& errors);

 private:
  explicit CommandLine(std::shared_ptr<CLI::App> app);

  std::shared_ptr<CLI::App> owned_;
};

// The arguments of main() without the program's name, which may be missing.
std::vector<std::string> argumentsOf(int argc, const char* const* argv);

}  // namespace probeview
