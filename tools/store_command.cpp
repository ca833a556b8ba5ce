// SPDX-License-Identifier: Apache-2.0
#include "tools/store_command.h"

#include "tools/batch.h"
#include "tools/store_session.h"

namespace probeview {

namespace {

ExitStatus runStoreBatch(Tool& tool) {
  BatchInput input(tool.input);
  BatchOutput output(tool.output);
  StoreSession session;
  while (input.next()) {
    if (input.tooLong()) {
      output.error("the line is longer than " + std::to_string(batchLineLengthLimit) + " bytes");
    } else {
      output.line(session.answer(input.line()));
    }
    if (session.stopped()) return ExitStatus::BrokenContract;
    if (output.closed()) return ExitStatus::Failure;
  }
  return ExitStatus::Success;
}

}  // namespace

void addStoreCommand(Command program, Tool& tool) {
  Command command = program.subcommand("store", "Feed a store by hand and look at what it keeps and shows");
  command.flag("--batch", "Read commands from standard input, one a line, and answer each with a line of JSON")
      .required();
  command.footer(
      "Commands: event ID HEX, trigger, dict NAME, record LTE|UMTS|GSM|Common, state, page KEY, pages, reset.\n"
      "ID is decimal, 0x… or negative; HEX is the payload, - an empty one; either may be none. Blank lines and\n"
      "lines that begin with # are ignored. No service is contacted.\n"
      "\n"
      "A line that is not understood is answered {\"error\":…}. Where the program stops, the answer is\n"
      "{\"fatal\":…} and the exit status 3.\n"
      "\n"
      "Examples:\n"
      "  printf 'event 0x3C4E04 1003\\npage LTE RRC State\\n' | probectl store --batch\n"
      "  echo pages | probectl store --batch");
  command.whenChosen([&tool] { tool.run = [&tool] { return runStoreBatch(tool); }; });
}

}  // namespace probeview
