// SPDX-License-Identifier: Apache-2.0
//
// What a service may answer to probectl. The input is a dictionary as it comes over the socket; it is taken for a
// report of the service's state and for a metric's record. Whatever it holds, each is shown on lines of its own that
// steer no terminal, and as JSON on one line.
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <span>
#include <sstream>
#include <string>

#include "radix/dictionary_bytes.h"
#include "radix/frames.h"
#include "tests/support/harmless.h"
#include "tools/record_text.h"
#include "tools/status_command.h"

namespace {

void check(bool holds) {
  if (!holds) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::optional<probeview::Dictionary> reply = radix::decodeDictionary(std::span(data, size));
  if (!reply) return 0;
  std::ostringstream report;
  probeview::showReport(*reply, report);
  check(probeview::areHarmless(report.str()));
  for (const bool json : {false, true}) {
    for (const bool personal : {false, true}) {
      probeview::RecordText text({.json = json, .personal = personal});
      check(probeview::isHarmless(text.line(*reply)));
    }
  }
  return 0;
}
