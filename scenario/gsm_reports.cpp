// SPDX-License-Identifier: Apache-2.0
#include <algorithm>

#include "messages/quantities.h"
#include "scenario/family_reports.h"
#include "scenario/selection.h"

namespace probeview::scenario {
namespace {

constexpr double radioLinkTimeout = 20;  // SACCH blocks
constexpr double periodicUpdateHours = 1;
constexpr double retransmissions = 4;

using Band = KCellularWcdmaCellInfo::WcdmaBand;

// Of the two bands in which the made-up networks have GSM.
Band::Value gsmBandOf(const Carrier& carrier) {
  return carrier.band == 1800 ? Band::SYS_BAND_GSM_DCS_1800 : Band::SYS_BAND_GSM_PGSM_900;
}

// The same for messages that hold the band as a plain number.
std::uint32_t gsmBandNumberOf(const Carrier& carrier) { return static_cast<std::uint32_t>(gsmBandOf(carrier)); }

// The power control level of the largest power in the band (3GPP TS 45.005, 4.1.1).
std::uint32_t largestPowerLevel(const Carrier& carrier) { return carrier.band == 1800 ? 0 : 5; }

}  // namespace

void report(const Phone& phone, KCellularGsmScellInfo& message) {
  if (phone.gsm().connection == GsmConnection::Inactive) {
    // The cell that was left serves no more.
    message.setState(KCellularGsmScellInfo::State::NON_DEDICATED_STATE);
    return;
  }
  const CellIndex serving = *phone.gsm().serving;
  const Cell& cell = phone.network().cells[serving];
  const Carrier& carrier = phone.network().carrierOf(serving);
  message.setMcc(countryCode);
  message.setMnc(networkCode);
  message.setLac(cell.areaCode);
  message.setCellId(cell.identity);
  message.setGsmBand(gsmBandOf(carrier));
  message.setArfcn(carrier.channel);
  message.setBsic(cell.physicalIdentity);
  message.setState(phone.gsm().connection == GsmConnection::Dedicated
                       ? KCellularGsmScellInfo::State::DEDICATED_STATE
                       : KCellularGsmScellInfo::State::NON_DEDICATED_STATE);
  message.setNumMncDigits(networkCodeDigits);
}

// What system information 3 and 4 say (3GPP TS 44.018, 9.1.35 and 10.5.2).
void report(const Phone& phone, KCellularGsmIdleConfig& message) {
  const CellIndex serving = *phone.gsm().serving;
  const Cell& cell = phone.network().cells[serving];
  const Carrier& carrier = phone.network().carrierOf(serving);
  message.setArfcnBcch(carrier.channel);
  message.setMcc(countryCode);
  message.setMnc(networkCode);
  message.setLac(cell.areaCode);
  message.setCi(cell.identity);
  message.setBsic(cell.physicalIdentity);
  message.setDtxFromBs(1);  // the phone shall use discontinuous transmission
  message.setRadioLinkTimeout(quantities::gsmRadioLinkTimeout.toUnsigned(radioLinkTimeout));
  message.setMultibRep(2);  // neighbours of the other band to report
  message.setGsmBand(gsmBandNumberOf(carrier));
  message.setMsTxpwr(largestPowerLevel(carrier));
  message.setRxAccMin(quantities::gsmRxLev.toUnsigned(GsmSelection::rxLevAccessMin));
  message.setCbq(0);
  message.setCba(0);
  message.setC2Valid(1);
  message.setTmpOffset(0);
  message.setPenaltyT(0);
  message.setT3212(quantities::gsmPeriodicUpdate.toUnsigned(periodicUpdateHours));
  message.setAcc(0);  // no access class is barred
  message.setBsPaMfrms(4);
  message.setCsPagemode(0);
  if (const auto index = quantities::gsmMaximumRetransmissions.indexOf(retransmissions))
    message.setMaxRetransCs(*index);
  message.setEmergCallAllowed(1);
  message.setAttachAllowed(1);
  message.setHalfRateSupported(1);
  message.setSi78Broadcast(0);
  message.setCbchSupported(0);
  message.setReestAllowed(1);
  message.setEcsc(1);  // the phone reports its classmark early
  message.setSi2TerNeeded(0);
}

void report(const Phone& phone, KCellularGsmIdleScellMeasurement& message) {
  const GsmState& gsm = phone.gsm();
  message.setScellArfcn(phone.network().carrierOf(*gsm.serving).channel);
  message.setCurrentAntenna(gsm.antenna);
  message.setIdleRxlevDBm(quantities::gsmIdleLevel.toSigned(gsm.rxLev));
}

void report(const Phone& phone, KCellularGsmCsRfMeasurement& message) {
  const GsmState& gsm = phone.gsm();
  const Carrier& carrier = phone.network().carrierOf(*gsm.dedicatedCell);
  message.setScellArfcn(carrier.channel);
  message.setCurrentAntenna(gsm.antenna);
  for (const int power : gsm.transmitPowers) message.addCsTxPwr(power);
  message.setCsRxlevSub(quantities::gsmRxLev.toUnsigned(gsm.dedicatedRxLev));
  message.setCsRxqualSub(gsm.rxQual);
  message.setScellBand(gsmBandNumberOf(carrier));
}

void report(const Phone& phone, KCellularGsmGrrEventMeasCr& message) {
  const Network& network = phone.network();
  for (const CellMeasurement& measured : phone.gsm().neighbours.gsm) {
    const Cell& cell = network.cells[measured.cell];
    GsmNcellMeas& neighbour = message.addGsmNcellMeas();
    neighbour.setMcc(countryCode);
    neighbour.setMnc(networkCode);
    neighbour.setLac(cell.areaCode);
    neighbour.setCi(cell.identity);
    neighbour.setBsic(cell.physicalIdentity);
    neighbour.setArfcn(network.carrierOf(measured.cell).channel);
    neighbour.setRxlev(quantities::gsmRxLev.toUnsigned(measured.strength));
  }
  for (const CellMeasurement& measured : phone.gsm().neighbours.umts) {
    UmtsNcellMeas& neighbour = message.addUmtsNcellMeas();
    neighbour.setCpichSc(network.cells[measured.cell].physicalIdentity);
    neighbour.setDlUarfcn(network.carrierOf(measured.cell).channel);
    neighbour.setCpichRscp(quantities::utraRscp.toUnsigned(measured.strength));
    neighbour.setCpichEcn0(quantities::utraEcNo.toUnsigned(measured.quality));
  }
  for (const CellMeasurement& measured : phone.gsm().neighbours.lte) {
    const Carrier& carrier = network.carrierOf(measured.cell);
    LteNcellMeas& neighbour = message.addLteNcellMeas();
    neighbour.setPhysicalCellId(network.cells[measured.cell].physicalIdentity);
    if (const auto index = quantities::lteBandwidth.indexOf(bandwidthMegahertz(carrier)))
      neighbour.setBandwidth(*index);
    neighbour.setRsrp(quantities::lteRsrp.toUnsigned(measured.strength));
    neighbour.setEarfcn(carrier.channel);
    neighbour.setRsrq(quantities::lteRsrq.toUnsigned(measured.quality));
  }
}

// What system information 13 says (3GPP TS 44.018, 10.5.2.37b; 44.060, 12.24), and that the cell is not barred
// (44.060, 11.2.20).
void report(const Phone& phone, KCellularGsmGprsConfig& message) {
  const Cell& cell = phone.network().cells[*phone.gsm().serving];
  message.setGprsSup(true);
  message.setRac(cell.routingAreaCode);
  message.setSpPgCy(true);
  message.setNco(0);  // the phone chooses its cells itself
  message.setNom(2);  // circuit and packet services page apart
  message.setCrHyst(quantities::gsmReselectHysteresis.toUnsigned(GsmSelection::reselectHysteresis));
  message.setAccThr(6);
  message.setExtUplTbfSupported(true);
  message.setPriorityClass(0);
  message.setCellBarAccess2(0);
}

}  // namespace probeview::scenario
