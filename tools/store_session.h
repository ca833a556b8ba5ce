// SPDX-License-Identifier: Apache-2.0
//
// One store that is fed and asked by lines of text, each answered with one line of JSON:
//
//   event ID HEX      {"result":true,"log":[…],"syslog":[…]}; ID decimal, 0x… or negative; either may be "none"
//   trigger           {"log":[…]}
//   dict NAME         {NAME:{…}}, null while absent
//   record NAME       {NAME:{…}}; LTE, UMTS, GSM or Common, the fields in order
//   state             {"dicts":{…},"LTE":{…},"UMTS":{…},"GSM":{…},"Common":{…}}
//   page KEY          {"page":KEY,"sections":[{"title":…,"rows":[[label,detail],…]}],"log":[…]}; KEY is the rest of the
//                     line as it stands
//   pages             an array of all pages, in the order of the lists
//   reset             {}; the store is new
//
// Whatever it cannot understand is answered {"error":…}. Where the store or a page stops the program the answer is
// {"fatal":reason,"log":[…]}, and the session is over.
#pragma once

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "store/metric_validator.h"
#include "tools/batch.h"

namespace probeview {

// While a session answers it observes fatal stops, so there is to be one at a time. Main thread.
class StoreSession {
 public:
  StoreSession();
  ~StoreSession();

  // The answer to one line that is neither blank nor a comment.
  std::string answer(std::string_view line);
  // The last answer told of a fatal stop; no further line may be answered.
  bool stopped() const { return stopped_; }

  // The store itself, for tests that feed it.
  MetricValidator& store() { return *store_; }

 private:
  std::string perform(std::string_view line);
  std::string event(const std::vector<std::string_view>& words);
  std::string trigger();
  std::string displayDictionary(std::string_view name) const;
  std::string record(std::string_view name) const;
  std::string state() const;
  std::string pages();
  void appendPage(std::string_view key, std::string& out);
  void reset();

  CollectedLines console_;
  CollectedLines systemLog_;
  std::unique_ptr<MetricValidator> store_;
  bool stopped_ = false;
};

}  // namespace probeview
