// SPDX-License-Identifier: Apache-2.0
#include "tools/payload_decoder.h"

#include <algorithm>
#include <iterator>
#include <memory>

#include "messages/metric_identifiers.h"
#include "messages/registry.h"
#include "messages/runtime/codable.h"
#include "messages/runtime/data_reader.h"
#include "messages/runtime/data_writer.h"
#include "tools/names.h"
#include "values/near_matches.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

// Null, with the reason, when the reference leads to no class.
const MessageDescriptor* findClass(std::string_view reference, DecodeResult& result) {
  if (const MessageDescriptor* const message = messageClass(reference)) return message;
  const MetricIdentifier* const metric = metricReferredTo(reference);
  if (metric == nullptr) {
    result.error = quotedExcerpt(reference) + " is no message class, no metric and no metric's identifier";
    std::vector<std::string_view> names = metricNames();
    std::ranges::copy(classNames(), std::back_inserter(names));
    result.hint = didYouMean(reference, names);
    return nullptr;
  }
  if (metric->message == nullptr) result.error = std::string(metric->name) + " has no message class";
  return metric->message;
}

}  // namespace

DecodeResult decodePayload(std::string_view reference, std::span<const std::uint8_t> bytes) {
  DecodeResult result;
  const MessageDescriptor* const messageClass = findClass(reference, result);
  if (messageClass == nullptr) return result;
  DecodedPayload& payload = result.payload.emplace();
  const std::unique_ptr<PBCodable> message = messageClass->make();
  PBDataReader reader(bytes, &payload.log);
  payload.className = message->className();
  payload.ok = message->readFrom(reader);
  payload.dictionary = message->dictionaryRepresentation();
  PBDataWriter writer;
  message->writeTo(writer);
  payload.reencoded = writer.takeBytes();
  return result;
}

}  // namespace probeview
