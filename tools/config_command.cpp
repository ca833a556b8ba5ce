// SPDX-License-Identifier: Apache-2.0
#include "tools/config_command.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <memory>
#include <ostream>
#include <string>

#include "platform/file_descriptor.h"
#include "radix/service_commands.h"
#include "tools/service_client.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

// False, with the reason in errno, when the file cannot be read.
bool readFile(const std::string& path, std::string& content) {
  const FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
  if (!file) return false;
  char block[4096];
  while (true) {
    const ssize_t size = ::read(file.number(), block, sizeof block);
    if (size < 0 && errno != EINTR) return false;
    if (size == 0) return true;
    if (size > 0) content.append(block, static_cast<std::size_t>(size));
  }
}

ExitStatus push(const std::string& path, Tool& tool) {
  std::string content;
  if (!readFile(path, content)) {
    tool.errors << "probectl: cannot read " << onOneLine(path) << ": " << std::strerror(errno) << '\n';
    return ExitStatus::Failure;
  }
  ServiceClient client(tool);
  return client.perform(
      radix::kCommandSetBaseConfiguration,
      {{radix::kKeyAppID, radix::serviceAppId},
       {radix::kKeyPayload, Value::bytes({reinterpret_cast<const std::uint8_t*>(content.data()), content.size()})},
       {radix::kKeyPayloadType, std::int64_t{0}}},
      nullptr, path);
}

ExitStatus clear(Tool& tool) {
  ServiceClient client(tool);
  return client.perform(radix::kCommandClearBaseConfiguration, {{radix::kKeyAppID, radix::serviceAppId}});
}

}  // namespace

void addConfigCommand(CLI::App& program, Tool& tool) {
  CLI::App* command = program.add_subcommand("config", "Set or clear the service's base configuration");
  command->require_subcommand(1);
  command->footer(
      "The base configuration counts as that of one more client until it is cleared or the service ends.\n"
      "Exit status 1 when it is refused, with the line and the column of what is wrong.\n"
      "\n"
      "Examples:\n"
      "  probectl config push kiv_test_lte.deviceconfig\n"
      "  probectl config clear");
  CLI::App* pushing = command->add_subcommand("push", "Set it to the content of a file");
  auto path = std::make_shared<std::string>();
  pushing->add_option("FILE", *path, "A configuration file: metrics, their periods, triggers")->required();
  pushing->callback([path, &tool] { tool.run = [path, &tool] { return push(*path, tool); }; });
  CLI::App* clearing = command->add_subcommand("clear", "Take it away");
  clearing->callback([&tool] { tool.run = [&tool] { return clear(tool); }; });
}

}  // namespace probeview
