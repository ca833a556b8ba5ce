// SPDX-License-Identifier: Apache-2.0
#include "app/front_choice.h"

#include <unistd.h>

#include <cstdlib>

namespace probeview {

namespace {

bool isSet(const char* variable) {
  const char* value = std::getenv(variable);
  return value != nullptr && *value != '\0';
}

}  // namespace

FrontKind chooseFront(const FrontCircumstances& circumstances) {
  if (circumstances.asked) return *circumstances.asked;
  if (circumstances.hasWindow && circumstances.hasDisplay) return FrontKind::Window;
  return circumstances.hasTerminal ? FrontKind::Terminal : FrontKind::Print;
}

FrontCircumstances frontCircumstances(std::optional<FrontKind> asked, bool hasWindow) {
  return {asked, hasWindow, isSet("WAYLAND_DISPLAY") || isSet("DISPLAY"),
          ::isatty(STDIN_FILENO) != 0 && ::isatty(STDOUT_FILENO) != 0};
}

}  // namespace probeview
