// SPDX-License-Identifier: Apache-2.0
//
// Mobility management: where the phone is registered, with which temporary identities, and what the network answered
// (3GPP TS 24.008 for circuit and packet services, 24.301 for EPS).
#pragma once

#include <cstdint>
#include <optional>
#include <vector>

#include "scenario/facts.h"
#include "scenario/modem.h"
#include "scenario/network.h"
#include "scenario/random.h"

namespace probeview::scenario {

// The numbers of these enumerations are those of the metric service.
enum class Service : std::int32_t {
  Normal = 0,
  RegistrationFailure = 1,
  Limited = 2,
  None = 3,
  NotRegistered = 4,
  RegistrationInProgress = 11,
};
enum class LocationUpdate : std::int32_t { Updated = 1, NotUpdated = 2, RoamingNotAllowed = 3 };
enum class PacketUpdate : std::int32_t { Updated = 0, NotUpdated = 1, RoamingNotAllowed = 2 };  // GPRS and EPS
enum class ProcedureFailure : std::int32_t { None = 0, LowerLayers = 1, Rejected = 11 };
enum class Reject : std::int32_t {
  None = 0,
  NoSuitableCellInLocationArea = 15,  // of a tracking area, for EPS
  NetworkFailure = 17,
  Congestion = 22,
};
enum class GprsProcedure : std::int32_t { Attach = 1, RoutingAreaUpdate = 2, ServiceRequest = 6, None = 10 };
enum class EpsProcedure : std::int32_t {
  None = 0,
  AttachCombined = 2,
  AreaUpdateCombined = 5,
  PeriodicAreaUpdate = 6,
  ServiceRequest = 7,
};

struct MobilityContext {
  Service service = Service::NotRegistered;
  LocationUpdate update = LocationUpdate::NotUpdated;
  std::optional<std::uint32_t> locationArea;
  std::optional<std::uint32_t> temporaryIdentity;
  std::optional<std::uint32_t> periodicSeconds;  // T3212
  ProcedureFailure failure = ProcedureFailure::None;
  Reject reject = Reject::None;
  bool combined = false;
};

struct GprsContext {
  Service service = Service::NotRegistered;
  PacketUpdate update = PacketUpdate::NotUpdated;
  std::optional<std::uint32_t> locationArea;  // with the next, the routing area
  std::uint32_t routingArea = 0;
  std::optional<std::uint32_t> temporaryIdentity;
  std::optional<std::uint32_t> periodicSeconds;  // T3312
  ProcedureFailure failure = ProcedureFailure::None;
  Reject reject = Reject::None;
  GprsProcedure procedure = GprsProcedure::None;
};

struct EpsContext {
  Service service = Service::NotRegistered;
  PacketUpdate update = PacketUpdate::NotUpdated;
  std::vector<std::uint32_t> trackingAreas;
  std::uint32_t groupIdentity = 0, groupCode = 0;  // of the mobility management entity
  std::optional<std::uint32_t> temporaryIdentity;  // M-TMSI
  Reject reject = Reject::None;
  EpsProcedure procedure = EpsProcedure::None;
  std::optional<std::uint32_t> periodicSeconds;  // T3412
  bool voiceOverIms = false;

  bool registered() const { return temporaryIdentity.has_value() && service == Service::Normal; }
};

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
  void refuse(Reject cause, Milliseconds now, Facts& facts);
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
