// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <string>

#include "messages/runtime/field_descriptor.h"
#include "platform/timestamp_formatter.h"
#include "values/dictionary.h"

namespace probeview {

// Puts "…" in the place of the fields of the message that are marked as personal, however deep they lie.
void hidePersonalData(Dictionary& dictionary, const MessageDescriptor& message);

// Shows metric events of the service, each as one line.
class RecordText {
 public:
  struct Options {
    bool json = false;
    bool personal = false;  // shows personal data, too
  };

  explicit RecordText(Options options) : options_(options) {}

  // For a person: time, origin, metric, dictionary; or the JSON object {"time","origin","metric","id","dict"}, with the
  // time in milliseconds since 1970-01-01 UTC. The dictionary of a metric without a message class is empty (null).
  std::string line(const Dictionary& event);

  // The same with those entries alone that differ from the metric's record before, and the keys that have gone
  // ("gone" in JSON); absent when nothing but timestamps has changed. A metric's first record is shown whole.
  std::optional<std::string> changedLine(const Dictionary& event);

 private:
  // What a metric's last record held.
  struct Last {
    Dictionary content;
    std::string payload;
  };
  std::string line(const Dictionary& event, std::optional<Dictionary> content, const List& gone);

  Options options_;
  TimestampFormatter timestamps_;
  std::map<std::int64_t, Last> last_;
};

}  // namespace probeview
