// SPDX-License-Identifier: Apache-2.0
#include <set>

#include "messages/quantities.h"
#include "scenario/family_reports.h"
#include "scenario/selection.h"

namespace probeview::scenario {
namespace {

using Band = KCellularWcdmaCellInfo::WcdmaBand;

// Of the two bands in which the made-up networks have UTRA.
Band::Value utraBandOf(const Carrier& carrier) {
  return carrier.band == 8 ? Band::SYS_BAND_WCDMA_VIII_900 : Band::SYS_BAND_WCDMA_I_IMT_2000;
}

}  // namespace

void report(const Phone& phone, KCellularWcdmaRrcConnectionState& message) {
  const UmtsState& umts = phone.umts();
  message.setState(umts.connection);
  if (umts.establishment) message.setEstablishmentCause(*umts.establishment);
  if (umts.release) message.setReleaseCause(*umts.release);
}

void report(const Phone& phone, KCellularWcdmaRrcConfiguration& message) {
  const UmtsState& umts = phone.umts();
  if (umts.drxCycle) message.setDrxCycleLengthMs(*umts.drxCycle);
  message.setIsMimoConfigured(false);
  message.setIsDcConfigured(umts.dualCarrier);
}

void report(const Phone& phone, KCellularWcdmaCellInfo& message) {
  const CellIndex serving = *phone.umts().serving;
  const Cell& cell = phone.network().cells[serving];
  const Carrier& carrier = phone.network().carrierOf(serving);
  message.setMcc(countryCode);
  message.setMnc(networkCode);
  message.setLac(cell.areaCode);
  message.setCellId(cell.identity);
  message.setWcdmaBand(utraBandOf(carrier));
  message.setDlUarfcn(carrier.channel);
  message.setPsc(cell.physicalIdentity);
  message.setNumMncDigits(networkCodeDigits);
  // The older carrier was never fitted for fast uplink.
  message.setHspa(carrier.band == 8 ? KCellularWcdmaCellInfo::Hspa::SYS_HS_IND_HSDPA_SUPP_CELL
                                    : KCellularWcdmaCellInfo::Hspa::SYS_HS_IND_HSDPA_HSUPA_SUPP_CELL);
}

void report(const Phone& phone, KCellularWcdmaScellMeasurement& message) {
  const UmtsState& umts = phone.umts();
  message.setConnectedMode(umts.measuredConnected);
  for (const double power : umts.antennaPower) {
    // RSRP and RSRQ are of E-UTRA; what UTRA has in their place has no field here.
    RxInfo& info = message.addRxInfo();
    info.setRssi(wholeDecibels(power));
    info.setSnr(wholeDecibels(umts.pilotRatio));
  }
}

void report(const Phone& phone, KCellularWcdmaTxPower& message) {
  for (const TransmitPower& power : phone.umts().transmitPowers) {
    // UTRA has one uplink power; its place is that of the shared channel.
    TxPowerInfo& info = message.addTxPowerInfo();
    if (power.shared) info.setPuschTxPower(wholeDecibels(*power.shared));
    info.setSubframeIndex(power.subframe);
  }
}

void report(const Phone& phone, KCellularWcdmaSelReselCellInfo& message) {
  const UmtsState& umts = phone.umts();
  const Network& network = phone.network();
  const Carrier& serving = network.carrierOf(*umts.serving);
  message.setHsdpaCapable(1);
  message.setEdchCapable(serving.band == 8 ? 0 : 1);
  message.setDuplexMode(KCellularWcdmaSelReselCellInfo::DuplexMode::FDD);
  message.setCellBarred(0);
  message.setFachMeasOccInfoPresent(1);
  message.setSRxlev(wholeDecibels(umts.rscp - UmtsSelection::qRxLevMin));
  message.setSQual(wholeDecibels(umts.ecNo - UmtsSelection::qQualMin));
  message.setSIntrasearch(UmtsSelection::intraSearch);
  message.setSIntersearch(UmtsSelection::interSearch);
  message.setSSearchRat(UmtsSelection::searchRat);
  message.setSCellPrio(serving.priority);
  std::set<std::pair<Technology, std::uint32_t>> listed;
  for (const Carrier& carrier : network.carriers) {
    if (!listed.insert({carrier.technology, carrier.channel}).second) continue;
    switch (carrier.technology) {
      case Technology::Lte: {
        EutraFreqInfo& info = message.addEutraPrioInfo();
        info.setEarfcn(carrier.channel);
        info.setPrio(carrier.priority);
        break;
      }
      case Technology::Umts: {
        UtraFreqInfo& info = message.addUtraPrioInfo();
        info.setUarfcn(carrier.channel);
        info.setPrio(carrier.priority);
        break;
      }
      case Technology::Gsm: {
        GsmFreqInfo& info = message.addGsmPrioInfo();
        info.setArfcn(carrier.channel);
        info.setPrio(carrier.priority);
        break;
      }
    }
  }
}

void report(const Phone& phone, KCellularWcdmaNbrCellMeas& message) {
  const Network& network = phone.network();
  for (const CellMeasurement& measured : phone.umts().neighbours.umts) {
    UtraCellMeasResult& result = message.addMeasUtraResult();
    result.setUarfcn(network.carrierOf(measured.cell).channel);
    result.setBand(network.carrierOf(measured.cell).band);
    result.setPsc(network.cells[measured.cell].physicalIdentity);
    result.setEcno(quantities::utraEcNo.toUnsigned(measured.quality));
    result.setRscp(quantities::utraRscp.toSigned(measured.strength));
  }
  for (const CellMeasurement& measured : phone.umts().neighbours.gsm) {
    GsmCellMeasResult& result = message.addMeasGsmResult();
    result.setArfcn(network.carrierOf(measured.cell).channel);
    result.setBsic(network.cells[measured.cell].physicalIdentity);
    result.setRxlev(quantities::gsmRxLev.toUnsigned(measured.strength));
  }
  for (const CellMeasurement& measured : phone.umts().neighbours.lte) {
    LteCellMeasResult& result = message.addMeasLteResult();
    result.setEarfcn(network.carrierOf(measured.cell).channel);
    result.setPhyCellId(network.cells[measured.cell].physicalIdentity);
    result.setEutraBand(network.carrierOf(measured.cell).band);
    result.setRsrp(quantities::lteRsrp.toSigned(measured.strength));
    result.setRsrq(quantities::lteRsrq.toSigned(measured.quality));
  }
}

}  // namespace probeview::scenario
