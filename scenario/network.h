// SPDX-License-Identifier: Apache-2.0
//
// A made-up network: sites with sectors on a plane, on carriers of three technologies. All of it is in the test PLMN
// 001/01 (ITU-T E.212, annex A), so that nothing here can be taken for a network that exists.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "scenario/plane.h"

namespace probeview::scenario {

enum class Technology : std::uint8_t { Gsm, Umts, Lte };
constexpr std::size_t technologyCount = 3;

constexpr std::uint32_t countryCode = 1;  // 001
constexpr std::uint32_t networkCode = 1;  // 01
constexpr std::uint32_t networkCodeDigits = 2;

// A carrier frequency, and what its cells broadcast about it.
struct Carrier {
  Technology technology = Technology::Lte;
  std::uint32_t channel = 0;  // downlink EARFCN (3GPP TS 36.101, 5.7.3), UARFCN (25.101, 5.4) or ARFCN (45.005, 2)
  std::uint32_t band = 0;     // the band's number: 3 for E-UTRA band 3, 8 for UTRA band VIII, 900 or 1800 for GSM
  double megahertz = 0;       // downlink
  double referenceDbm = 0;    // radiated towards the main lobe, per reference resource element, CPICH or BCCH
  std::uint32_t resourceBlocks = 0;  // E-UTRA only: 6 to 100
  std::uint32_t priority = 0;        // cell reselection priority, 0 to 7 (3GPP TS 36.304, 5.2.4.1)
};

// The offset between an E-UTRA FDD carrier's downlink and uplink channel numbers (3GPP TS 36.101, table 5.7.3-1).
constexpr std::uint32_t uplinkChannelOffset = 18000;

// Whole megahertz; the scenarios use 5, 10 and 20 MHz carriers.
std::uint32_t bandwidthMegahertz(const Carrier& carrier);

using CellIndex = std::uint32_t;
using CarrierIndex = std::uint32_t;

struct Cell {
  std::uint32_t site = 0;
  CarrierIndex carrier = 0;
  Point facing;                        // a unit vector; none for a cell that radiates all around
  std::uint32_t physicalIdentity = 0;  // PCI 0 to 503, primary scrambling code 0 to 511, or BSIC 0 to 63
  std::uint32_t identity = 0;          // 28 bits (E-UTRA: eNB and cell; UTRA: RNC and cell), 16 bits for GSM
  std::uint32_t areaCode = 0;          // tracking area code, or location area code
  std::uint32_t routingAreaCode = 0;   // 0 to 255; GSM and UMTS
  double powerOffset = 0;              // dB that it radiates more than its carrier's reference; small cells less
  double load = 0.5;                   // how much of the carrier is in use, 0 to 1
};

struct Site {
  Point place;
  std::uint32_t enclosure = 0;  // the number of the enclosure in which it stands, counted from 1; 0 is the open
};

// A part of the plane that is cut off from the rest: a tunnel, a ravine, a basement. What crosses its edge is weakened.
struct Enclosure {
  Point centre;
  double radius = 0;  // metres
  double edge = 1;    // the width in metres over which the loss sets in, inwards
  double lossDecibels = 0;
};

// Loss in decibels = constant + slope * log10(kilometres) + 21 * log10(megahertz), the macro cell models of
// 3GPP TR 36.942, 4.5.2 and 4.5.3, and what walls or a car's body add.
struct PathLoss {
  double constant = 58.83;
  double slope = 37.6;
  double bodyLoss = 0;
  double shadowDeviation = 6;
};

struct Network {
  PathLoss pathLoss;
  std::vector<Carrier> carriers;
  std::vector<Site> sites;
  std::vector<Cell> cells;  // those of one site stand together, in the order of the sites
  std::vector<Enclosure> enclosures;
  std::optional<std::uint32_t> forbiddenAreaCode;  // an area that refuses this phone (3GPP TS 24.008, annex G)
  std::vector<std::uint32_t> voiceAreaCodes;       // tracking areas with voice over IMS

  // What the cell's reference signal is radiated with, in dBm.
  double referenceDbm(CellIndex cell) const { return carrierOf(cell).referenceDbm + cells[cell].powerOffset; }
  bool hasVoiceOverIms(CellIndex cell) const {
    return std::find(voiceAreaCodes.begin(), voiceAreaCodes.end(), cells[cell].areaCode) != voiceAreaCodes.end();
  }
  const Carrier& carrierOf(CellIndex cell) const { return carriers[cells[cell].carrier]; }
  Technology technologyOf(CellIndex cell) const { return carrierOf(cell).technology; }
};

// What a site is to have.
struct SitePlan {
  Point place;
  std::vector<CarrierIndex> carriers;
  unsigned sectors = 3;    // 1: radiates all around
  double turnDegrees = 0;  // how far the first sector is turned from north, a multiple of 30
  std::uint32_t enclosure = 0;
  double powerOffset = 0;
  std::uint32_t area = 0;  // sites with the same number share tracking, location and routing area
};

// Numbers the cells of a planned network: physical identities that neighbours do not share, cell and area codes.
class NetworkBuilder {
 public:
  explicit NetworkBuilder(std::uint64_t seed) : seed_(seed) {}

  CarrierIndex add(Carrier carrier);
  std::uint32_t add(Enclosure enclosure);  // its number
  void add(const SitePlan& plan);
  Network& network() { return network_; }

 private:
  std::uint64_t seed_;
  Network network_;
};

// The location area code, which is the tracking area code as well, of the area with this number.
std::uint32_t areaCodeOf(std::uint32_t area);

}  // namespace probeview::scenario
