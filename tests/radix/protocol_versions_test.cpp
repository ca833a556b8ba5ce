// SPDX-License-Identifier: Apache-2.0
#include "radix/protocol_versions.h"

#include <gtest/gtest.h>

namespace radix {
namespace {

// The same question from both sides.
bool talk(ProtocolVersions client, ProtocolVersions service) {
  const bool clientTalks = !versionTrouble({"client", client}, {"service", service});
  EXPECT_EQ(clientTalks, !versionTrouble({"service", service}, {"client", client})) << "both come to the same";
  return clientTalks;
}

TEST(ProtocolVersions, TwoSidesTalkWhenNeitherIsOlderThanTheOldestOfTheOther) {
  EXPECT_TRUE(talk({}, {}));
  EXPECT_TRUE(talk({.spoken = 1, .oldest = 1}, {.spoken = 9, .oldest = 1}));
  EXPECT_TRUE(talk({.spoken = 5, .oldest = 3}, {.spoken = 3, .oldest = 2}));
  EXPECT_TRUE(talk({.spoken = 3, .oldest = 3}, {.spoken = 5, .oldest = 3}));
  EXPECT_FALSE(talk({.spoken = 1, .oldest = 1}, {.spoken = 9, .oldest = 2}));
  EXPECT_FALSE(talk({.spoken = 5, .oldest = 3}, {.spoken = 2, .oldest = 1}));
}

TEST(ProtocolVersions, EachSideIsToldWhichOfThemToUpdate) {
  const ProtocolSide oldClient{"client", {.spoken = 1, .oldest = 1}};
  const ProtocolSide newService{"service", {.spoken = 9, .oldest = 2}};
  EXPECT_EQ(versionTrouble(oldClient, newService),
            "service speaks version 9 of the protocol and needs 2, this client speaks 1 and needs 1: "
            "update the client");
  EXPECT_EQ(versionTrouble(newService, oldClient),
            "client speaks version 1 of the protocol and needs 1, this service speaks 9 and needs 2: "
            "update the client");
  const ProtocolSide newClient{"client", {.spoken = 9, .oldest = 5}};
  const ProtocolSide oldService{"service", {.spoken = 4, .oldest = 3}};
  EXPECT_EQ(versionTrouble(newClient, oldService),
            "service speaks version 4 of the protocol and needs 3, this client speaks 9 and needs 5: "
            "update the service");
  EXPECT_EQ(versionTrouble(oldService, newClient),
            "client speaks version 9 of the protocol and needs 5, this service speaks 4 and needs 3: "
            "update the service");
}

}  // namespace
}  // namespace radix
