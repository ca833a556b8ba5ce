// SPDX-License-Identifier: Apache-2.0
#include <algorithm>
#include <array>
#include <set>
#include <string>

#include "messages/quantities.h"
#include "scenario/family_reports.h"
#include "scenario/selection.h"

namespace probeview::scenario {
namespace {

std::uint32_t bandwidthIndex(const Carrier& carrier) {
  return quantities::lteBandwidth.indexOf(bandwidthMegahertz(carrier)).value_or(0);
}

void fill(RsrpRsrqSinr& values, const Network& network, const LteSample& sample) {
  values.setPhyCellId(network.cells[sample.cell].physicalIdentity);
  values.setRsrp0(quantities::lteSampleRsrp.toSigned(sample.rsrp[0]));
  values.setRsrp1(quantities::lteSampleRsrp.toSigned(sample.rsrp[1]));
  values.setRsrq0(quantities::lteSampleRsrq.toSigned(sample.rsrq[0]));
  values.setRsrq1(quantities::lteSampleRsrq.toSigned(sample.rsrq[1]));
  values.setSinr0(quantities::lteSampleSinr.toSigned(sample.sinr[0]));
  values.setSinr1(quantities::lteSampleSinr.toSigned(sample.sinr[1]));
}

}  // namespace

void report(const Phone& phone, KCellularLteRrcState& message) {
  const LteState& lte = phone.lte();
  message.setState(lte.connection);
  if (lte.previous) {
    message.setPrevState(*lte.previous);
    message.setPrevStateDurMs(static_cast<std::uint32_t>(lte.previousDuration));
  }
  message.setCause(lte.cause);
}

void report(const Phone& phone, KCellularLteCdrxConfig& message) {
  const LteState& lte = phone.lte();
  message.setRrcState(lte.connection);
  message.setCdrxConfigStatus(lte.drxConfigured() ? 1 : 0);
  if (!lte.drxConfigured()) return;
  message.setOnDurationMs(LteDrx::onDuration);
  message.setDrxInactivityMs(LteDrx::inactivity);
  message.setDrxRetxTimerMs(LteDrx::retransmission);
  message.setLongDrxCycleMs(LteDrx::longCycle);
  message.setShortDrxCycleMs(LteDrx::shortCycle);
  message.setDrxShortCycleNum(LteDrx::shortCycles);
  message.setTransmissionMode(lte.transmissionMode);
}

void report(const Phone& phone, KCellularLteScellInfo& message) {
  const CellIndex serving = *phone.lte().serving;
  const Cell& cell = phone.network().cells[serving];
  const Carrier& carrier = phone.network().carrierOf(serving);
  message.setPhyCellId(cell.physicalIdentity);
  message.setDlFreq(carrier.channel);
  message.setUlFreq(carrier.channel + uplinkChannelOffset);
  message.setDlBw(quantities::lteServingDownlinkBandwidth.toUnsigned(bandwidthMegahertz(carrier)));
  message.setUlBw(quantities::lteServingUplinkBandwidth.toUnsigned(bandwidthMegahertz(carrier)));
  message.setCellId(cell.identity);
  message.setFreqBandInd(carrier.band);
  message.setTrackingAreaCode(cell.areaCode);
  message.setNumMncDigits(networkCodeDigits);
  message.setSelPlmnMcc(countryCode);
  message.setSelPlmnMnc(networkCode);
}

void report(const Phone& phone, KCellularLteSelReselCellInfo& message) {
  const Network& network = phone.network();
  const Carrier& serving = network.carrierOf(*phone.lte().serving);
  // Band 3 reaches into band 9, which phones of another region know the carrier by (3GPP TS 36.331, 6.3.1).
  if (serving.band == 3) message.addMultiBandInfo(9);
  message.setImsEmergencySupport(network.hasVoiceOverIms(*phone.lte().serving) ? 1 : 0);
  message.setAcBarringForEmergency(0);
  message.setQRxLevMin(quantities::lteQRxLevMin.toSigned(LteSelection::qRxLevMin));
  message.setQQualMin(LteSelection::qQualMin);
  message.setQHyst(LteSelection::hysteresis);
  message.setSNonIntraSearchP(quantities::lteLevelThreshold.toUnsigned(LteSelection::nonIntraSearchP));
  message.setSNonIntraSearchQ(LteSelection::nonIntraSearchQ);
  message.setSIntraSearchP(quantities::lteLevelThreshold.toUnsigned(LteSelection::intraSearchP));
  message.setSIntraSearchQ(LteSelection::intraSearchQ);
  message.setThreshServingLowP(quantities::lteLevelThreshold.toUnsigned(LteSelection::servingLowP));
  message.setPriorityOperatingFreq(serving.priority);
  std::set<std::uint32_t> listed{serving.channel};
  for (const Carrier& carrier : network.carriers) {
    if (carrier.technology != Technology::Lte || !listed.insert(carrier.channel).second) continue;
    NbrEutra& neighbour = message.addNbrEutra();
    neighbour.setEarfcn(carrier.channel);
    neighbour.setQRxlevMin(quantities::lteQRxLevMin.toSigned(LteSelection::qRxLevMin));
    neighbour.setQQualMin(LteSelection::qQualMin);
    neighbour.setQOffset(0);
    neighbour.setPmax(LteSelection::maximumPower);
    neighbour.setDlBw(bandwidthIndex(carrier));
    neighbour.setThresXHighP(quantities::lteLevelThreshold.toUnsigned(LteSelection::candidateHighP));
    neighbour.setThresXLowP(quantities::lteLevelThreshold.toUnsigned(LteSelection::candidateLowP));
    neighbour.setThresXHighQ(LteSelection::candidateHighQ);
    neighbour.setThresXLowQ(LteSelection::candidateLowQ);
    neighbour.setPriority(carrier.priority);
    neighbour.setFrameType(NbrEutra::FrameType::FDD);
    neighbour.setBand(carrier.band);
  }
}

void report(const Phone& phone, KCellularLteTxPower& message) {
  for (const TransmitPower& power : phone.lte().transmitPowers) {
    TxPowerInfo& info = message.addTxPowerInfo();
    if (power.control) info.setPucchTxPower(wholeDecibels(*power.control));
    if (power.shared) info.setPuschTxPower(wholeDecibels(*power.shared));
    info.setSubframeIndex(power.subframe);
  }
}

void report(const Phone& phone, KCellularLteRsrpRsrqSinr& message) {
  const std::vector<LteSample>& samples = phone.lte().samples;
  const auto count = static_cast<std::uint32_t>(samples.size());
  const auto period = static_cast<std::uint32_t>(stepTime);
  if (phone.traffic().activity() == Activity::Voice) {
    message.setCallId("call " + std::to_string(phone.traffic().calls()));
  }
  message.setLastYSamples(count);
  message.setSamplePeriodMs(period);
  message.setDurationMs(count * period);
  message.setNumSamples(count);
  LteSample average;
  for (const LteSample& sample : samples) {
    fill(message.addInstValues(), phone.network(), sample);
    average.cell = sample.cell;
    for (std::size_t antenna = 0; antenna < 2; ++antenna) {
      average.rsrp[antenna] += sample.rsrp[antenna] / count;
      average.rsrq[antenna] += sample.rsrq[antenna] / count;
      average.sinr[antenna] += sample.sinr[antenna] / count;
    }
  }
  if (samples.empty()) return;
  auto values = Shared<RsrpRsrqSinr>::make();
  fill(*values, phone.network(), average);
  message.setAvgValues(std::move(values));
}

void report(const Phone& phone, KCellularLteComponentCarrierInfo& message) {
  const Network& network = phone.network();
  const Carrier& primary = network.carrierOf(*phone.lte().serving);
  message.setPccEarfcn(primary.channel);
  message.setPccBandwidth(bandwidthIndex(primary));
  unsigned secondary = 0;
  for (const SecondaryCarrier& entry : phone.lte().secondaries) {
    if (entry.state == SecondaryState::SCC_STATE_DECONFIGURED) continue;
    const Carrier& carrier = network.carrierOf(entry.cell);
    if (secondary == 0) {
      message.setScc0Earfcn(carrier.channel);
      message.setScc0Bandwidth(bandwidthIndex(carrier));
    } else {
      message.setScc1Earfcn(carrier.channel);
      message.setScc1Bandwidth(bandwidthIndex(carrier));
    }
    ++secondary;
  }
}

void report(const Phone& phone, KCellularLteCarrierAggregationStatus& message) {
  const Network& network = phone.network();
  for (const SecondaryCarrier& entry : phone.lte().secondaries) {
    const Carrier& carrier = network.carrierOf(entry.cell);
    SecondaryComponentCarrier& listed = message.addSccList();
    listed.setIndex(entry.index);
    listed.setState(entry.state);
    listed.setPci(network.cells[entry.cell].physicalIdentity);
    listed.setDlEarfcn(carrier.channel);
    listed.setDlRfBand(carrier.band);
    listed.setDlBandwidth(bandwidthIndex(carrier));
    listed.setHasUplink(false);                                           // the phone sends on its primary carrier only
    if (entry.state == SecondaryState::SCC_STATE_DECONFIGURED) continue;  // and is not measured any more
    listed.setRsrp(quantities::lteCarrierRsrp.toSigned(entry.rsrp));
    listed.setRsrq(quantities::lteCarrierRsrq.toSigned(entry.rsrq));
    listed.setSnr(wholeDecibels(entry.sinr));
    listed.setRssi(quantities::lteCarrierRssi.toSigned(entry.rssi));
  }
}

void report(const Phone& phone, KCellularLteNbrEutraCellMeas& message) {
  const Network& network = phone.network();
  for (const CellMeasurement& measured : phone.lte().neighbours.lte) {
    EgwErrcNbrEutraMeas& neighbour = message.addMeasNbrEutra();
    neighbour.setNbrEarfcn(network.carrierOf(measured.cell).channel);
    neighbour.setNbrPhysCellId(network.cells[measured.cell].physicalIdentity);
    neighbour.setFreqBandInd(network.carrierOf(measured.cell).band);
    neighbour.setNbrRsrp(quantities::lteRsrp.toSigned(measured.strength));
    neighbour.setNbrRsrq(quantities::lteRsrq.toSigned(measured.quality));
  }
}

void report(const Phone& phone, KCellularLteNbrInterRatCellMeas& message) {
  const Network& network = phone.network();
  for (const CellMeasurement& measured : phone.lte().neighbours.umts) {
    EgwErrcNbrUtraMeas& neighbour = message.addMeasNbrUtra();
    neighbour.setUarfcn(network.carrierOf(measured.cell).channel);
    neighbour.setPsc(network.cells[measured.cell].physicalIdentity);
    neighbour.setRscp(quantities::utraRscp.toSigned(measured.strength));
    neighbour.setEcno(quantities::utraEcNo.toUnsigned(measured.quality));
  }
  for (const CellMeasurement& measured : phone.lte().neighbours.gsm) {
    EgwErrcNbrGeranMeas& neighbour = message.addMeasNbrGeran();
    neighbour.setArfcn(network.carrierOf(measured.cell).channel);
    neighbour.setBsic(network.cells[measured.cell].physicalIdentity);
    neighbour.setRxlev(quantities::gsmRxLev.toUnsigned(measured.strength));
  }
}

}  // namespace probeview::scenario
