// SPDX-License-Identifier: Apache-2.0
//
// The process-wide instances, in a process of their own. The environment names a socket where no service is.
#include <gtest/gtest.h>

#include "client/radix_wrapper.h"
#include "platform/console_log.h"
#include "platform/main_queue.h"
#include "platform/manual_loop.h"
#include "platform/system_log.h"
#include "store/metric_validator.h"

namespace probeview {
namespace {

using Lines = std::vector<std::string>;

// Only the main thread's lines are looked at: the service is away, so no event brings any other.
class CollectingSink final : public LineSink {
 public:
  void line(std::string_view text) override { lines.emplace_back(text); }
  Lines lines;
};

TEST(SharedStore, IsMadeOnceListensOnceAndIsWhatEveryPageReads) {
  static ManualLoop main;
  static CollectingSink console;
  static CollectingSink systemLog;
  setMainQueue(main, main);
  setConsoleLog(console);
  setSystemLog(systemLog);

  MetricValidator& store = MetricValidator::sharedValidator();
  EXPECT_EQ(store.mySharedRadixInstance(), &RadixWrapper::sharedInstance());
  EXPECT_EQ(RadixWrapper::sharedInstance().delegate().get(), &store);
  EXPECT_EQ(systemLog.lines, (Lines{"-[RadixWrapper listen]: listening for events"}));

  // A page that opens asks again, and finds what was stored while none was open.
  store.metricsDidUpdate(Dictionary{{"kKeyMetricID", std::int64_t{0x3C4E04}},
                                    {"kKeyPayload", Value::bytes(std::vector<std::uint8_t>{0x10, 0x03})}});
  EXPECT_EQ(&MetricValidator::sharedValidator(), &store);
  EXPECT_TRUE(MetricValidator::sharedValidator().myLTERRCStateDict().has_value());
  EXPECT_EQ(systemLog.lines.size(), 1u);
  EXPECT_EQ(console.lines.size(), 3u);

  EXPECT_FALSE(RadixWrapper::sharedInstance().removeTelemConfigForAppid("probeview"));
  ASSERT_EQ(systemLog.lines.size(), 2u);
  EXPECT_TRUE(systemLog.lines[1].starts_with("-[RadixWrapper removeTelemConfigForAppid:]: error="))
      << systemLog.lines[1];
  EXPECT_FALSE(RadixWrapper::sharedInstance().serviceStatus().connection.connected);
}

}  // namespace
}  // namespace probeview
