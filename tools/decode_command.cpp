// SPDX-License-Identifier: Apache-2.0
#include "tools/decode_command.h"

#include <algorithm>
#include <ostream>
#include <string>
#include <vector>

#include "tools/batch.h"
#include "tools/payload_decoder.h"
#include "values/json.h"
#include "values/plain_text.h"
#include "values/printer.h"

namespace probeview {

namespace {

struct DecodeOptions {
  bool batch = false;
  std::string reference;
  std::vector<std::string> hex;  // words, as they were pasted
};

// Bytes from hexadecimal as it is pasted: in any number of words, with or without 0x before each, across line ends. A
// word with 0x holds whole bytes.
std::optional<std::vector<std::uint8_t>> parsePastedHex(const std::vector<std::string>& arguments) {
  if (arguments.size() == 1 && arguments[0] == "-") return parseHex("-");
  std::string digits;
  for (const std::string& argument : arguments) {
    std::string_view rest = argument;
    while (true) {
      rest.remove_prefix(std::min(rest.find_first_not_of(" \t\r\n"), rest.size()));
      if (rest.empty()) break;
      std::string_view word = rest.substr(0, rest.find_first_of(" \t\r\n"));
      rest.remove_prefix(word.size());
      if (word.starts_with("0x") || word.starts_with("0X")) {
        word.remove_prefix(2);
        if (word.empty() || word.size() % 2 != 0) return std::nullopt;
      }
      digits += word;
    }
  }
  return digits == "-" ? std::nullopt : parseHex(digits);
}

std::string joined(const std::vector<std::string>& words) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : " ") + word;
  return text;
}

std::string_view asText(const std::vector<std::uint8_t>& bytes) {
  return {reinterpret_cast<const char*>(bytes.data()), bytes.size()};
}

// A text stands bare unless it holds what would break the line or steer a terminal.
std::string valueForAPerson(const Value& value) {
  std::string bare = bareText(value);
  return onOneLine(bare) == bare ? bare : onOneLine(printed(value));
}

ExitStatus decodeForAPerson(const DecodeOptions& options, Tool& tool) {
  const std::optional<std::vector<std::uint8_t>> bytes = parsePastedHex(options.hex);
  if (!bytes) {
    tool.errors << "probectl: " << quotedExcerpt(joined(options.hex))
                << " is no payload: pairs of hexadecimal digits, or - for an empty one\n";
    return ExitStatus::UsageError;
  }
  DecodeResult result = decodePayload(options.reference, *bytes);
  if (!result.payload) {
    tool.errors << "probectl: " << result.error << result.hint << '\n';
    return ExitStatus::UsageError;
  }
  std::string text;
  for (const Dictionary::Entry& entry : result.payload->dictionary) {
    appendOnOneLine(entry.key.text(), text);
    text += ": ";
    text += valueForAPerson(entry.value);
    text += '\n';
  }
  tool.output << text;
  tool.output.flush();
  for (const std::string& line : result.payload->log.lines()) tool.errors << line << '\n';
  if (result.payload->ok) return ExitStatus::Success;
  tool.errors << "probectl: the payload does not decode as " << result.payload->className
              << "; above is what came before the fault\n";
  return ExitStatus::Failure;
}

void answerLine(std::string_view line, BatchOutput& output) {
  const std::vector<std::string_view> words = splitWords(line);
  if (words.size() != 2) return output.error("expected: CLASS|METRIC HEX");
  const std::optional<std::vector<std::uint8_t>> bytes = parseHex(words[1]);
  if (!bytes) {
    return output.error(quotedExcerpt(words[1]) + " is no payload: pairs of hexadecimal digits, or - for an empty one");
  }
  const DecodeResult result = decodePayload(words[0], *bytes);
  if (!result.payload) return output.error(result.error);
  std::string json = "{\"class\":";
  appendJsonString(result.payload->className, json);
  json += ",\"ok\":";
  json += result.payload->ok ? "true" : "false";
  json += ",\"dict\":";
  appendJson(result.payload->dictionary, json);
  json += ",\"reencoded\":\"";
  appendHex(asText(result.payload->reencoded), json);
  json += "\",\"log\":";
  appendJson(result.payload->log, json);
  json += '}';
  output.line(json);
}

ExitStatus runBatch(Tool& tool) {
  BatchInput input(tool.input);
  BatchOutput output(tool.output);
  while (input.next()) {
    if (input.tooLong()) {
      output.error("the line is longer than " + std::to_string(batchLineLengthLimit) + " bytes");
    } else {
      answerLine(input.line(), output);
    }
    if (output.closed()) return ExitStatus::Failure;
  }
  return ExitStatus::Success;
}

}  // namespace

void addDecodeCommand(Command program, Tool& tool) {
  Command command = program.subcommand("decode", "Decode payloads by hand");
  auto options = std::make_shared<DecodeOptions>();
  const CommandOption reference = command.option(
      "CLASS|METRIC", options->reference, "A message class, a metric, or a metric's identifier (decimal or 0x…)");
  const CommandOption hex = command.option(
      "HEX", options->hex, "The payload in hexadecimal, - for an empty one; blanks, line ends and 0x do no harm");
  command
      .flag("--batch", options->batch,
            "Read lines \"CLASS|METRIC HEX\" from standard input, answer each with a line of JSON")
      .excludes(reference)
      .excludes(hex);
  command.footer(
      "Prints a line \"key: value\" for each field; with --batch one JSON object a line:\n"
      "  {\"class\":…,\"ok\":true|false,\"dict\":{…},\"reencoded\":\"hex\",\"log\":[…]}\n"
      "or {\"error\":…} for a line that is not understood. Blank lines and lines that begin with # are ignored.\n"
      "\n"
      "Exit status: 0 decoded (with --batch: the end of the input was reached); 1 it does not decode, what came\n"
      "before the fault is shown; 2 the class or the hexadecimal is not understood.\n"
      "\n"
      "Examples:\n"
      "  probectl decode K_LTE_RRC_STATE 10031801\n"
      "  probectl decode K_LTE_RRC_STATE 0x10 0x03 0x18 0x01\n"
      "  probectl decode KCellularLteTxPower -\n"
      "  echo '0x3C4E04 1003' | probectl decode --batch");
  command.whenChosen([options, &tool] {
    if (!options->batch && (options->reference.empty() || options->hex.empty())) {
      throw UsageError("CLASS|METRIC and HEX, or --batch, is required");
    }
    tool.run = [options, &tool] { return options->batch ? runBatch(tool) : decodeForAPerson(*options, tool); };
  });
}

}  // namespace probeview
