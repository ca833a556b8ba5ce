// SPDX-License-Identifier: Apache-2.0
#include "scenario/family_reports.h"
#include "scenario/sim_card.h"

namespace probeview::scenario {

void report(const Phone& phone, KCellularMmCommonInfo& message) {
  const Registration& registration = phone.registration();
  message.setImsi(encodedImsi());
  if (const auto network = registration.equivalentNetwork()) {
    message.addEplmnList().setEncodedPlmn(encodedPlmn(*network));
  }
  // Areas refused because "no suitable cells" are in them count as forbidden for roaming (3GPP TS 24.008, 4.4.4.7).
  for (const std::uint32_t area : registration.forbiddenLocationAreas()) {
    KCellularLocationAreaId& forbidden = message.addRoamingFlaiList();
    forbidden.setEncodedPlmn(encodedPlmn());
    forbidden.setLac(area);
  }
  for (const std::uint32_t area : registration.forbiddenTrackingAreas()) {
    KCellularTrackingAreaId& forbidden = message.addRoamingFtaiList();
    forbidden.setEncodedPlmn(encodedPlmn());
    forbidden.setTac(area);
  }
}

void report(const Phone& phone, KCellularMmContext& message) {
  const MobilityContext& context = phone.registration().mobility();
  message.setRegStatus(context.service);
  message.setUpdateStatus(context.update);
  if (context.locationArea) {
    auto area = Shared<KCellularLocationAreaId>::make();
    area->setEncodedPlmn(encodedPlmn());
    area->setLac(*context.locationArea);
    message.setLai(std::move(area));
  }
  if (context.temporaryIdentity) message.setTmsi(*context.temporaryIdentity);
  if (context.periodicSeconds) message.setT3212DurS(*context.periodicSeconds);
  message.setProcFailureCause(context.failure);
  message.setRejectCause(context.reject);
  message.setIsCombinedProc(context.combined);
}

void report(const Phone& phone, KCellularGmmContext& message) {
  const GprsContext& context = phone.registration().gprs();
  message.setRegStatus(context.service);
  message.setUpdateStatus(context.update);
  if (context.locationArea) {
    auto area = Shared<RoutingAreaId>::make();
    area->setEncodedPlmn(encodedPlmn());
    area->setLac(*context.locationArea);
    area->setRac(context.routingArea);
    message.setRai(std::move(area));
  }
  if (context.temporaryIdentity) message.setPTmsi(*context.temporaryIdentity);
  if (context.periodicSeconds) message.setT3312DurS(*context.periodicSeconds);
  message.setProcFailureCause(context.failure);
  message.setRejectCause(context.reject);
  message.setRegProc(context.procedure);
}

void report(const Phone& phone, KCellularEmmContext& message) {
  const EpsContext& context = phone.registration().eps();
  message.setRegStatus(context.service);
  message.setUpdateStatus(context.update);
  message.setUeOpMode(KCellularEmmContext::UeOpMode::EPS_UE_OP_MODE_CSPS_MODE_1);
  for (const std::uint32_t area : context.trackingAreas) {
    KCellularTrackingAreaId& listed = message.addTaiList();
    listed.setEncodedPlmn(encodedPlmn());
    listed.setTac(area);
  }
  if (context.temporaryIdentity) {
    auto guti = Shared<Guti>::make();
    guti->setMmegi(context.groupIdentity);
    guti->setMmec(context.groupCode);
    guti->setMTmsi(*context.temporaryIdentity);
    message.setGuti(std::move(guti));
  }
  message.setRejectCause(context.reject);
  message.setRegProc(context.procedure);
  if (context.periodicSeconds) message.setT3412DurS(*context.periodicSeconds);
  if (!context.temporaryIdentity) return;  // the network says so when it accepts
  message.setIsImsVoiceSupported(context.voiceOverIms);
  message.setIsEmergBearerSupported(context.voiceOverIms);
}

void report(const Phone& phone, KCellularActivatedBearerContexts& message) {
  message.setBearerContextCount(static_cast<std::uint32_t>(phone.bearers().size()));
  for (const Bearer& bearer : phone.bearers()) {
    BearerContext& context = message.addBearerContexts();
    context.setCid(bearer.connection);
    context.setNsapi(bearer.accessPoint);
    context.setApn(bearer.name);
    context.setPdpType(bearer.type);
    context.setPdpAddr(bearer.address);
    context.setPrimaryDnsType(bearer.primaryDnsType);
    context.setPrimaryDnsAddr(bearer.primaryDns);
    context.setSecondaryDnsType(bearer.secondaryDnsType);
    context.setSecondaryDnsAddr(bearer.secondaryDns);
    context.setIsAddrIratMobile(bearer.keepsAddress);
  }
}

void report(const Phone& phone, KCellularSimCardFiles& message) {
  for (const SimFile& file : simFiles(phone.registration())) {
    ElementaryFile& listed = message.addEfList();
    listed.setEfId(file.identifier);
    listed.setContent(file.content);
  }
}

}  // namespace probeview::scenario
