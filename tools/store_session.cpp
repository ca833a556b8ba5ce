// SPDX-License-Identifier: Apache-2.0
#include "tools/store_session.h"

#include <algorithm>
#include <utility>

#include "platform/fatal_error.h"
#include "ui/category_page.h"
#include "ui/page_snapshot.h"
#include "ui/varnet_view_items.h"
#include "values/json.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

// Thrown by the observer of fatal stops, to leave the store without ending this process.
struct FatalStop {
  std::string reason;
};

// Observes as long as it lives.
class FatalStopGuard {
 public:
  FatalStopGuard() {
    setFatalErrorObserver([](std::string_view reason) { throw FatalStop{std::string(reason)}; });
  }
  ~FatalStopGuard() { setFatalErrorObserver({}); }
  FatalStopGuard(const FatalStopGuard&) = delete;
  FatalStopGuard& operator=(const FatalStopGuard&) = delete;
};

// The text of an {"error":…} answer, thrown where a line turns out not to be understood.
struct Misunderstanding {
  std::string what;
};

template <typename Content>
void appendMember(std::string_view key, const Content& content, bool first, std::string& out) {
  if (!first) out += ',';
  appendJsonString(key, out);
  out += ':';
  appendJson(content, out);
}

// The fields of each record, in their order.
void appendRecord(const LTE& record, std::string& out) {
  out += '{';
  appendMember("SelReselCellInfo", record.SelReselCellInfo, true, out);
  appendMember("EutraNbrs", record.EutraNbrs, false, out);
  appendMember("RsrpRsrqSinr", record.RsrpRsrqSinr, false, out);
  appendMember("TxPower", record.TxPower, false, out);
  appendMember("EutraNbrsMeas", record.EutraNbrsMeas, false, out);
  appendMember("UtraNbrsMeas", record.UtraNbrsMeas, false, out);
  appendMember("GeraNbrsMeas", record.GeraNbrsMeas, false, out);
  appendMember("CAStatusList", record.CAStatusList, false, out);
  appendMember("MMCommonInfo", record.MMCommonInfo, false, out);
  appendMember("IMSI", record.IMSI, false, out);
  out += '}';
}
void appendRecord(const UMTS& record, std::string& out) {
  out += '{';
  appendMember("rXInfo", record.rXInfo, true, out);
  appendMember("TxPower", record.TxPower, false, out);
  appendMember("SelReselCellInfo", record.SelReselCellInfo, false, out);
  appendMember("eUtraNbrs", record.eUtraNbrs, false, out);
  appendMember("utraNbrs", record.utraNbrs, false, out);
  appendMember("geraNbrs", record.geraNbrs, false, out);
  appendMember("eUtraNbrMeas", record.eUtraNbrMeas, false, out);
  appendMember("utraNbrMeas", record.utraNbrMeas, false, out);
  appendMember("geraNbrMeas", record.geraNbrMeas, false, out);
  out += '}';
}
void appendRecord(const GSM& record, std::string& out) {
  out += '{';
  appendMember("eUtraNbrMeas", record.eUtraNbrMeas, true, out);
  appendMember("utraNbrMeas", record.utraNbrMeas, false, out);
  appendMember("geraNbrMeas", record.geraNbrMeas, false, out);
  out += '}';
}
void appendRecord(const Common& record, std::string& out) {
  out += '{';
  appendMember("activeBearer", record.activeBearer, true, out);
  appendMember("simContents", record.simContents, false, out);
  out += '}';
}

void appendOptionalText(const std::optional<std::string>& text, std::string& out) {
  if (text) {
    appendJsonString(*text, out);
  } else {
    out += "null";
  }
}

void appendOptionalDictionary(const std::optional<Dictionary>& dictionary, std::string& out) {
  if (dictionary) {
    appendJson(*dictionary, out);
  } else {
    out += "null";
  }
}

}  // namespace

StoreSession::StoreSession() { reset(); }
StoreSession::~StoreSession() = default;

std::string StoreSession::answer(std::string_view line) {
  console_.clear();
  systemLog_.clear();
  std::string out;
  const FatalStopGuard guard;
  try {
    return perform(line);
  } catch (const Misunderstanding& misunderstanding) {
    out = "{\"error\":";
    appendJsonString(misunderstanding.what, out);
    out += '}';
  } catch (const FatalStop& stop) {
    stopped_ = true;
    out = "{\"fatal\":";
    appendJsonString(stop.reason, out);
    out += ",\"log\":";
    appendJson(console_, out);
    out += '}';
  }
  return out;
}

std::string StoreSession::perform(std::string_view line) {
  // Blanks before the command are nothing.
  line.remove_prefix(std::min(line.find_first_not_of(" \t\r"), line.size()));
  // A page's key is taken as it stands, blanks and all.
  constexpr std::string_view pageCommand = "page ";
  if (line.starts_with(pageCommand)) {
    std::string out;
    appendPage(line.substr(pageCommand.size()), out);
    return out;
  }
  const std::vector<std::string_view> words = splitWords(line);
  const std::string_view command = words.empty() ? std::string_view() : words[0];
  const auto expectArguments = [&](std::size_t count, std::string_view usage) {
    if (words.size() != count + 1) throw Misunderstanding{"expected: " + std::string(usage)};
  };
  if (command == "event") {
    expectArguments(2, "event ID HEX");
    return event(words);
  }
  if (command == "trigger") {
    expectArguments(0, "trigger");
    return trigger();
  }
  if (command == "dict") {
    expectArguments(1, "dict NAME");
    return displayDictionary(words[1]);
  }
  if (command == "record") {
    expectArguments(1, "record LTE|UMTS|GSM|Common");
    return record(words[1]);
  }
  if (command == "state") {
    expectArguments(0, "state");
    return state();
  }
  if (command == "pages") {
    expectArguments(0, "pages");
    return pages();
  }
  if (command == "reset") {
    expectArguments(0, "reset");
    reset();
    return "{}";
  }
  if (command == "page") throw Misunderstanding{"expected: page KEY"};
  throw Misunderstanding{"no such command: " + quotedExcerpt(command) +
                         "; there are event, trigger, dict, record, state, page, pages and reset"};
}

std::string StoreSession::event(const std::vector<std::string_view>& words) {
  constexpr std::string_view none = "none";
  Dictionary event;
  if (words[1] != none) {
    const std::optional<std::int64_t> identifier = parseInteger64(words[1]);
    if (!identifier) {
      throw Misunderstanding{quotedExcerpt(words[1]) + " is no identifier: decimal, 0x… or none, of 64 bits"};
    }
    event.set(Key::constant(MetricValidator::metricIDKey), *identifier);
  }
  if (words[2] != none) {
    const std::optional<std::vector<std::uint8_t>> payload = parseHex(words[2]);
    if (!payload) {
      throw Misunderstanding{quotedExcerpt(words[2]) + " is no payload: pairs of hexadecimal digits, - or none"};
    }
    event.set(Key::constant(MetricValidator::payloadKey), Value::bytes(*payload));
  }
  const bool result = store_->metricsDidUpdate(event);
  std::string out = result ? "{\"result\":true,\"log\":" : "{\"result\":false,\"log\":";
  appendJson(console_, out);
  out += ",\"syslog\":";
  appendJson(systemLog_, out);
  out += '}';
  return out;
}

std::string StoreSession::trigger() {
  store_->eventsDidUpdate(Dictionary());
  std::string out = "{\"log\":";
  appendJson(console_, out);
  out += '}';
  return out;
}

std::string StoreSession::displayDictionary(std::string_view name) const {
  const std::optional<DisplayDictionary> which = displayDictionaryNamed(name);
  if (!which) throw Misunderstanding{"no such display dictionary: " + quotedExcerpt(name)};
  std::string out = "{";
  appendJsonString(name, out);
  out += ':';
  appendOptionalDictionary(store_->displayDictionary(*which), out);
  out += '}';
  return out;
}

std::string StoreSession::record(std::string_view name) const {
  std::string out = "{";
  appendJsonString(name, out);
  out += ':';
  if (name == "LTE") {
    appendRecord(store_->myLTE(), out);
  } else if (name == "UMTS") {
    appendRecord(store_->myUMTS(), out);
  } else if (name == "GSM") {
    appendRecord(store_->myGSM(), out);
  } else if (name == "Common") {
    appendRecord(store_->myCommon(), out);
  } else {
    throw Misunderstanding{"no such record: " + quotedExcerpt(name) + "; there are LTE, UMTS, GSM and Common"};
  }
  out += '}';
  return out;
}

std::string StoreSession::state() const {
  std::string out = "{\"dicts\":{";
  for (std::size_t index = 0; index < displayDictionaryCount; ++index) {
    if (index > 0) out += ',';
    appendJsonString(displayDictionaryNames[index], out);
    out += ':';
    appendOptionalDictionary(store_->displayDictionary(static_cast<DisplayDictionary>(index)), out);
  }
  out += "},\"LTE\":";
  appendRecord(store_->myLTE(), out);
  out += ",\"UMTS\":";
  appendRecord(store_->myUMTS(), out);
  out += ",\"GSM\":";
  appendRecord(store_->myGSM(), out);
  out += ",\"Common\":";
  appendRecord(store_->myCommon(), out);
  out += '}';
  return out;
}

std::string StoreSession::pages() {
  std::string out = "[";
  bool first = true;
  for (const std::string& key : navigablePageKeys()) {
    if (!first) out += ',';
    first = false;
    appendPage(key, out);
  }
  out += ']';
  return out;
}

void StoreSession::appendPage(std::string_view key, std::string& out) {
  // Each page carries its own lines; should one of them stop the program, its answer carries those of all before it.
  const std::size_t firstLine = console_.lines().size();
  CategoryPage page(std::string(key), *store_, console_);
  const PageSnapshot snapshot = takeSnapshot(page);
  out += "{\"page\":";
  appendJsonString(key, out);
  out += ",\"sections\":[";
  for (std::size_t section = 0; section < snapshot.sections.size(); ++section) {
    if (section > 0) out += ',';
    out += "{\"title\":";
    appendOptionalText(snapshot.sections[section].title, out);
    out += ",\"rows\":[";
    bool first = true;
    for (const ListCell& cell : snapshot.sections[section].rows) {
      if (!first) out += ',';
      first = false;
      out += '[';
      appendOptionalText(cell.text, out);
      out += ',';
      appendOptionalText(cell.detail, out);
      out += ']';
    }
    out += "]}";
  }
  out += "],\"log\":";
  appendJson(console_, out, firstLine);
  out += '}';
}

void StoreSession::reset() {
  store_ = std::make_unique<MetricValidator>(
      MetricValidator::Surroundings{.wrapper = nullptr, .console = console_, .systemLog = systemLog_});
}

}  // namespace probeview
