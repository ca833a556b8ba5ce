// SPDX-License-Identifier: Apache-2.0
#include "platform/command_line.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <utility>

#include "values/plain_text.h"

namespace probeview {

namespace {

// The library's own text, with what it quotes made harmless: an argument may be a file's name, which may hold anything.
std::string failureMessage(const CLI::App* app, const CLI::Error& error) {
  const CLI::Error harmless(error.get_name(), onOneLine(error.what()), error.get_exit_code());
  return CLI::FailureMessage::simple(app, harmless);
}

std::string versionText(const std::string& program) { return program + " " PROBEVIEW_VERSION; }

}  // namespace

CommandOption CommandOption::typeName(const std::string& name) {
  option_->type_name(name);
  return *this;
}

CommandOption CommandOption::required() {
  option_->required();
  return *this;
}

CommandOption CommandOption::oneEachTime() {
  option_->allow_extra_args(false);
  return *this;
}

CommandOption CommandOption::shownAsOne() {
  option_->expected(1)->take_all();
  return *this;
}

CommandOption CommandOption::check(std::function<std::string(const std::string& value)> fault) {
  option_->check(std::move(fault));
  return *this;
}

CommandOption CommandOption::oneOf(const std::vector<std::string>& values) {
  option_->check(CLI::IsMember(values));
  return *this;
}

CommandOption CommandOption::excludes(CommandOption other) {
  option_->excludes(other.option_);
  return *this;
}

CommandOption CommandOption::showDefault() {
  option_->capture_default_str();
  return *this;
}

CommandOption Command::option(const std::string& name, std::string& value, const std::string& description) {
  return CommandOption(*app_->add_option(name, value, description));
}

CommandOption Command::option(const std::string& name, std::optional<std::string>& value,
                              const std::string& description) {
  return CommandOption(*app_->add_option(name, value, description));
}

CommandOption Command::option(const std::string& name, std::vector<std::string>& values,
                              const std::string& description) {
  return CommandOption(*app_->add_option(name, values, description));
}

CommandOption Command::option(const std::string& name, std::uint64_t& value, const std::string& description) {
  return CommandOption(*app_->add_option(name, value, description));
}

CommandOption Command::flag(const std::string& name, bool& value, const std::string& description) {
  return CommandOption(*app_->add_flag(name, value, description));
}

CommandOption Command::flag(const std::string& name, const std::string& description) {
  return CommandOption(*app_->add_flag(name)->description(description));
}

Command Command::subcommand(const std::string& name, const std::string& description) {
  return Command(*app_->add_subcommand(name, description));
}

void Command::requireSubcommand() { app_->require_subcommand(1); }

void Command::whenChosen(std::function<void()> choose) {
  app_->callback([choose = std::move(choose)] {
    try {
      choose();
    } catch (const UsageError& error) {
      throw CLI::ParseError(error.what(), CLI::ExitCodes::ValidationError);
    }
  });
}

void Command::footer(const std::string& text) { app_->footer(text); }

std::string Command::name() const { return app_->get_name(); }

std::vector<Command> Command::subcommands() const {
  std::vector<Command> commands;
  for (CLI::App* each : app_->get_subcommands([](const CLI::App*) { return true; })) commands.push_back(Command(*each));
  return commands;
}

std::vector<std::string> Command::longOptions() const {
  std::vector<std::string> names;
  for (const CLI::Option* each : std::as_const(*app_).get_options()) {
    std::ranges::copy(each->get_lnames(), std::back_inserter(names));
  }
  return names;
}

CommandLine::CommandLine(const std::string& program, const std::string& description)
    : CommandLine(std::make_shared<CLI::App>(description, program)) {
  app_->set_version_flag("--version", versionText(program));
  app_->failure_message(failureMessage);
}

CommandLine::CommandLine(std::shared_ptr<CLI::App> app) : Command(*app), owned_(std::move(app)) {}

void CommandLine::describeHelpAndVersion(const std::string& help, const std::string& version) {
  app_->set_version_flag("--version", versionText(name()), version);
  app_->set_help_flag("-h,--help", help);
}

void CommandLine::helpColumn(std::size_t column) { app_->get_formatter()->column_width(column); }

std::optional<int> CommandLine::parse(std::span<const std::string> arguments, std::ostream& output,
                                      std::ostream& errors) {
  try {
    // The library takes the arguments last first.
    app_->parse(std::vector<std::string>(arguments.rbegin(), arguments.rend()));
  } catch (const CLI::ParseError& error) {
    // Help and version arrive here too, as errors with status 0.
    return app_->exit(error, output, errors) == 0 ? 0 : usageErrorStatus;
  }
  return std::nullopt;
}

std::vector<std::string> argumentsOf(int argc, const char* const* argv) {
  return argc > 1 ? std::vector<std::string>(argv + 1, argv + argc) : std::vector<std::string>();
}

}  // namespace probeview
