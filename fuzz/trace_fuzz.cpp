// SPDX-License-Identifier: Apache-2.0
//
// Drive-test logs: whatever the file holds, it is refused with a reason or becomes rows, and every row becomes payloads
// that decode.
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <string_view>

#include "messages/metric_identifiers.h"
#include "messages/runtime/codable.h"
#include "messages/runtime/data_reader.h"
#include "service/sources/trace_reader.h"
#include "service/sources/trace_translator.h"

using namespace probeview;

namespace {

void require(bool truth) {
  if (!truth) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const TraceLogResult result = readTraceLog({reinterpret_cast<const char*>(data), size});
  require(result.log.has_value() == result.error.empty());
  if (!result.log) return 0;
  require(!result.log->rows.empty());
  require(result.log->problems.size() <= 2 * traceProblemsKept);
  TraceTranslator translator;
  std::vector<TraceMetric> metrics;
  // Twice, as with "loop".
  for (int round = 0; round < 2; ++round) {
    for (const TraceRow& row : result.log->rows) {
      translator.translate(row, metrics);
      for (const TraceMetric& metric : metrics) {
        const MetricIdentifier* const identifier = metricWithId(metric.metricId);
        require(identifier != nullptr && identifier->isHandled);
        const std::unique_ptr<PBCodable> message = identifier->message->make();
        PBDataReader reader(metric.payload);
        require(message->readFrom(reader));
      }
    }
    translator.startOver();
  }
  return 0;
}
