// SPDX-License-Identifier: Apache-2.0
#include "scenario/registration.h"

#include <algorithm>

namespace probeview::scenario {
namespace {

// Now and then a network is too busy or broken; the phone tries again after T3411, T3311 or T3211.
constexpr double kRefusals = 0.06;
constexpr Milliseconds kRetryAfter = 10000;
constexpr std::uint32_t kPeriodicLocation = 3600, kPeriodicRouting = 3240, kPeriodicTracking = 1200;  // s
constexpr std::uint32_t kGroupIdentity = 0x8001;
constexpr std::uint32_t kEquivalentNetwork = 2;  // 001/02, a test network as well

bool contains(const std::vector<std::uint32_t>& list, std::uint32_t value) {
  return std::find(list.begin(), list.end(), value) != list.end();
}

}  // namespace

Registration::Registration(const Network& network, std::uint64_t seed) : network_(network), random_(seed, 3) {}

// 3GPP TS 23.003, 2.4: the two top bits tell who has given a temporary identity. A visitor location register never sets
// both, so that its TMSI is not taken for a P-TMSI, in which both are always set.
std::uint32_t Registration::newTmsi() { return static_cast<std::uint32_t>(random_.next() >> 33); }
// For an M-TMSI too, which becomes a P-TMSI when the phone goes to UMTS. Never all ones, which means none.
std::uint32_t Registration::newPacketTmsi() { return (newTmsi() & ~1U) | 0xC0000000U; }

bool Registration::knownForbidden(CellIndex cell) const {
  const std::uint32_t area = network_.cells[cell].areaCode;
  return network_.technologyOf(cell) == Technology::kLte ? contains(forbiddenTrackingAreas_, area)
                                                         : contains(forbiddenLocationAreas_, area);
}

void Registration::arrive(CellIndex cell, bool fromElsewhere, Milliseconds now, Facts& facts) {
  const bool hadService = cell_.has_value();
  cell_ = cell;
  fromElsewhere_ = fromElsewhere_ || fromElsewhere;
  // What was asked of the old cell is asked again, or is moot.
  if (procedure_ != Procedure::kNone) {
    const Procedure interrupted = procedure_;
    procedure_ = Procedure::kNone;
    ends_ = -1;
    gprs_.procedure = GprsProcedure::kNone;
    eps_.procedure = EpsProcedure::kNone;
    for (Service* service : {&mobility_.service, &gprs_.service, &eps_.service}) {
      if (*service == Service::kRegistrationInProgress) *service = Service::kNotRegistered;
    }
    touch(interrupted, now, facts);
  }
  retryAt_ = -1;
  if (!hadService) {
    if (mobility_.service == Service::kNone && mobility_.locationArea) mobility_.service = Service::kNormal;
    if (gprs_.service == Service::kNone && gprs_.temporaryIdentity) gprs_.service = Service::kNormal;
    if (eps_.service == Service::kNone && eps_.temporaryIdentity) eps_.service = Service::kNormal;
    facts.learn(Fact::kMobilityContext, now);
    facts.learn(Fact::kGprsContext, now);
    facts.learn(Fact::kEpsContext, now);
  }
  plan(now, facts);
}

void Registration::loseService(Milliseconds now, Facts& facts) {
  cell_.reset();
  procedure_ = Procedure::kNone;
  ends_ = retryAt_ = -1;
  for (Service* service : {&mobility_.service, &gprs_.service, &eps_.service}) *service = Service::kNone;
  gprs_.procedure = GprsProcedure::kNone;
  eps_.procedure = EpsProcedure::kNone;
  facts.learn(Fact::kMobilityContext, now);
  facts.learn(Fact::kGprsContext, now);
  facts.learn(Fact::kEpsContext, now);
}

void Registration::requestService(Technology technology, Milliseconds now, Facts& facts) {
  if (procedure_ != Procedure::kNone) return;
  if (technology == Technology::kLte && eps_.registered()) {
    eps_.procedure = EpsProcedure::kServiceRequest;
    facts.learn(Fact::kEpsContext, now);
  }
  if (technology == Technology::kUmts && gprs_.temporaryIdentity) {
    gprs_.procedure = GprsProcedure::kServiceRequest;
    facts.learn(Fact::kGprsContext, now);
  }
}

void Registration::endService(Milliseconds now, Facts& facts) {
  if (eps_.procedure == EpsProcedure::kServiceRequest) {
    eps_.procedure = EpsProcedure::kNone;
    facts.learn(Fact::kEpsContext, now);
  }
  if (gprs_.procedure == GprsProcedure::kServiceRequest) {
    gprs_.procedure = GprsProcedure::kNone;
    facts.learn(Fact::kGprsContext, now);
  }
}

void Registration::addTo(Demand& demand) const { demand.signalling = demand.registering = busy(); }

// What the present cell asks for (3GPP TS 24.008, 4.4.1 and 4.7.5; 24.301, 5.5.3).
void Registration::plan(Milliseconds now, Facts& facts) {
  if (!cell_ || procedure_ != Procedure::kNone || now < retryAt_) return;
  const Cell& cell = network_.cells[*cell_];
  if (knownForbidden(*cell_)) return;
  if (network_.technologyOf(*cell_) == Technology::kLte) {
    if (!eps_.temporaryIdentity) {
      begin(Procedure::kEpsAttach, now, facts);
    } else if (fromElsewhere_ || eps_.update != PacketUpdate::kUpdated ||
               !contains(eps_.trackingAreas, cell.areaCode)) {
      begin(Procedure::kTrackingAreaUpdate, now, facts);
    } else if (periodicAt_ >= 0 && now >= periodicAt_) {
      begin(Procedure::kPeriodicAreaUpdate, now, facts);
    }
    return;
  }
  if (mobility_.locationArea != cell.areaCode || mobility_.update != LocationUpdate::kUpdated) {
    begin(Procedure::kLocationUpdate, now, facts);
  } else if (!gprs_.temporaryIdentity) {
    begin(Procedure::kGprsAttach, now, facts);
  } else if (fromElsewhere_ || gprs_.update != PacketUpdate::kUpdated || gprs_.locationArea != cell.areaCode ||
             gprs_.routingArea != cell.routingAreaCode) {
    begin(Procedure::kRoutingAreaUpdate, now, facts);
  }
}

void Registration::touch(Procedure procedure, Milliseconds now, Facts& facts) const {
  switch (procedure) {
    case Procedure::kNone:
      return;
    case Procedure::kLocationUpdate:
      facts.learn(Fact::kMobilityContext, now);
      return;
    case Procedure::kGprsAttach:
    case Procedure::kRoutingAreaUpdate:
      facts.learn(Fact::kGprsContext, now);
      return;
    case Procedure::kEpsAttach:
    case Procedure::kTrackingAreaUpdate:
    case Procedure::kPeriodicAreaUpdate:
      facts.learn(Fact::kEpsContext, now);
      return;
  }
}

void Registration::begin(Procedure procedure, Milliseconds now, Facts& facts) {
  procedure_ = procedure;
  ends_ = -1;
  retryAt_ = -1;
  switch (procedure) {
    case Procedure::kNone:
      return;
    case Procedure::kLocationUpdate:
      mobility_.service = mobility_.locationArea ? mobility_.service : Service::kRegistrationInProgress;
      mobility_.combined = false;
      break;
    case Procedure::kGprsAttach:
      gprs_.service = Service::kRegistrationInProgress;
      gprs_.procedure = GprsProcedure::kAttach;
      break;
    case Procedure::kRoutingAreaUpdate:
      gprs_.procedure = GprsProcedure::kRoutingAreaUpdate;
      break;
    case Procedure::kEpsAttach:
      eps_.service = Service::kRegistrationInProgress;
      eps_.procedure = EpsProcedure::kAttachCombined;
      break;
    case Procedure::kTrackingAreaUpdate:
      eps_.procedure = EpsProcedure::kAreaUpdateCombined;
      break;
    case Procedure::kPeriodicAreaUpdate:
      eps_.procedure = EpsProcedure::kPeriodicAreaUpdate;
      break;
  }
  touch(procedure, now, facts);
}

void Registration::advance(Milliseconds now, bool connected, Facts& facts) {
  if (!cell_) return;
  if (procedure_ == Procedure::kNone) {
    plan(now, facts);
    return;
  }
  // Packet registration in GSM needs no dedicated channel; everything else needs a connection.
  const bool packetInGsm = network_.technologyOf(*cell_) == Technology::kGsm &&
                           (procedure_ == Procedure::kGprsAttach || procedure_ == Procedure::kRoutingAreaUpdate);
  if (ends_ < 0) {
    // A network answers a phone that has just been switched on before all others.
    const std::int64_t steps = eps_.temporaryIdentity ? random_.integerBetween(5, 8) : 4;
    if (connected || packetInGsm) ends_ = now + kStep * steps;
    return;
  }
  if (!connected && !packetInGsm) {
    ends_ = -1;  // the connection broke; the procedure waits for the next
    if (procedure_ == Procedure::kLocationUpdate) mobility_.failure = ProcedureFailure::kLowerLayers;
    if (procedure_ == Procedure::kGprsAttach || procedure_ == Procedure::kRoutingAreaUpdate) {
      gprs_.failure = ProcedureFailure::kLowerLayers;
    }
    touch(procedure_, now, facts);
    return;
  }
  if (now >= ends_) finish(now, facts);
}

void Registration::finish(Milliseconds now, Facts& facts) {
  const Cell& cell = network_.cells[*cell_];
  const bool first = procedure_ == Procedure::kEpsAttach || procedure_ == Procedure::kGprsAttach ||
                     !mobility_.locationArea.has_value();
  if (cell.areaCode == network_.forbiddenAreaCode) {
    refuse(Reject::kNoSuitableCellInLocationArea, now, facts);
  } else if (!first && random_.chance(kRefusals)) {
    refuse(random_.chance(0.5) ? Reject::kNetworkFailure : Reject::kCongestion, now, facts);
  } else {
    accept(now, facts);
  }
}

void Registration::accept(Milliseconds now, Facts& facts) {
  const Cell& cell = network_.cells[*cell_];
  const Procedure done = procedure_;
  procedure_ = Procedure::kNone;
  ends_ = -1;
  if (!equivalentNetwork_) {
    equivalentNetwork_ = kEquivalentNetwork;
    facts.learn(Fact::kMobilityCommon, now);
  }
  const auto updateLocation = [&](bool combined) {
    mobility_.service = Service::kNormal;
    mobility_.update = LocationUpdate::kUpdated;
    mobility_.locationArea = cell.areaCode;
    mobility_.periodicSeconds = kPeriodicLocation;
    mobility_.failure = ProcedureFailure::kNone;
    mobility_.reject = Reject::kNone;
    mobility_.combined = combined;
    if (!mobility_.temporaryIdentity || random_.chance(0.5)) mobility_.temporaryIdentity = newTmsi();
    facts.learn(Fact::kMobilityContext, now);
  };
  switch (done) {
    case Procedure::kNone:
      return;
    case Procedure::kLocationUpdate:
      updateLocation(false);
      break;
    case Procedure::kGprsAttach:
    case Procedure::kRoutingAreaUpdate:
      fromElsewhere_ = false;
      gprs_.service = Service::kNormal;
      gprs_.update = PacketUpdate::kUpdated;
      gprs_.locationArea = cell.areaCode;
      gprs_.routingArea = cell.routingAreaCode;
      gprs_.periodicSeconds = kPeriodicRouting;
      gprs_.failure = ProcedureFailure::kNone;
      gprs_.reject = Reject::kNone;
      gprs_.procedure = GprsProcedure::kNone;
      if (!gprs_.temporaryIdentity || random_.chance(0.5)) gprs_.temporaryIdentity = newPacketTmsi();
      break;
    case Procedure::kEpsAttach:
    case Procedure::kTrackingAreaUpdate:
    case Procedure::kPeriodicAreaUpdate: {
      if (done == Procedure::kEpsAttach) ++epsAttaches_;
      fromElsewhere_ = false;
      eps_.service = Service::kNormal;
      eps_.update = PacketUpdate::kUpdated;
      eps_.reject = Reject::kNone;
      eps_.procedure = EpsProcedure::kNone;
      eps_.periodicSeconds = kPeriodicTracking;
      periodicAt_ = now + Milliseconds{kPeriodicTracking} * 1000;
      // Two neighbouring areas make a list; within it nothing needs to be said.
      const std::uint32_t area = cell.areaCode - areaCodeOf(0);
      eps_.trackingAreas = {areaCodeOf(area / 2 * 2), areaCodeOf(area / 2 * 2 + 1)};
      eps_.groupIdentity = kGroupIdentity;
      eps_.groupCode = 1 + area / 2;
      if (!eps_.temporaryIdentity || random_.chance(0.4)) eps_.temporaryIdentity = newPacketTmsi();
      eps_.voiceOverIms = network_.hasVoiceOverIms(*cell_);
      if (done != Procedure::kPeriodicAreaUpdate) updateLocation(true);
      break;
    }
  }
  touch(done, now, facts);
}

void Registration::refuse(Reject cause, Milliseconds now, Facts& facts) {
  const bool final = cause == Reject::kNoSuitableCellInLocationArea;
  const Procedure refused = procedure_;
  const std::uint32_t area = network_.cells[*cell_].areaCode;
  procedure_ = Procedure::kNone;
  ends_ = -1;
  retryAt_ = now + kRetryAfter;
  switch (refused) {
    case Procedure::kNone:
      return;
    case Procedure::kLocationUpdate:
      mobility_.service = final ? Service::kLimited : Service::kRegistrationFailure;
      mobility_.update = final ? LocationUpdate::kRoamingNotAllowed : LocationUpdate::kNotUpdated;
      mobility_.failure = ProcedureFailure::kRejected;
      mobility_.reject = cause;
      break;
    case Procedure::kGprsAttach:
    case Procedure::kRoutingAreaUpdate:
      gprs_.service = final ? Service::kLimited : Service::kRegistrationFailure;
      gprs_.update = final ? PacketUpdate::kRoamingNotAllowed : PacketUpdate::kNotUpdated;
      gprs_.failure = ProcedureFailure::kRejected;
      gprs_.reject = cause;
      gprs_.procedure = GprsProcedure::kNone;
      break;
    case Procedure::kEpsAttach:
    case Procedure::kTrackingAreaUpdate:
    case Procedure::kPeriodicAreaUpdate:
      eps_.service = final ? Service::kLimited : Service::kRegistrationFailure;
      eps_.update = final ? PacketUpdate::kRoamingNotAllowed : PacketUpdate::kNotUpdated;
      eps_.reject = cause;
      eps_.procedure = EpsProcedure::kNone;
      break;
  }
  touch(refused, now, facts);
  if (!final) return;
  // "Forbidden for roaming", until the phone is switched off (24.301, 5.5.3.2.5; 24.008, 4.4.4.7).
  const bool tracking = network_.technologyOf(*cell_) == Technology::kLte;
  auto& list = tracking ? forbiddenTrackingAreas_ : forbiddenLocationAreas_;
  if (!contains(list, area)) list.push_back(area);
  facts.learn(Fact::kMobilityCommon, now);
}

}  // namespace probeview::scenario
