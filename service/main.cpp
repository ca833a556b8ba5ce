// SPDX-License-Identifier: Apache-2.0
#include <unistd.h>

#include <string>
#include <vector>

#include "platform/console_log.h"
#include "service/radixd.h"

int main(int count, char** arguments) {
  probeview::ConsoleLog log(STDERR_FILENO);
  return probeview::runRadixd(std::vector<std::string>(arguments + 1, arguments + count), log);
}
