// SPDX-License-Identifier: Apache-2.0
#include "messages/nas_messages.h"
#include "tests/scenario/drive.h"
#include "tests/scenario/watches.h"

namespace probeview {
namespace {

// 3GPP TS 23.003, 2.4: the visitor location register leaves identities with both top bits set to the serving GPRS
// support node; all ones are no identity.
constexpr std::uint32_t topBits = 0xC0000000, noIdentity = 0xFFFFFFFF;

bool isTmsi(std::uint32_t identity) { return (identity & topBits) != topBits; }
bool isPacketTmsi(std::uint32_t identity) { return (identity & topBits) == topBits && identity != noIdentity; }

std::uint32_t firstFour(std::span<const std::uint8_t> bytes) {
  return std::uint32_t{bytes[0]} << 24 | std::uint32_t{bytes[1]} << 16 | std::uint32_t{bytes[2]} << 8 | bytes[3];
}

}  // namespace

void MobilityWatch::see(const MetricRecord& record) {
  switch (record.metricId) {
    case K_CELLULAR_MM_CTXT: {
      const auto message = decoded<KCellularMmContext>(record);
      lostService_ = message.regStatus() == KCellularMmContext::RegStatus::KREG_STATUS_NO_SERVICE;
      if (message.hasTmsi()) findings_.expect(Rule::TmsiIsTheVisitorRegisters, isTmsi(message.tmsi()));
      if (message.hasLai()) findings_.expectBetween(Rule::MobilityRanges, message.lai()->lac(), 1, 0xFFFD);
      return;
    }
    case K_CELLULAR_GMM_CTXT: {
      const auto message = decoded<KCellularGmmContext>(record);
      if (message.hasPTmsi()) findings_.expect(Rule::PacketTmsiIsTheServingNodes, isPacketTmsi(message.pTmsi()));
      if (message.hasRai()) findings_.expectBetween(Rule::MobilityRanges, message.rai()->rac(), 0, 255);
      return;
    }
    case K_LTE_EMM_CTXT: {
      const auto message = decoded<KCellularEmmContext>(record);
      if (message.hasGuti()) {
        findings_.expectBetween(Rule::MobilityRanges, message.guti()->mmec(), 0, 255);
        findings_.expectBetween(Rule::MobilityRanges, message.guti()->mmegi(), 0, 0xFFFF);
      }
      for (const KCellularTrackingAreaId& area : message.taiLists()) {
        findings_.expectBetween(Rule::MobilityRanges, area.tac(), 1, 0xFFFD);
      }
      return;
    }
    case K_CELLULAR_ACTIVE_BEARER: {
      const auto message = decoded<KCellularActivatedBearerContexts>(record);
      std::set<std::uint32_t> accessPoints;
      for (const BearerContext& bearer : message.bearerContexts()) {
        findings_.expect(Rule::BearersAreDistinct, accessPoints.insert(bearer.nsapi()).second);
        findings_.expectBetween(Rule::MobilityRanges, bearer.nsapi(), 5, 15);
      }
      return;
    }
    case K_SIM_FILE_INFO:
      return seeFiles(record);
    default:
      return;
  }
}

void MobilityWatch::seeFiles(const MetricRecord& record) {
  constexpr std::uint32_t locationFile = 0x6F7E, packetLocationFile = 0x6F73;  // 3GPP TS 31.102, 4.2.17 and 4.2.23
  const auto message = decoded<KCellularSimCardFiles>(record);
  for (const ElementaryFile& file : message.efLists()) {
    const auto content = file.content();
    const std::uint32_t identity = content.size() < 4 ? noIdentity : firstFour(content);
    if (identity == noIdentity) continue;
    if (file.efId() == locationFile) findings_.expect(Rule::TmsiIsTheVisitorRegisters, isTmsi(identity));
    if (file.efId() == packetLocationFile) findings_.expect(Rule::PacketTmsiIsTheServingNodes, isPacketTmsi(identity));
  }
}

}  // namespace probeview
