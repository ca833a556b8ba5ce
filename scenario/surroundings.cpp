// SPDX-License-Identifier: Apache-2.0
#include "scenario/surroundings.h"

#include <algorithm>

#include "scenario/decibel.h"

namespace probeview::scenario {
namespace {

constexpr double notHeard = -200;
// What a layer 1 measurement still wavers by, after averaging over its period (3GPP TS 36.133, 9.1.2 allows more).
constexpr double measurementDeviation = 0.7;

// Thermal noise and a receiver's noise figure of 7 dB, in mW: per resource element (15 kHz), in a UTRA carrier
// (3.84 MHz) and in a GSM channel (200 kHz).
constexpr double noisePerElement = 2.99e-13;
constexpr double noiseUmts = 7.66e-11;
constexpr double noiseGsm = 3.99e-12;

// Of the twelve resource elements of a block, in a symbol that carries reference signals.
constexpr double referenceElements = 2;
constexpr double dataElements = 10;

// How much more a UTRA cell radiates than its pilot, which has a tenth of the full power.
double powerOverPilot(double load) { return 1.0 + 9.0 * load; }

}  // namespace

Surroundings::Surroundings(const Network& network, std::uint64_t seed)
    : network_(network),
      propagation_(network, seed),
      fading_(seed, 1),
      instant_(network.cells.size(), notHeard),
      filtered_(network.cells.size(), notHeard),
      milliwatts_(network.cells.size(), 0),
      total_(network.carriers.size(), 0),
      interferers_(network.carriers.size(), 0),
      cells_(technologyCount) {
  for (CellIndex cell = 0; cell < network.cells.size(); ++cell) {
    cells_[static_cast<std::size_t>(network.technologyOf(cell))].push_back(cell);
  }
}

void Surroundings::measure(Technology technology, Point where, double weight) {
  propagation_.receive(technology, where, instant_);
  for (const CellIndex cell : cells_[static_cast<std::size_t>(technology)]) {
    instant_[cell] += measurementDeviation * fading_.normal();
    milliwatts_[cell] = fromDecibels(instant_[cell]);
    double& level = filtered_[cell];
    level = level <= notHeard ? instant_[cell] : level + weight * (instant_[cell] - level);
  }
  sumCarriers(technology);
  rank(technology);
}

void Surroundings::sumCarriers(Technology technology) {
  for (CarrierIndex carrier = 0; carrier < network_.carriers.size(); ++carrier) {
    if (network_.carriers[carrier].technology != technology) continue;
    switch (technology) {
      case Technology::Lte:
        total_[carrier] = (referenceElements + dataElements) * noisePerElement;
        interferers_[carrier] = noisePerElement;
        break;
      case Technology::Umts:
        total_[carrier] = interferers_[carrier] = noiseUmts;
        break;
      case Technology::Gsm:
        total_[carrier] = interferers_[carrier] = noiseGsm;
        break;
    }
  }
  for (const CellIndex index : cells_[static_cast<std::size_t>(technology)]) {
    const Cell& cell = network_.cells[index];
    const double power = milliwatts_[index];
    switch (technology) {
      case Technology::Lte:
        total_[cell.carrier] += power * (referenceElements + dataElements * cell.load);
        interferers_[cell.carrier] += power * cell.load;
        break;
      case Technology::Umts:
        total_[cell.carrier] += power * powerOverPilot(cell.load);
        interferers_[cell.carrier] += power * powerOverPilot(cell.load);
        break;
      case Technology::Gsm:
        total_[cell.carrier] += power;
        interferers_[cell.carrier] += power * cell.load;
        break;
    }
  }
}

void Surroundings::rank(Technology technology) {
  // Searchers find a cell down to about these levels (3GPP TS 36.133, 8.1.2; 25.133, 8.1.2; 45.008, 6.6).
  double weakest = 0, worst = 0;
  switch (technology) {
    case Technology::Lte:
      weakest = -125, worst = -10;
      break;
    case Technology::Umts:
      weakest = -117, worst = -23;
      break;
    case Technology::Gsm:
      weakest = -109, worst = -2;
      break;
  }
  std::vector<CellIndex>& heard = heard_[static_cast<std::size_t>(technology)];
  heard.clear();
  for (const CellIndex cell : cells_[static_cast<std::size_t>(technology)]) {
    if (filtered_[cell] < weakest) continue;
    if ((technology == Technology::Umts ? quality(cell) : interferenceRatio(cell)) < worst) continue;
    heard.push_back(cell);
  }
  constexpr std::size_t mostHeard = 24;
  const std::size_t kept = std::min(heard.size(), mostHeard);
  // Equal levels are told apart by the index, so that the order is the same everywhere.
  std::partial_sort(
      heard.begin(), heard.begin() + static_cast<std::ptrdiff_t>(kept), heard.end(),
      [this](CellIndex a, CellIndex b) { return filtered_[a] != filtered_[b] ? filtered_[a] > filtered_[b] : a < b; });
  heard.resize(kept);
}

double Surroundings::strength(CellIndex cell) const {
  switch (network_.technologyOf(cell)) {
    case Technology::Lte:
      return std::clamp(filtered_[cell], weakestRsrp, strongestRsrp);
    case Technology::Umts:
      return std::clamp(filtered_[cell], weakestRscp, strongestRscp);
    case Technology::Gsm:
      return std::clamp(filtered_[cell], weakestRxLev, strongestRxLev);
  }
  return filtered_[cell];
}

double Surroundings::quality(CellIndex cell) const {
  const double ratio = instant_[cell] - toDecibels(total_[network_.cells[cell].carrier]);
  switch (network_.technologyOf(cell)) {
    case Technology::Lte:
      return std::clamp(ratio, worstRsrq, bestRsrq);
    case Technology::Umts:
      return std::clamp(ratio, worstEcNo, bestEcNo);
    case Technology::Gsm:
      return 0;
  }
  return 0;
}

double Surroundings::interferenceRatio(CellIndex cell) const {
  const double all = interferers_[network_.cells[cell].carrier];
  const double own = milliwatts_[cell];
  switch (network_.technologyOf(cell)) {
    case Technology::Lte:
      return std::clamp(toDecibels(own / (all - own * network_.cells[cell].load)), worstSinr, bestSinr);
    case Technology::Umts: {
      // A spreading factor of 256 lifts the pilot out of the noise by 24 dB.
      constexpr double despreading = 24;
      return std::clamp(quality(cell) + despreading, worstSinr, bestSinr);
    }
    case Technology::Gsm:
      return std::clamp(toDecibels(own / (all - own * network_.cells[cell].load)), worstSinr, 40.0);
  }
  return 0;
}

double Surroundings::carrierPower(CellIndex cell) const {
  const Carrier& carrier = network_.carrierOf(cell);
  const double power = toDecibels(total_[network_.cells[cell].carrier]);
  return carrier.technology == Technology::Lte ? power + toDecibels(carrier.resourceBlocks) : power;
}

}  // namespace probeview::scenario
