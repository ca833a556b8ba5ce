// SPDX-License-Identifier: Apache-2.0
#include <unistd.h>

#include <chrono>
#include <string>
#include <vector>

#include "platform/console_log.h"
#include "service/radixd.h"

int main(int count, char** arguments) {
  // Nobody is ever kept: the service has one loop for all its clients.
  probeview::ConsoleLog log(
      STDERR_FILENO,
      {.prefix = "radixd: warning: ", .mostBytes = 1024 * 1024, .patience = std::chrono::nanoseconds::zero()});
  return probeview::runRadixd(std::vector<std::string>(arguments + 1, arguments + count), log);
}
