// SPDX-License-Identifier: Apache-2.0
#include "tools/config_command.h"

#include <memory>
#include <ostream>
#include <string>

#include "platform/file_beginning.h"
#include "radix/link.h"
#include "radix/service_commands.h"
#include "tools/service_client.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

ExitStatus push(const std::string& path, Tool& tool) {
  // What is more the client library refuses, with the limit.
  const FileBeginning content = readBeginning(path, radix::longestFrame + 1);
  if (!content.bytes) {
    tool.errors << "probectl: cannot read " << onOneLine(path) << ": " << content.error << '\n';
    return ExitStatus::Failure;
  }
  ServiceClient client(tool);
  return client.perform(radix::kCommandSetBaseConfiguration,
                        {{radix::kKeyAppID, radix::serviceAppId},
                         {radix::kKeyPayload, Value::bytes(*content.bytes)},
                         {radix::kKeyPayloadType, radix::configurationPayloadType}},
                        nullptr, path);
}

ExitStatus clear(Tool& tool) {
  ServiceClient client(tool);
  return client.perform(radix::kCommandClearBaseConfiguration, {{radix::kKeyAppID, radix::serviceAppId}});
}

}  // namespace

void addConfigCommand(Command program, Tool& tool) {
  Command command = program.subcommand("config", "Set or clear the service's base configuration");
  command.requireSubcommand();
  command.footer(
      "The base configuration counts as that of one more client until it is cleared or the service ends.\n"
      "Exit status 1 when it is refused, with the line and the column of what is wrong.\n"
      "\n"
      "Examples:\n"
      "  probectl config push kiv_test_lte.deviceconfig\n"
      "  probectl config clear");
  Command pushing = command.subcommand("push", "Set it to the content of a file");
  auto path = std::make_shared<std::string>();
  pushing.option("FILE", *path, "A configuration file: metrics, their periods, triggers").required();
  pushing.whenChosen([path, &tool] { tool.run = [path, &tool] { return push(*path, tool); }; });
  Command clearing = command.subcommand("clear", "Take it away");
  clearing.whenChosen([&tool] { tool.run = [&tool] { return clear(tool); }; });
}

}  // namespace probeview
