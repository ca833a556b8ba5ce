// SPDX-License-Identifier: Apache-2.0
//
// Mobility management: where the phone is registered, with which temporary identities, and what the network answered
// (3GPP TS 24.008 for circuit and packet services, 24.301 for EPS).
#pragma once

#include <cstdint>
#include <optional>
#include <vector>

#include "messages/nas_messages.h"
#include "scenario/facts.h"
#include "scenario/modem.h"
#include "scenario/network.h"
#include "scenario/random.h"

namespace probeview::scenario {

// What all three kinds of service have in common has its names from the circuit services.
using Service = KCellularMmContext::RegStatus;
using ProcedureFailure = KCellularMmContext::ProcFailureCause;
using Reject = KCellularMmContext::RejectCause;  // of circuit and GPRS services
using EpsReject = KCellularEmmContext::RejectCause;
using MobilityUpdate = KCellularMmContext::UpdateStatus;
using GprsUpdate = KCellularGmmContext::UpdateStatus;
using EpsUpdate = KCellularEmmContext::UpdateStatus;
using GprsProcedure = KCellularGmmContext::RegProc;
using EpsProcedure = KCellularEmmContext::RegProc;

struct MobilityContext {
  Service::Value service = Service::KREG_STATUS_AT_NOT_REGISTERED;
  MobilityUpdate::Value update = MobilityUpdate::STATUS_NOT_UPDATED;
  std::optional<std::uint32_t> locationArea;
  std::optional<std::uint32_t> temporaryIdentity;
  std::optional<std::uint32_t> periodicSeconds;  // T3212
  ProcedureFailure::Value failure = ProcedureFailure::KNAS_MM_PROC_FAILURE_CAUSE_NONE;
  Reject::Value reject = Reject::KNAS_MM_REJ_CAUSE_NONE;
  bool combined = false;
};

struct GprsContext {
  Service::Value service = Service::KREG_STATUS_AT_NOT_REGISTERED;
  GprsUpdate::Value update = GprsUpdate::GPRS_STATUS_NOT_UPDATED;
  std::optional<std::uint32_t> locationArea;  // with the next, the routing area
  std::uint32_t routingArea = 0;
  std::optional<std::uint32_t> temporaryIdentity;
  std::optional<std::uint32_t> periodicSeconds;  // T3312
  ProcedureFailure::Value failure = ProcedureFailure::KNAS_MM_PROC_FAILURE_CAUSE_NONE;
  Reject::Value reject = Reject::KNAS_MM_REJ_CAUSE_NONE;
  GprsProcedure::Value procedure = GprsProcedure::KNAS_MM_REG_PROC_PROC_NONE;
};

struct EpsContext {
  Service::Value service = Service::KREG_STATUS_AT_NOT_REGISTERED;
  EpsUpdate::Value update = EpsUpdate::EPS_STATUS_NOT_UPDATED;
  std::vector<std::uint32_t> trackingAreas;
  std::uint32_t groupIdentity = 0, groupCode = 0;  // of the mobility management entity
  std::optional<std::uint32_t> temporaryIdentity;  // M-TMSI
  EpsReject::Value reject = EpsReject::EMM_CAUSE_NO_CAUSE;
  EpsProcedure::Value procedure = EpsProcedure::EMM_PROC_NO_PROC;
  std::optional<std::uint32_t> periodicSeconds;  // T3412
  bool voiceOverIms = false;

  bool registered() const { return temporaryIdentity.has_value() && service == Service::KREG_STATUS_NORMAL_SERVICE; }
};

struct Refusal;

class Registration final : public ForbiddenAreas {
 public:
  Registration(const Network& network, std::uint64_t seed);

  const MobilityContext& mobility() const { return mobility_; }
  const GprsContext& gprs() const { return gprs_; }
  const EpsContext& eps() const { return eps_; }
  const std::vector<std::uint32_t>& forbiddenLocationAreas() const { return forbiddenLocationAreas_; }
  const std::vector<std::uint32_t>& forbiddenTrackingAreas() const { return forbiddenTrackingAreas_; }
  // The mobile network code of the equivalent network, once a registration has named it.
  std::optional<std::uint32_t> equivalentNetwork() const { return equivalentNetwork_; }

  bool knownForbidden(CellIndex cell) const override;

  // The phone is in another cell now, from the same technology or another.
  void arrive(CellIndex cell, bool fromElsewhere, Milliseconds now, Facts& facts);
  // There is no cell at all.
  void loseService(Milliseconds now, Facts& facts);
  // A connection begins that no area update asked for.
  void requestService(Technology technology, Milliseconds now, Facts& facts);
  void endService(Milliseconds now, Facts& facts);

  // A procedure is waiting for a connection, or under way.
  bool busy() const { return procedure_ != Procedure::None; }
  // ... and it is one of the circuit services, a location update.
  bool circuitProcedure() const { return procedure_ == Procedure::LocationUpdate; }
  void addTo(Demand& demand) const;

  // connected: the phone has a connection in the technology of its cell.
  void advance(Milliseconds now, bool connected, Facts& facts);

  // Counts the EPS attaches; a new one means new bearers.
  unsigned epsAttaches() const { return epsAttaches_; }

 private:
  enum class Procedure : std::uint8_t {
    None,
    LocationUpdate,
    GprsAttach,
    RoutingAreaUpdate,
    EpsAttach,
    TrackingAreaUpdate,
    PeriodicAreaUpdate,
  };

  void plan(Milliseconds now, Facts& facts);
  void begin(Procedure procedure, Milliseconds now, Facts& facts);
  void finish(Milliseconds now, Facts& facts);
  void accept(Milliseconds now, Facts& facts);
  void refuse(const Refusal& refusal, Milliseconds now, Facts& facts);
  void touch(Procedure procedure, Milliseconds now, Facts& facts) const;
  std::uint32_t newTmsi();
  std::uint32_t newPacketTmsi();

  const Network& network_;
  Random random_;
  MobilityContext mobility_;
  GprsContext gprs_;
  EpsContext eps_;
  std::vector<std::uint32_t> forbiddenLocationAreas_;
  std::vector<std::uint32_t> forbiddenTrackingAreas_;
  std::optional<std::uint32_t> equivalentNetwork_;
  std::optional<CellIndex> cell_;
  bool fromElsewhere_ = false;  // the EPS, or the GPRS side, has not been told yet that the phone is back
  Procedure procedure_ = Procedure::None;
  Milliseconds ends_ = -1;  // of the procedure under way; -1 while it waits for a connection
  Milliseconds retryAt_ = -1;
  Milliseconds periodicAt_ = -1;
  unsigned epsAttaches_ = 0;
};

}  // namespace probeview::scenario
