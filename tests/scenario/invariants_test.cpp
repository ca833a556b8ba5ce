// SPDX-License-Identifier: Apache-2.0
//
// What must hold at every moment of every drive, over all scenarios that tell of a phone ("edges" tells of none: it is
// there for what no phone would say) and ten seeds.
#include "tests/scenario/drive.h"
#include "tests/scenario/watches.h"

namespace probeview {
namespace {

using namespace std::chrono_literals;

// What the viewer asks for: measurements at periods, everything else on change.
MetricPlan viewersPlan() {
  MetricPlan plan;
  for (const std::int64_t id : toldMetrics()) plan.metrics[id] = std::nullopt;
  for (const std::int64_t id : {K_LTE_RSRP_RSRQ_SINR, K_LTE_TX_POWER, K_LTE_CA_STATUS, K_UMTS_SCELL_MEAS,
                                K_UMTS_TX_POWER, K_GSM_IDLE_SCELL_MEAS, K_GSM_CS_RF_MEAS}) {
    plan.metrics[id] = 1000ms;
  }
  for (const std::int64_t id : {K_LTE_INTRARAT_MEAS, K_LTE_INTERRAT_MEAS, K_UMTS_NCELL_MEAS, K_GSM_NCELL_MEAS}) {
    plan.metrics[id] = 2000ms;
  }
  return plan;
}

// All that can happen on the way, each of which happens: what is not listed here must not.
std::set<std::string> transitions() {
  return {
      "G>L",
      "G>U",
      "GSM > DEDICATED",
      "GSM > NON_DEDICATED",
      "GSM handover",
      "L>G",
      "L>U",
      "LTE ATTEMPTING > CONNECTED",
      "LTE ATTEMPTING > IDLE",
      "LTE COMING_INBOUND > CONNECTED",
      "LTE CONNECTED > ATTEMPTING",
      "LTE CONNECTED > ENDING",
      "LTE CONNECTED > GOING_OUTBOUND",
      "LTE CONNECTED > NULL",
      "LTE ENDING > IDLE",
      "LTE GOING_OUTBOUND > NULL",
      "LTE IDLE > ATTEMPTING",
      "LTE IDLE > NULL",
      "LTE NULL > COMING_INBOUND",
      "LTE NULL > IDLE",
      "LTE cell change in COMING_INBOUND",
      "LTE cell change in CONNECTED",
      "LTE cell change in IDLE",
      "LTE without service",
      "U>G",
      "U>L",
      "U>L after no service",
      "UMTS CELL_DCH > CELL_FACH",
      "UMTS CELL_DCH > INACTIVE",
      "UMTS CELL_DCH > RADIO_LINK_FAILURE",
      "UMTS CELL_DCH > RELEASE",
      "UMTS CELL_FACH > CELL_DCH",
      "UMTS CELL_FACH > CELL_PCH",
      "UMTS CELL_FACH > INACTIVE",
      "UMTS CELL_FACH > RADIO_LINK_FAILURE",
      "UMTS CELL_FACH > URA_PCH",
      "UMTS CELL_PCH > CELL_FACH",
      "UMTS CELL_PCH > INACTIVE",
      "UMTS CELL_PCH > RADIO_LINK_FAILURE",
      "UMTS CELL_PCH > RELEASE",
      "UMTS CELL_PCH > SCRI_SENT",
      "UMTS ESTABLISH > CELL_DCH",
      "UMTS ESTABLISH > CELL_FACH",
      "UMTS ESTABLISH > IDLE",
      "UMTS IDLE > ESTABLISH",
      "UMTS IDLE > INACTIVE",
      "UMTS INACTIVE > CELL_DCH",
      "UMTS INACTIVE > IDLE",
      "UMTS RADIO_LINK_FAILURE > IDLE",
      "UMTS RELEASE > IDLE",
      "UMTS SCRI_SENT > RELEASE",
      "UMTS URA_PCH > CELL_FACH",
      "UMTS URA_PCH > INACTIVE",
      "UMTS URA_PCH > RADIO_LINK_FAILURE",
      "UMTS URA_PCH > RELEASE",
      "UMTS URA_PCH > SCRI_SENT",
      "UMTS cell change",
      "UMTS measured in CELL_DCH",
      "UMTS measured in CELL_FACH",
      "UMTS measured in CELL_PCH",
      "UMTS measured in ESTABLISH",
      "UMTS measured in IDLE",
      "UMTS measured in INACTIVE",
      "UMTS measured in RADIO_LINK_FAILURE",
      "UMTS measured in RELEASE",
      "UMTS measured in SCRI_SENT",
      "UMTS measured in URA_PCH",
      "secondary activated in CONNECTED",
      "secondary deactivated in CONNECTED",
      "secondary deconfigured in ATTEMPTING",
      "secondary deconfigured in CONNECTED",
      "secondary deconfigured in ENDING",
      "secondary deconfigured in GOING_OUTBOUND",
      "secondary deconfigured in IDLE",
      "secondary deconfigured in NULL",
  };
}

void watch(Findings& findings, const std::string& arguments, double seconds, Listening how,
           const std::optional<MetricPlan>& plan) {
  findings.begin(arguments + (plan ? " as the viewer asks" : ""));
  Drive drive(arguments);
  drive.source->setPlan(plan);
  drive.listen();
  drive.forSeconds(seconds);
  PhoneWatch phone(findings, how);
  for (const MetricRecord& record : drive.records) phone.see(record);
}

TEST(Invariants, HoldInEveryScenarioForTenSeeds) {
#ifdef __SANITIZE_THREAD__
  GTEST_SKIP() << "all of it is one thread's; this sanitizer finds nothing here and takes minutes";
#endif
  Findings findings;
  for (int seed = 1; seed <= 10; ++seed) {
    const std::string option = ",seed=" + std::to_string(seed);
    // Three laps of the city, the highway almost to its end, twice about the building.
    watch(findings, "city" + option, 2100, {}, std::nullopt);
    watch(findings, "highway" + option, 1800, {}, std::nullopt);
    watch(findings, "indoor" + option, 900, {}, std::nullopt);
    watch(findings, "city" + option, 600, {.everyChange = false, .soak = false}, viewersPlan());
    // Everything each second of a quarter of an hour.
    watch(findings, "soak" + option + ",speed=20", 45, {.everyChange = false, .soak = true}, std::nullopt);
  }
  EXPECT_EQ(findings.broken(), "");
  EXPECT_EQ(findings.reached(), transitions());
}

}  // namespace
}  // namespace probeview
