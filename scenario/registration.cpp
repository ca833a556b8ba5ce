// SPDX-License-Identifier: Apache-2.0
#include "scenario/registration.h"

#include <algorithm>

namespace probeview::scenario {

// Why a network refuses: to circuit and GPRS services (3GPP TS 24.008, 10.5.3.6) and to EPS (24.301, 9.9.3.9).
struct Refusal {
  Reject::Value cause;
  EpsReject::Value epsCause;
  bool final;  // the area stays refused, and the phone does not try again there
};

namespace {

constexpr Refusal noSuitableCell{Reject::KNAS_MM_REJ_CAUSE_NO_SUITABLE_CELL_IN_LA,
                                 EpsReject::EMM_CAUSE_NO_SUITABLE_CELLS_IN_TRACKING_AREA, true};
constexpr Refusal networkFailure{Reject::KNAS_MM_REJ_CAUSE_NW_FAILURE, EpsReject::EMM_CAUSE_NETWORK_FAILURE, false};
constexpr Refusal congestion{Reject::KNAS_MM_REJ_CAUSE_CONGESTION, EpsReject::EMM_CAUSE_CONGESTION, false};

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
    gprs_.procedure = GprsProcedure::KNAS_MM_REG_PROC_PROC_NONE;
    eps_.procedure = EpsProcedure::EMM_PROC_NO_PROC;
    for (Service::Value* service : {&mobility_.service, &gprs_.service, &eps_.service}) {
      if (*service == Service::KREG_STATUS_REGISTRATION_IN_PROGRESS) *service = Service::KREG_STATUS_AT_NOT_REGISTERED;
    }
    touch(interrupted, now, facts);
  }
  retryAt_ = -1;
  if (!hadService) {
    const auto regain = [](Service::Value& service, bool registered) {
      if (service == Service::KREG_STATUS_NO_SERVICE && registered) service = Service::KREG_STATUS_NORMAL_SERVICE;
    };
    regain(mobility_.service, mobility_.locationArea.has_value());
    regain(gprs_.service, gprs_.temporaryIdentity.has_value());
    regain(eps_.service, eps_.temporaryIdentity.has_value());
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
  mobility_.service = gprs_.service = eps_.service = Service::KREG_STATUS_NO_SERVICE;
  gprs_.procedure = GprsProcedure::KNAS_MM_REG_PROC_PROC_NONE;
  eps_.procedure = EpsProcedure::EMM_PROC_NO_PROC;
  facts.learn(Fact::MobilityContext, now);
  facts.learn(Fact::GprsContext, now);
  facts.learn(Fact::EpsContext, now);
}

void Registration::requestService(Technology technology, Milliseconds now, Facts& facts) {
  if (procedure_ != Procedure::None) return;
  if (technology == Technology::Lte && eps_.registered()) {
    eps_.procedure = EpsProcedure::EMM_PROC_SERV_REQ;
    facts.learn(Fact::EpsContext, now);
  }
  if (technology == Technology::Umts && gprs_.temporaryIdentity) {
    gprs_.procedure = GprsProcedure::KNAS_MM_REG_PROC_SERVICE_REQ;
    facts.learn(Fact::GprsContext, now);
  }
}

void Registration::endService(Milliseconds now, Facts& facts) {
  if (eps_.procedure == EpsProcedure::EMM_PROC_SERV_REQ) {
    eps_.procedure = EpsProcedure::EMM_PROC_NO_PROC;
    facts.learn(Fact::EpsContext, now);
  }
  if (gprs_.procedure == GprsProcedure::KNAS_MM_REG_PROC_SERVICE_REQ) {
    gprs_.procedure = GprsProcedure::KNAS_MM_REG_PROC_PROC_NONE;
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
    } else if (fromElsewhere_ || eps_.update != EpsUpdate::EPS_STATUS_UPDATED ||
               !contains(eps_.trackingAreas, cell.areaCode)) {
      begin(Procedure::TrackingAreaUpdate, now, facts);
    } else if (periodicAt_ >= 0 && now >= periodicAt_) {
      begin(Procedure::PeriodicAreaUpdate, now, facts);
    }
    return;
  }
  if (mobility_.locationArea != cell.areaCode || mobility_.update != MobilityUpdate::STATUS_UPDATED) {
    begin(Procedure::LocationUpdate, now, facts);
  } else if (!gprs_.temporaryIdentity) {
    begin(Procedure::GprsAttach, now, facts);
  } else if (fromElsewhere_ || gprs_.update != GprsUpdate::GPRS_STATUS_UPDATED || gprs_.locationArea != cell.areaCode ||
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
      mobility_.service = mobility_.locationArea ? mobility_.service : Service::KREG_STATUS_REGISTRATION_IN_PROGRESS;
      mobility_.combined = false;
      break;
    case Procedure::GprsAttach:
      gprs_.service = Service::KREG_STATUS_REGISTRATION_IN_PROGRESS;
      gprs_.procedure = GprsProcedure::KNAS_MM_REG_PROC_ATTACH;
      break;
    case Procedure::RoutingAreaUpdate:
      gprs_.procedure = GprsProcedure::KNAS_MM_REG_PROC_ROUTING_AREA_UPDATE;
      break;
    case Procedure::EpsAttach:
      eps_.service = Service::KREG_STATUS_REGISTRATION_IN_PROGRESS;
      eps_.procedure = EpsProcedure::EMM_PROC_ATTACH_COMB;
      break;
    case Procedure::TrackingAreaUpdate:
      eps_.procedure = EpsProcedure::EMM_PROC_TAU_COMB;
      break;
    case Procedure::PeriodicAreaUpdate:
      eps_.procedure = EpsProcedure::EMM_PROC_PERIODIC_TAU;
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
    if (procedure_ == Procedure::LocationUpdate) {
      mobility_.failure = ProcedureFailure::KNAS_MM_PROC_FAILURE_CAUSE_LOWER_LAYER_FAILURE;
    }
    if (procedure_ == Procedure::GprsAttach || procedure_ == Procedure::RoutingAreaUpdate) {
      gprs_.failure = ProcedureFailure::KNAS_MM_PROC_FAILURE_CAUSE_LOWER_LAYER_FAILURE;
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
    refuse(noSuitableCell, now, facts);
  } else if (!first && random_.chance(refusalChance)) {
    refuse(random_.chance(0.5) ? networkFailure : congestion, now, facts);
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
    mobility_.service = Service::KREG_STATUS_NORMAL_SERVICE;
    mobility_.update = MobilityUpdate::STATUS_UPDATED;
    mobility_.locationArea = cell.areaCode;
    mobility_.periodicSeconds = periodicLocation;
    mobility_.failure = ProcedureFailure::KNAS_MM_PROC_FAILURE_CAUSE_NONE;
    mobility_.reject = Reject::KNAS_MM_REJ_CAUSE_NONE;
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
      gprs_.service = Service::KREG_STATUS_NORMAL_SERVICE;
      gprs_.update = GprsUpdate::GPRS_STATUS_UPDATED;
      gprs_.locationArea = cell.areaCode;
      gprs_.routingArea = cell.routingAreaCode;
      gprs_.periodicSeconds = periodicRouting;
      gprs_.failure = ProcedureFailure::KNAS_MM_PROC_FAILURE_CAUSE_NONE;
      gprs_.reject = Reject::KNAS_MM_REJ_CAUSE_NONE;
      gprs_.procedure = GprsProcedure::KNAS_MM_REG_PROC_PROC_NONE;
      if (!gprs_.temporaryIdentity || random_.chance(0.5)) gprs_.temporaryIdentity = newPacketTmsi();
      break;
    case Procedure::EpsAttach:
    case Procedure::TrackingAreaUpdate:
    case Procedure::PeriodicAreaUpdate: {
      if (done == Procedure::EpsAttach) ++epsAttaches_;
      fromElsewhere_ = false;
      eps_.service = Service::KREG_STATUS_NORMAL_SERVICE;
      eps_.update = EpsUpdate::EPS_STATUS_UPDATED;
      eps_.reject = EpsReject::EMM_CAUSE_NO_CAUSE;
      eps_.procedure = EpsProcedure::EMM_PROC_NO_PROC;
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

void Registration::refuse(const Refusal& refusal, Milliseconds now, Facts& facts) {
  const bool final = refusal.final;
  const Procedure refused = procedure_;
  const std::uint32_t area = network_.cells[*cell_].areaCode;
  procedure_ = Procedure::None;
  ends_ = -1;
  retryAt_ = now + retryAfter;
  switch (refused) {
    case Procedure::None:
      return;
    case Procedure::LocationUpdate:
      mobility_.service = final ? Service::KREG_STATUS_LIMITED_SERVICE : Service::KREG_STATUS_REGISTRATION_FAILURE;
      mobility_.update = final ? MobilityUpdate::STATUS_ROAMING_NOT_ALLOWED : MobilityUpdate::STATUS_NOT_UPDATED;
      mobility_.failure = ProcedureFailure::KNAS_MM_PROC_FAILURE_CAUSE_REJECTED_BY_NW;
      mobility_.reject = refusal.cause;
      break;
    case Procedure::GprsAttach:
    case Procedure::RoutingAreaUpdate:
      gprs_.service = final ? Service::KREG_STATUS_LIMITED_SERVICE : Service::KREG_STATUS_REGISTRATION_FAILURE;
      gprs_.update = final ? GprsUpdate::GPRS_STATUS_ROAMING_NOT_ALLOWED : GprsUpdate::GPRS_STATUS_NOT_UPDATED;
      gprs_.failure = ProcedureFailure::KNAS_MM_PROC_FAILURE_CAUSE_REJECTED_BY_NW;
      gprs_.reject = refusal.cause;
      gprs_.procedure = GprsProcedure::KNAS_MM_REG_PROC_PROC_NONE;
      break;
    case Procedure::EpsAttach:
    case Procedure::TrackingAreaUpdate:
    case Procedure::PeriodicAreaUpdate:
      eps_.service = final ? Service::KREG_STATUS_LIMITED_SERVICE : Service::KREG_STATUS_REGISTRATION_FAILURE;
      eps_.update = final ? EpsUpdate::EPS_STATUS_ROAMING_NOT_ALLOWED : EpsUpdate::EPS_STATUS_NOT_UPDATED;
      eps_.reject = refusal.epsCause;
      eps_.procedure = EpsProcedure::EMM_PROC_NO_PROC;
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
