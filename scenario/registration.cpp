// SPDX-License-Identifier: Apache-2.0
#include "scenario/registration.h"

#include <algorithm>

namespace probeview::scenario {
namespace {

// Now and then a network is too busy or broken; the phone tries again after T3411, T3311 or T3211.
constexpr double refusalChance = 0.06;
constexpr Milliseconds retryAfter = 10000;
constexpr std::uint32_t periodicLocation = 3600, periodicRouting = 3240, periodicTracking = 1200;  // s
constexpr std::uint32_t groupIdentity = 0x8001;
constexpr std::uint32_t otherNetworkCode = 2;  // 001/02, a test network as well

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
  return network_.technologyOf(cell) == Technology::Lte ? contains(forbiddenTrackingAreas_, area)
                                                        : contains(forbiddenLocationAreas_, area);
}

void Registration::arrive(CellIndex cell, bool fromElsewhere, Milliseconds now, Facts& facts) {
  const bool hadService = cell_.has_value();
  cell_ = cell;
  fromElsewhere_ = fromElsewhere_ || fromElsewhere;
  // What was asked of the old cell is asked again, or is moot.
  if (procedure_ != Procedure::None) {
    const Procedure interrupted = procedure_;
    procedure_ = Procedure::None;
    ends_ = -1;
    gprs_.procedure = GprsProcedure::None;
    eps_.procedure = EpsProcedure::None;
    for (Service* service : {&mobility_.service, &gprs_.service, &eps_.service}) {
      if (*service == Service::RegistrationInProgress) *service = Service::NotRegistered;
    }
    touch(interrupted, now, facts);
  }
  retryAt_ = -1;
  if (!hadService) {
    if (mobility_.service == Service::None && mobility_.locationArea) mobility_.service = Service::Normal;
    if (gprs_.service == Service::None && gprs_.temporaryIdentity) gprs_.service = Service::Normal;
    if (eps_.service == Service::None && eps_.temporaryIdentity) eps_.service = Service::Normal;
    facts.learn(Fact::MobilityContext, now);
    facts.learn(Fact::GprsContext, now);
    facts.learn(Fact::EpsContext, now);
  }
  plan(now, facts);
}

void Registration::loseService(Milliseconds now, Facts& facts) {
  cell_.reset();
  procedure_ = Procedure::None;
  ends_ = retryAt_ = -1;
  for (Service* service : {&mobility_.service, &gprs_.service, &eps_.service}) *service = Service::None;
  gprs_.procedure = GprsProcedure::None;
  eps_.procedure = EpsProcedure::None;
  facts.learn(Fact::MobilityContext, now);
  facts.learn(Fact::GprsContext, now);
  facts.learn(Fact::EpsContext, now);
}

void Registration::requestService(Technology technology, Milliseconds now, Facts& facts) {
  if (procedure_ != Procedure::None) return;
  if (technology == Technology::Lte && eps_.registered()) {
    eps_.procedure = EpsProcedure::ServiceRequest;
    facts.learn(Fact::EpsContext, now);
  }
  if (technology == Technology::Umts && gprs_.temporaryIdentity) {
    gprs_.procedure = GprsProcedure::ServiceRequest;
    facts.learn(Fact::GprsContext, now);
  }
}

void Registration::endService(Milliseconds now, Facts& facts) {
  if (eps_.procedure == EpsProcedure::ServiceRequest) {
    eps_.procedure = EpsProcedure::None;
    facts.learn(Fact::EpsContext, now);
  }
  if (gprs_.procedure == GprsProcedure::ServiceRequest) {
    gprs_.procedure = GprsProcedure::None;
    facts.learn(Fact::GprsContext, now);
  }
}

void Registration::addTo(Demand& demand) const { demand.signalling = demand.registering = busy(); }

// What the present cell asks for (3GPP TS 24.008, 4.4.1 and 4.7.5; 24.301, 5.5.3).
void Registration::plan(Milliseconds now, Facts& facts) {
  if (!cell_ || procedure_ != Procedure::None || now < retryAt_) return;
  const Cell& cell = network_.cells[*cell_];
  if (knownForbidden(*cell_)) return;
  if (network_.technologyOf(*cell_) == Technology::Lte) {
    if (!eps_.temporaryIdentity) {
      begin(Procedure::EpsAttach, now, facts);
    } else if (fromElsewhere_ || eps_.update != PacketUpdate::Updated || !contains(eps_.trackingAreas, cell.areaCode)) {
      begin(Procedure::TrackingAreaUpdate, now, facts);
    } else if (periodicAt_ >= 0 && now >= periodicAt_) {
      begin(Procedure::PeriodicAreaUpdate, now, facts);
    }
    return;
  }
  if (mobility_.locationArea != cell.areaCode || mobility_.update != LocationUpdate::Updated) {
    begin(Procedure::LocationUpdate, now, facts);
  } else if (!gprs_.temporaryIdentity) {
    begin(Procedure::GprsAttach, now, facts);
  } else if (fromElsewhere_ || gprs_.update != PacketUpdate::Updated || gprs_.locationArea != cell.areaCode ||
             gprs_.routingArea != cell.routingAreaCode) {
    begin(Procedure::RoutingAreaUpdate, now, facts);
  }
}

void Registration::touch(Procedure procedure, Milliseconds now, Facts& facts) const {
  switch (procedure) {
    case Procedure::None:
      return;
    case Procedure::LocationUpdate:
      facts.learn(Fact::MobilityContext, now);
      return;
    case Procedure::GprsAttach:
    case Procedure::RoutingAreaUpdate:
      facts.learn(Fact::GprsContext, now);
      return;
    case Procedure::EpsAttach:
    case Procedure::TrackingAreaUpdate:
    case Procedure::PeriodicAreaUpdate:
      facts.learn(Fact::EpsContext, now);
      return;
  }
}

void Registration::begin(Procedure procedure, Milliseconds now, Facts& facts) {
  procedure_ = procedure;
  ends_ = -1;
  retryAt_ = -1;
  switch (procedure) {
    case Procedure::None:
      return;
    case Procedure::LocationUpdate:
      mobility_.service = mobility_.locationArea ? mobility_.service : Service::RegistrationInProgress;
      mobility_.combined = false;
      break;
    case Procedure::GprsAttach:
      gprs_.service = Service::RegistrationInProgress;
      gprs_.procedure = GprsProcedure::Attach;
      break;
    case Procedure::RoutingAreaUpdate:
      gprs_.procedure = GprsProcedure::RoutingAreaUpdate;
      break;
    case Procedure::EpsAttach:
      eps_.service = Service::RegistrationInProgress;
      eps_.procedure = EpsProcedure::AttachCombined;
      break;
    case Procedure::TrackingAreaUpdate:
      eps_.procedure = EpsProcedure::AreaUpdateCombined;
      break;
    case Procedure::PeriodicAreaUpdate:
      eps_.procedure = EpsProcedure::PeriodicAreaUpdate;
      break;
  }
  touch(procedure, now, facts);
}

void Registration::advance(Milliseconds now, bool connected, Facts& facts) {
  if (!cell_) return;
  if (procedure_ == Procedure::None) {
    plan(now, facts);
    return;
  }
  // Packet registration in GSM needs no dedicated channel; everything else needs a connection.
  const bool packetInGsm = network_.technologyOf(*cell_) == Technology::Gsm &&
                           (procedure_ == Procedure::GprsAttach || procedure_ == Procedure::RoutingAreaUpdate);
  if (ends_ < 0) {
    // A network answers a phone that has just been switched on before all others.
    const std::int64_t steps = eps_.temporaryIdentity ? random_.integerBetween(5, 8) : 4;
    if (connected || packetInGsm) ends_ = now + stepTime * steps;
    return;
  }
  if (!connected && !packetInGsm) {
    ends_ = -1;  // the connection broke; the procedure waits for the next
    if (procedure_ == Procedure::LocationUpdate) mobility_.failure = ProcedureFailure::LowerLayers;
    if (procedure_ == Procedure::GprsAttach || procedure_ == Procedure::RoutingAreaUpdate) {
      gprs_.failure = ProcedureFailure::LowerLayers;
    }
    touch(procedure_, now, facts);
    return;
  }
  if (now >= ends_) finish(now, facts);
}

void Registration::finish(Milliseconds now, Facts& facts) {
  const Cell& cell = network_.cells[*cell_];
  const bool first =
      procedure_ == Procedure::EpsAttach || procedure_ == Procedure::GprsAttach || !mobility_.locationArea;
  if (cell.areaCode == network_.forbiddenAreaCode) {
    refuse(Reject::NoSuitableCellInLocationArea, now, facts);
  } else if (!first && random_.chance(refusalChance)) {
    refuse(random_.chance(0.5) ? Reject::NetworkFailure : Reject::Congestion, now, facts);
  } else {
    accept(now, facts);
  }
}

void Registration::accept(Milliseconds now, Facts& facts) {
  const Cell& cell = network_.cells[*cell_];
  const Procedure done = procedure_;
  procedure_ = Procedure::None;
  ends_ = -1;
  if (!equivalentNetwork_) {
    equivalentNetwork_ = otherNetworkCode;
    facts.learn(Fact::MobilityCommon, now);
  }
  const auto updateLocation = [&](bool combined) {
    mobility_.service = Service::Normal;
    mobility_.update = LocationUpdate::Updated;
    mobility_.locationArea = cell.areaCode;
    mobility_.periodicSeconds = periodicLocation;
    mobility_.failure = ProcedureFailure::None;
    mobility_.reject = Reject::None;
    mobility_.combined = combined;
    if (!mobility_.temporaryIdentity || random_.chance(0.5)) mobility_.temporaryIdentity = newTmsi();
    facts.learn(Fact::MobilityContext, now);
  };
  switch (done) {
    case Procedure::None:
      return;
    case Procedure::LocationUpdate:
      updateLocation(false);
      break;
    case Procedure::GprsAttach:
    case Procedure::RoutingAreaUpdate:
      fromElsewhere_ = false;
      gprs_.service = Service::Normal;
      gprs_.update = PacketUpdate::Updated;
      gprs_.locationArea = cell.areaCode;
      gprs_.routingArea = cell.routingAreaCode;
      gprs_.periodicSeconds = periodicRouting;
      gprs_.failure = ProcedureFailure::None;
      gprs_.reject = Reject::None;
      gprs_.procedure = GprsProcedure::None;
      if (!gprs_.temporaryIdentity || random_.chance(0.5)) gprs_.temporaryIdentity = newPacketTmsi();
      break;
    case Procedure::EpsAttach:
    case Procedure::TrackingAreaUpdate:
    case Procedure::PeriodicAreaUpdate: {
      if (done == Procedure::EpsAttach) ++epsAttaches_;
      fromElsewhere_ = false;
      eps_.service = Service::Normal;
      eps_.update = PacketUpdate::Updated;
      eps_.reject = Reject::None;
      eps_.procedure = EpsProcedure::None;
      eps_.periodicSeconds = periodicTracking;
      periodicAt_ = now + Milliseconds{periodicTracking} * 1000;
      // Two neighbouring areas make a list; within it nothing needs to be said.
      const std::uint32_t area = cell.areaCode - areaCodeOf(0);
      eps_.trackingAreas = {areaCodeOf(area / 2 * 2), areaCodeOf(area / 2 * 2 + 1)};
      eps_.groupIdentity = groupIdentity;
      eps_.groupCode = 1 + area / 2;
      if (!eps_.temporaryIdentity || random_.chance(0.4)) eps_.temporaryIdentity = newPacketTmsi();
      eps_.voiceOverIms = network_.hasVoiceOverIms(*cell_);
      if (done != Procedure::PeriodicAreaUpdate) updateLocation(true);
      break;
    }
  }
  touch(done, now, facts);
}

void Registration::refuse(Reject cause, Milliseconds now, Facts& facts) {
  const bool final = cause == Reject::NoSuitableCellInLocationArea;
  const Procedure refused = procedure_;
  const std::uint32_t area = network_.cells[*cell_].areaCode;
  procedure_ = Procedure::None;
  ends_ = -1;
  retryAt_ = now + retryAfter;
  switch (refused) {
    case Procedure::None:
      return;
    case Procedure::LocationUpdate:
      mobility_.service = final ? Service::Limited : Service::RegistrationFailure;
      mobility_.update = final ? LocationUpdate::RoamingNotAllowed : LocationUpdate::NotUpdated;
      mobility_.failure = ProcedureFailure::Rejected;
      mobility_.reject = cause;
      break;
    case Procedure::GprsAttach:
    case Procedure::RoutingAreaUpdate:
      gprs_.service = final ? Service::Limited : Service::RegistrationFailure;
      gprs_.update = final ? PacketUpdate::RoamingNotAllowed : PacketUpdate::NotUpdated;
      gprs_.failure = ProcedureFailure::Rejected;
      gprs_.reject = cause;
      gprs_.procedure = GprsProcedure::None;
      break;
    case Procedure::EpsAttach:
    case Procedure::TrackingAreaUpdate:
    case Procedure::PeriodicAreaUpdate:
      eps_.service = final ? Service::Limited : Service::RegistrationFailure;
      eps_.update = final ? PacketUpdate::RoamingNotAllowed : PacketUpdate::NotUpdated;
      eps_.reject = cause;
      eps_.procedure = EpsProcedure::None;
      break;
  }
  touch(refused, now, facts);
  if (!final) return;
  // "Forbidden for roaming", until the phone is switched off (24.301, 5.5.3.2.5; 24.008, 4.4.4.7).
  const bool tracking = network_.technologyOf(*cell_) == Technology::Lte;
  std::vector<std::uint32_t>& list = tracking ? forbiddenTrackingAreas_ : forbiddenLocationAreas_;
  if (!contains(list, area)) list.push_back(area);
  facts.learn(Fact::MobilityCommon, now);
}

}  // namespace probeview::scenario
