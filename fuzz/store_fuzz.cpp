// SPDX-License-Identifier: Apache-2.0
//
// The event road of the store: any run of payloads for any of the handled metrics. An event is a byte that chooses the
// metric, a byte for the length, and the payload. A fatal stop is caught where the program would end, and a new store
// begins; everything else must leave the store in order.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <span>
#include <string>
#include <vector>

#include "platform/fatal_error.h"
#include "store/handlers.h"
#include "store/metric_validator.h"
#include "values/printer.h"

namespace {

using namespace probeview;

struct FatalStop {};

void must(bool holds) {
  if (!holds) std::abort();
}

// Takes the lines of an event and insists that each is one line.
class CountingSink final : public LineSink {
 public:
  void line(std::string_view text) override {
    must(text.find('\n') == std::string_view::npos && isValidUtf8(text));
    ++count;
  }
  std::size_t count = 0;
};

std::vector<std::int64_t> handledIdentifiers() {
  std::vector<std::int64_t> identifiers;
  for (const auto family : {lteHandlers(), umtsHandlers(), gsmHandlers(), nasHandlers()}) {
    for (const MetricHandler& handler : family) identifiers.push_back(handler.metricID);
  }
  return identifiers;
}

// A list of the records: entries only, and never none.
void checkList(const List& list) {
  must(!list.empty());
  for (const Value& entry : list) must(entry.dictionary() != nullptr);
}

void checkKeys(const Dictionary& entry, const Dictionary& fixed) {
  must(entry.size() == fixed.size());
  for (std::size_t index = 0; index < fixed.size(); ++index) must(entry[index].key == fixed[index].key);
}

void checkStore(const MetricValidator& store) {
  static const LTE freshLte;
  static const UMTS freshUmts;
  const LTE& lte = store.myLTE();
  const UMTS& umts = store.myUMTS();
  checkKeys(lte.SelReselCellInfo, freshLte.SelReselCellInfo);
  checkKeys(umts.SelReselCellInfo, freshUmts.SelReselCellInfo);
  for (const List* list : {&lte.EutraNbrs, &lte.CAStatusList, &umts.rXInfo, &umts.TxPower, &umts.eUtraNbrs,
                           &umts.utraNbrs, &umts.geraNbrs, &umts.eUtraNbrMeas, &umts.utraNbrMeas, &umts.geraNbrMeas,
                           &store.myGSM().eUtraNbrMeas, &store.myGSM().utraNbrMeas, &store.myGSM().geraNbrMeas,
                           &store.myCommon().activeBearer, &store.myCommon().simContents}) {
    checkList(*list);
  }
  must(lte.RsrpRsrqSinr == freshLte.RsrpRsrqSinr && lte.TxPower == freshLte.TxPower &&
       lte.EutraNbrsMeas == freshLte.EutraNbrsMeas && lte.UtraNbrsMeas == freshLte.UtraNbrsMeas &&
       lte.GeraNbrsMeas == freshLte.GeraNbrsMeas && lte.MMCommonInfo == freshLte.MMCommonInfo &&
       lte.IMSI == freshLte.IMSI);
  must(!store.myLTESCellMeasDict());
}

// Feeds one store until the events end or the program would; the events that are left.
std::span<const std::uint8_t> feedOneStore(std::span<const std::uint8_t> events) {
  static const std::vector<std::int64_t> identifiers = handledIdentifiers();
  static const FixedTimeZone utc(0, "UTC");
  CountingSink console;
  CountingSink systemLog;
  MetricValidator store({.console = console, .systemLog = systemLog, .timeZone = utc});
  while (events.size() >= 2) {
    const std::int64_t identifier = identifiers[events[0] % identifiers.size()];
    const std::size_t size = std::min<std::size_t>(events[1], events.size() - 2);
    const auto payload = events.subspan(2, size);
    events = events.subspan(2 + size);
    console.count = 0;
    try {
      must(store.metricsDidUpdate(Dictionary{{"kKeyMetricID", identifier}, {"kKeyPayload", Value::bytes(payload)}}));
    } catch (const FatalStop&) {
      return events;
    }
    // The identifier, the handler's line, the bands on their own, and that it was valid.
    must(console.count == 3 || console.count == 4);
    const auto& latest = store.displayDictionary(handledMetric(identifier)->dictionary);
    must(latest.has_value());
    const Value* timestamp = latest->find("timestamp");
    must(timestamp == nullptr || timestamp->text());
    checkStore(store);
  }
  return {};
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  setFatalErrorObserver([](std::string_view) { throw FatalStop{}; });
  std::span<const std::uint8_t> events(data, size);
  while (!events.empty()) events = feedOneStore(events);
  return 0;
}
