// SPDX-License-Identifier: Apache-2.0
#include "scenario/phone.h"

#include <utility>

#include "scenario/selection.h"

namespace probeview::scenario {
namespace {

constexpr Milliseconds otherTechnologiesPeriod = 1000;
constexpr Milliseconds firstSearchAtMost = 5000;
constexpr double filterWeight = 0.5;           // filter coefficient 4 (3GPP TS 36.331, 5.5.3.2)
constexpr double slowMeasurementWeight = 0.7;  // what is measured rarely is worth more

// Why E-UTRA is left.
LteCause::Value causeOf(Manner manner) {
  switch (manner) {
    case Manner::Reselection:
      return LteCause::KLTE_RRC_CAUSE_NA;
    case Manner::Handover:
      return LteCause::KLTE_RRC_CAUSE_REL_SUCC_MOB_FROM_EUTRAN;
    case Manner::Redirection:
    case Manner::FallbackForVoice:
      return LteCause::KLTE_RRC_CAUSE_REL_OTHER;
  }
  return LteCause::KLTE_RRC_CAUSE_NA;
}

}  // namespace

Phone::Phone(World world, std::uint64_t seed)
    : world_(std::move(world)),
      surroundings_(world_.network, seed),
      traffic_(world_.habits, seed),
      registration_(world_.network, seed),
      bearers_(seed),
      lte_(world_.network),
      umts_(world_.network),
      gsm_(world_.network),
      random_(seed, 5) {}

std::optional<CellIndex> Phone::servingCell() const {
  if (!technology_) return std::nullopt;
  switch (*technology_) {
    case Technology::Gsm:
      return gsm().serving;
    case Technology::Umts:
      return umts().serving;
    case Technology::Lte:
      return lte().serving;
  }
  return std::nullopt;
}

bool Phone::connected() const {
  if (!technology_) return false;
  switch (*technology_) {
    case Technology::Gsm:
      return gsm().connection == GsmConnection::Dedicated;
    case Technology::Umts:
      return umts().connected();
    case Technology::Lte:
      return lte().connected();
  }
  return false;
}

void Phone::measure() {
  measured_ = now_ % measurementPeriod == 0;
  if (!measured_) return;
  for (const Technology technology : {Technology::Gsm, Technology::Umts, Technology::Lte}) {
    const Point where = world_.route.position();
    if (technology == technology_) {
      surroundings_.measure(technology, where, filterWeight);
    } else if (firstSearch_ || now_ % otherTechnologiesPeriod == 0) {
      surroundings_.measure(technology, where, slowMeasurementWeight);
    }
  }
}

Circumstances Phone::circumstances() {
  Circumstances c{.now = now_,
                  .measured = measured_,
                  .firstSearch = firstSearch_,
                  .network = world_.network,
                  .surroundings = surroundings_,
                  .forbidden = registration_,
                  .demand = {},
                  .mayLeave = !registration_.busy(),
                  .voiceOverIms = registration_.eps().voiceOverIms,
                  .facts = facts_,
                  .random = random_};
  traffic_.addTo(c.demand);
  registration_.addTo(c.demand);
  if (technology_ == Technology::Gsm) {
    // In GSM, packets and packet registration need no connection; only calls and location updates do.
    const bool located = registration_.mobility().update == MobilityUpdate::STATUS_UPDATED;
    c.demand.signalling = c.demand.signalling && registration_.circuitProcedure();
    c.demand.registering = c.demand.signalling;
    if (firstSearch_) c.mayLeave = located;
  }
  return c;
}

void Phone::powerOn() {
  facts_.learn(Fact::SimFiles, now_);
  facts_.learn(Fact::MobilityCommon, now_);
  facts_.learn(Fact::MobilityContext, now_);
  facts_.learn(Fact::GprsContext, now_);
  facts_.learn(Fact::EpsContext, now_);
  facts_.learn(Fact::Bearers, now_);
  search();
}

// Any cell will do at first, GSM before the others because it answers soonest; later the best technology.
void Phone::search() {
  const Circumstances c = circumstances();
  const auto lte = [&] { return strongestAllowed(c, Technology::Lte, LteSelection::qRxLevMin + 2); };
  const auto umts = [&] { return strongestAllowed(c, Technology::Umts, UmtsSelection::qRxLevMin + 2); };
  const auto gsm = [&] { return strongestAllowed(c, Technology::Gsm, GsmSelection::rxLevAccessMin + 2); };
  std::optional<CellIndex> found;
  if (firstSearch_) {
    found = gsm();
    if (!found) found = umts();
    if (!found) found = lte();
  } else {
    found = lte();
    if (!found) found = umts();
    if (!found) found = gsm();
  }
  if (found) go({*found, Manner::Reselection});
}

void Phone::leave(LteCause::Value cause) {
  if (!technology_) return;
  const Circumstances c = circumstances();
  switch (*technology_) {
    case Technology::Gsm:
      gsm_.leave(c);
      break;
    case Technology::Umts:
      umts_.leave(c);
      break;
    case Technology::Lte:
      lte_.leave(cause, c);
      break;
  }
  technology_.reset();
}

void Phone::go(const Departure& departure) {
  leave(causeOf(departure.manner));
  technology_ = world_.network.technologyOf(departure.cell);
  const Circumstances c = circumstances();
  switch (*technology_) {
    case Technology::Gsm:
      gsm_.enter(departure.cell, departure.manner, c);
      break;
    case Technology::Umts:
      umts_.enter(departure.cell, departure.manner, c);
      break;
    case Technology::Lte:
      lte_.enter(departure.cell, departure.manner, c);
      break;
  }
  lastCell_ = departure.cell;
  registration_.arrive(departure.cell, true, now_, facts_);
}

void Phone::loseService() {
  leave(LteCause::KLTE_RRC_CAUSE_NO_SERVICE);
  lastCell_.reset();
  traffic_.interrupt(now_);
  registration_.loseService(now_, facts_);
}

void Phone::advance() {
  now_ += stepTime;
  if (now_ > 0) world_.route.advance(static_cast<double>(stepTime) / 1000.0);
  measure();
  if (now_ == 0) {
    powerOn();
    return;
  }
  if (!technology_) {
    traffic_.advance(now_, false);
    if (measured_ && now_ % otherTechnologiesPeriod == 0) search();
    bearers_.advance(now_, registration_.epsAttaches(), false, false, facts_);
    return;
  }
  // A phone that has just been switched on is left alone until it has registered.
  if (!firstSearch_) traffic_.advance(now_, true);

  const Circumstances c = circumstances();
  std::optional<Departure> departure;
  bool lost = false;
  switch (*technology_) {
    case Technology::Gsm:
      departure = gsm_.advance(c);
      lost = gsm_.lost();
      break;
    case Technology::Umts:
      departure = umts_.advance(c);
      lost = umts_.lost();
      break;
    case Technology::Lte:
      departure = lte_.advance(c);
      lost = lte_.lost();
      break;
  }
  if (departure) {
    go(*departure);
  } else if (lost) {
    loseService();
  } else if (servingCell() != lastCell_) {
    lastCell_ = servingCell();
    registration_.arrive(*lastCell_, false, now_, facts_);
  }

  const bool nowConnected = connected();
  if (nowConnected != wasConnected_) {
    wasConnected_ = nowConnected;
    if (nowConnected) {
      registration_.requestService(*technology_, now_, facts_);
    } else {
      registration_.endService(now_, facts_);
    }
  }
  registration_.advance(now_, nowConnected, facts_);

  if (registration_.epsAttaches() != attaches_) {
    attaches_ = registration_.epsAttaches();
    firstSearch_ = false;
    traffic_.fetch(now_);
  }
  if (now_ >= firstSearchAtMost) firstSearch_ = false;
  bearers_.advance(now_, registration_.epsAttaches(), technology_.has_value(),
                   technology_ == Technology::Lte && registration_.eps().voiceOverIms, facts_);
}

}  // namespace probeview::scenario
