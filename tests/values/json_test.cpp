// SPDX-License-Identifier: Apache-2.0
#include "values/json.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <limits>

#include "tests/values/support.h"
#include "values/dictionary.h"
#include "values/value.h"

namespace probeview {
namespace {

TEST(Json, KeepsIntegersBytesAndTextsThatAreNotUtf8) {
  const Dictionary dictionary{{"u", std::numeric_limits<std::uint64_t>::max()},
                              {"r", 10.0},
                              {"f", 1.4f},
                              {"b", true},
                              {"y", bytesOf({0x62, 0xf2, 0x10})},
                              {"t", Value::text("\xC3(")},
                              {"l", List{std::int32_t{-1}, Value::text("q\"\n\x01")}}};
  EXPECT_EQ(json(dictionary),
            R"({"u":18446744073709551615,"r":10.0,"f":1.4,"b":true,"y":{"bytes":"62f210"},"t":{"text":"c328"},)"
            R"("l":[-1,"q\"\n\u0001"]})");
}

}  // namespace
}  // namespace probeview
