// SPDX-License-Identifier: Apache-2.0
#include "app/app_id_validator.h"

#include <gtest/gtest.h>

namespace probeview {
namespace {

TEST(AppIdValidation, TheTextTwoIsRefusedAndLeavesTheIdentifierAbsent) {
  AppIDValidator validator;
  EXPECT_FALSE(validator.validate({{"kKeyAppID", Value::text("2")}}));
  EXPECT_EQ(validator.appID(), std::nullopt);
}

TEST(AppIdValidation, TheIntegerTwoIsAcceptedAndKept) {
  AppIDValidator validator;
  EXPECT_TRUE(validator.validate({{"kKeyAppID", Value(std::int64_t{2})}}));
  EXPECT_EQ(validator.appID(), 2);
}

TEST(AppIdValidation, AnotherIntegerIsRefusedAndKept) {
  AppIDValidator validator;
  EXPECT_FALSE(validator.validate({{"kKeyAppID", Value(std::int64_t{3})}}));
  EXPECT_EQ(validator.appID(), 3);
}

TEST(AppIdValidation, AnEventWithoutIdentifierForgetsTheOneBefore) {
  AppIDValidator validator;
  validator.validate({{"kKeyAppID", Value(std::int64_t{2})}});
  EXPECT_FALSE(validator.validate({{"kKeyMetricID", Value(std::int64_t{2})}}));
  EXPECT_EQ(validator.appID(), std::nullopt);
}

TEST(AppIdValidation, TheComparisonIsWithTwoWhateverThePropertyHolds) {
  AppIDValidator validator;
  EXPECT_EQ(validator.myAppID, 2);
  validator.myAppID = 5;
  EXPECT_FALSE(validator.validate({{"kKeyAppID", Value(std::int64_t{5})}}));
  EXPECT_TRUE(validator.validate({{"kKeyAppID", Value(std::int64_t{2})}}));
}

TEST(AppIdValidation, TheKeyLookedUpIsTheProperty) {
  AppIDValidator validator;
  EXPECT_EQ(validator.appIDKey, "kKeyAppID");
  validator.appIDKey = "other";
  EXPECT_TRUE(validator.validate({{"other", Value(std::int64_t{2})}}));
}

TEST(AppIdValidation, ASubclassThatOverridesTheIdentifierIsAskedForTheValueThatIsCompared) {
  class AlwaysTwo final : public AppIDValidator {
   public:
    std::optional<std::int64_t> appID() const override { return 2; }
  };
  EXPECT_TRUE(AlwaysTwo().validate({{"kKeyAppID", Value(std::int64_t{7})}}));
}

}  // namespace
}  // namespace probeview
