// SPDX-License-Identifier: Apache-2.0
//
// The metric store. It takes metric events, chooses the message class by the metric's identifier, decodes, and keeps
// the latest values: one display dictionary per metric kind, and the four records. The pages read both.
//
// Everything runs on the main thread, and nothing takes a lock. The store trusts the service to send well-formed
// metrics: an event without identifier, a payload that does not decode, a timestamp that is no number and an adjustment
// that leaves 32 bits each stop the program, because a viewer that shows doubtful values is worse than none.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "client/radix_wrapper_delegate.h"
#include "messages/quantities.h"
#include "platform/time_zone.h"
#include "platform/timestamp_formatter.h"
#include "store/display_dictionaries.h"
#include "store/records.h"
#include "values/dictionary.h"
#include "values/line_sink.h"

namespace probeview {

class HandlerTurn;
class PBCodable;
class RadixWrapper;
struct HandledMetric;

class MetricValidator : public RadixWrapperDelegate {
 public:
  // Where the store stands; everything named must outlive it.
  struct Surroundings {
    // Null for a store that is fed directly.
    RadixWrapper* wrapper = nullptr;
    // Takes one line per thing said; the lines of one event form a group.
    LineSink& console;
    // Takes the message decoder's lines.
    LineSink& systemLog;
    const TimeZone& timeZone = deviceTimeZone();
  };

  // The store of the process, made on first access with the shared wrapper, standard output and the system's log, and
  // never destroyed. Its construction makes the wrapper listen and makes the store its delegate.
  static MetricValidator& sharedValidator();

  // The surroundings of the shared store.
  MetricValidator();
  explicit MetricValidator(const Surroundings& surroundings);
  ~MetricValidator() override;
  MetricValidator(const MetricValidator&) = delete;
  MetricValidator& operator=(const MetricValidator&) = delete;

  // The wrapper's delegate. An absent metric event stops the program; a trigger event is only noted in the log.
  void metricsDidUpdate(const Dictionary* event) override;
  void eventsDidUpdate(const Dictionary* event) override;
  // The same for an event in hand. True when the metric was recognised and stored.
  bool metricsDidUpdate(const Dictionary& event);
  void eventsDidUpdate(const Dictionary& event);

  RadixWrapper* mySharedRadixInstance() const { return surroundings_.wrapper; }

  static constexpr std::string_view metricIDKey = "kKeyMetricID";
  static constexpr std::string_view payloadKey = "kKeyPayload";
  // No code reads it.
  static constexpr std::string_view profileIDKey = "kKeyProfileID";
  // The identifier of the last event; absent when that event carried none.
  const std::optional<std::int64_t>& metricID() const { return metricID_; }

  const LTE& myLTE() const { return lte_; }
  const UMTS& myUMTS() const { return umts_; }
  const GSM& myGSM() const { return gsm_; }
  const Common& myCommon() const { return common_; }

  // MHz of a downlink bandwidth index (3GPP TS 36.331, 6.2.2, dl-Bandwidth: n6 to n100).
  static constexpr std::array<float, quantities::lteBandwidths.size()> dlbwlookup = [] {
    std::array<float, quantities::lteBandwidths.size()> megahertz{};
    for (std::size_t index = 0; index < megahertz.size(); ++index) {
      megahertz[index] = static_cast<float>(quantities::lteBandwidths[index]);
    }
    return megahertz;
  }();

  // A display dictionary: absent until its metric first arrives, then the whole dictionary form of the latest message,
  // its timestamp as text, with the changes of its handler. Handlers work through the mutable access, and what they
  // read back is what it gives, so that a subclass which overrides both is what the store stores into.
  virtual const std::optional<Dictionary>& displayDictionary(DisplayDictionary which) const;
  // Each of them by its name, such as myLTERRCStateDict().
#define METRIC(constant, identifier, Class, dictionary, ...) \
  const std::optional<Dictionary>& dictionary() const { return displayDictionary(DisplayDictionary::dictionary); }
#define METRIC_WITHOUT_HANDLER METRIC
#include "messages/metrics.inc"

 protected:
  // Recognises and stores one metric: true when it did.
  virtual bool handleMetric(const Dictionary& event);
  virtual std::optional<Dictionary>& mutableDisplayDictionary(DisplayDictionary which);

 private:
  friend class HandlerTurn;

  Dictionary decode(const HandledMetric& metric, const Dictionary& event);

  Surroundings surroundings_;
  std::optional<std::int64_t> metricID_;
  LTE lte_;
  UMTS umts_;
  GSM gsm_;
  Common common_;
  std::array<std::optional<Dictionary>, displayDictionaryCount> displayDictionaries_;
  TimestampFormatter timestampFormatter_;
  // The message behind each of them, empty between events; kept for its memory.
  std::array<std::unique_ptr<PBCodable>, displayDictionaryCount> messages_;
  // The line being built; kept for its memory, too.
  std::string line_;
  // What the wrapper holds weakly, and what ends when the store does. It owns nothing.
  std::shared_ptr<RadixWrapperDelegate> self_;
};

}  // namespace probeview
