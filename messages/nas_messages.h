// SPDX-License-Identifier: Apache-2.0
//
// NAS contexts, bearers and SIM card files. IMSI, TMSI, GUTI, addresses and SIM files are personal data.
#pragma once

#include "messages/quantities.h"
#include "messages/runtime/field_table.h"
#include "messages/viewer_notes.h"

namespace probeview {

// Tables read best in columns.
// clang-format off

class Plmn final : public PBCodable {
  PB_MESSAGE(Plmn, "A PLMN in three bytes, 3GPP TS 24.008, 10.5.1.3.")
  PB_OBJECT(1, "encoded_plmn", encodedPlmn, EncodedPlmn, bytes, "PLMN in three bytes of BCD digits (3GPP TS 24.008, 10.5.1.3)");
};

class KCellularLocationAreaId final : public PBCodable {
  PB_MESSAGE(KCellularLocationAreaId, "A location area: PLMN in three bytes and LAC, 3GPP TS 24.008, 10.5.1.3.")
  PB_OBJECT(1, "encoded_plmn", encodedPlmn, EncodedPlmn, bytes,  "PLMN in three bytes of BCD digits (3GPP TS 24.008, 10.5.1.3)");
  PB_FIELD (2, "lac",          lac,         Lac,         uint32, locationAreaCode, "Location area code");
};

class KCellularTrackingAreaId final : public PBCodable {
  PB_MESSAGE(KCellularTrackingAreaId, "A tracking area: PLMN in three bytes and TAC, 3GPP TS 24.301, 9.9.3.32.")
  PB_OBJECT(1, "encoded_plmn", encodedPlmn, EncodedPlmn, bytes,  "PLMN in three bytes of BCD digits (3GPP TS 24.008, 10.5.1.3)");
  PB_FIELD (2, "tac",          tac,         Tac,         uint32, trackingAreaCode, "Tracking area code");
};

class KCellularMmCommonInfo final : public PBCodable {
  PB_MESSAGE(KCellularMmCommonInfo,
             "What all mobility management shares: the IMSI, equivalent PLMNs, forbidden location and tracking areas.",
             "none")
  PB_FIELD (1, "timestamp",          timestamp,        Timestamp, uint64, timestamp, "Time of the values", viewer::localTime);
  PB_OBJECT(2, "imsi",               imsi,             Imsi,      bytes,  "IMSI as on the SIM", personal);
  PB_LIST  (3, "eplmn_list",         eplmnLists,       EplmnLists, eplmnList, EplmnList, repeated<message<Plmn>>, "Equivalent PLMNs");
  PB_LIST  (4, "roaming_flai_list",  roamingFlaiLists, RoamingFlaiLists, roamingFlaiList, RoamingFlaiList, repeated<message<KCellularLocationAreaId>>,
               "Location areas forbidden for roaming");
  PB_LIST  (5, "reg_prov_flai_list", regProvFlaiLists, RegProvFlaiLists, regProvFlaiList, RegProvFlaiList, repeated<message<KCellularLocationAreaId>>,
               "Location areas forbidden for regional provision of service");
  PB_LIST  (6, "roaming_ftai_list",  roamingFtaiLists, RoamingFtaiLists, roamingFtaiList, RoamingFtaiList, repeated<message<KCellularTrackingAreaId>>,
               "Tracking areas forbidden for roaming");
  PB_LIST  (7, "reg_prov_ftai_list", regProvFtaiLists, RegProvFtaiLists, regProvFtaiList, RegProvFtaiList, repeated<message<KCellularTrackingAreaId>>,
               "Tracking areas forbidden for regional provision of service");
};

class KCellularMmContext final : public PBCodable {
  PB_MESSAGE(KCellularMmContext,
             "Mobility management of the circuit-switched domain, 3GPP TS 24.008, 4.",
             "\"UMTS NAS MM\" and \"GSM NAS MM\"")

 public:
  PB_ENUMERATION(RegStatus,
    KREG_STATUS_NORMAL_SERVICE = 0,
    KREG_STATUS_REGISTRATION_FAILURE = 1,
    KREG_STATUS_LIMITED_SERVICE = 2,
    KREG_STATUS_NO_SERVICE = 3,
    KREG_STATUS_AT_NOT_REGISTERED = 4,
    KREG_STATUS_REGISTRATION_SERVICE_DISABLED = 5,
    KREG_STATUS_SERVICE_DETACHED = 6,
    KREG_STATUS_SERVICE_ACTIVATED = 7,
    KREG_STATUS_EMERGENCY_SERVICE = 8,
    KREG_STATUS_EMERGENCY_LIMITED = 9,
    KREG_STATUS_REGISTERED_SMS_ONLY = 10,
    KREG_STATUS_REGISTRATION_IN_PROGRESS = 11,
    KREG_STATUS_POWER_OFF_NO_SERVICE = 12);

  PB_ENUMERATION(UpdateStatus,
    STATUS_UPDATED = 1,
    STATUS_NOT_UPDATED = 2,
    STATUS_ROAMING_NOT_ALLOWED = 3,
    STATUS_UPDATE_DISABLED = 4);

  PB_ENUMERATION(ProcFailureCause,
    KNAS_MM_PROC_FAILURE_CAUSE_NONE = 0,
    KNAS_MM_PROC_FAILURE_CAUSE_LOWER_LAYER_FAILURE = 1,
    KNAS_MM_PROC_FAILURE_CAUSE_ACCESS_BARRED = 2,
    KNAS_MM_PROC_FAILURE_CAUSE_LIMITED_SERVICE = 3,
    KNAS_MM_PROC_FAILURE_CAUSE_PAGE_NOT_EXPECTED = 4,
    KNAS_MM_PROC_FAILURE_CAUSE_T3210_EXPIRY = 5,
    KNAS_MM_PROC_FAILURE_CAUSE_T3240_EXPIRY = 6,
    KNAS_MM_PROC_FAILURE_CAUSE_DETACH_INITIATED = 7,
    KNAS_MM_PROC_FAILURE_CAUSE_PS_SUSPENDED = 8,
    KNAS_MM_PROC_FAILURE_CAUSE_SERV_REQ_THROTTLING = 9,
    KNAS_MM_PROC_FAILURE_CAUSE_T3317_EXPIRY = 10,
    KNAS_MM_PROC_FAILURE_CAUSE_REJECTED_BY_NW = 11,
    KNAS_MM_PROC_FAILURE_CAUSE_NW_AUTH_REJ = 12,
    KNAS_MM_PROC_FAILURE_CAUSE_INVALID_IE = 13,
    KNAS_MM_PROC_FAILURE_CAUSE_TIMEOUT = 14,
    KNAS_MM_PROC_FAILURE_CAUSE_OTHER = 15);

  PB_ENUMERATION(RejectCause,
    KNAS_MM_REJ_CAUSE_NONE = 0,
    KNAS_MM_REJ_CAUSE_IMSI_UNKNOWN = 2,
    KNAS_MM_REJ_CAUSE_ILLEGAL_MS = 3,
    KNAS_MM_REJ_CAUSE_IMSI_UNKNOWN_IN_VLR = 4,
    KNAS_MM_REJ_CAUSE_IMEI_NOT_ACCEPTED = 5,
    KNAS_MM_REJ_CAUSE_ILLEGAL_ME = 6,
    KNAS_MM_REJ_CAUSE_GPRS_SERVICES_NOT_ALLOWED = 7,
    KNAS_MM_REJ_CAUSE_GPRS_AND_NON_GPRS_SERVICES_NOT_ALLOWED = 8,
    KNAS_MM_REJ_CAUSE_MS_IDENTITY_NOT_DERIVED_BY_NW = 9,
    KNAS_MM_REJ_CAUSE_IMPLICITLY_DET = 10,
    KNAS_MM_REJ_CAUSE_PLMN_NOT_ALLOWED = 11,
    KNAS_MM_REJ_CAUSE_LA_NOT_ALLOWED = 12,
    KNAS_MM_REJ_CAUSE_ROM_NOT_ALLOWED_IN_LA = 13,
    KNAS_MM_REJ_CAUSE_GPRS_NOT_ALLOWED_IN_PLMN = 14,
    KNAS_MM_REJ_CAUSE_NO_SUITABLE_CELL_IN_LA = 15,
    KNAS_MM_REJ_CAUSE_MSC_OUT_OF_REACH = 16,
    KNAS_MM_REJ_CAUSE_NW_FAILURE = 17,
    KNAS_MM_REJ_CAUSE_MAC_FAILURE = 20,
    KNAS_MM_REJ_CAUSE_SYNCH_FAILURE = 21,
    KNAS_MM_REJ_CAUSE_CONGESTION = 22,
    KNAS_MM_REJ_CAUSE_GSM_AUTH_UNACCEPTABLE = 23,
    KNAS_MM_REJ_CAUSE_CSG_NOT_AUTHORIZED = 25,
    KNAS_MM_REJ_CAUSE_SERVICE_OPTION_NOT_SUPPORTED = 32,
    KNAS_MM_REJ_CAUSE_REQ_SERVICE_OPTION_NOT_SUBSCRIBED = 33,
    KNAS_MM_REJ_CAUSE_SERVICE_OPTION_TEMPORARILY_OUT_OF_ORDER = 34,
    KNAS_MM_REJ_CAUSE_CALL_NOT_IDENTIFIED = 38,
    KNAS_MM_REJ_CAUSE_NO_PDP_CONTEXT_ACTIVATED = 40,
    KNAS_MM_REJ_CAUSE_RETRY_UPON_ENTRY_TO_NEW_CELL = 63,
    KNAS_MM_REJ_CAUSE_SEMANTICALLY_INCORRECT_MSG = 95,
    KNAS_MM_REJ_CAUSE_INVALID_MANDATORY_INFO = 96,
    KNAS_MM_REJ_CAUSE_MSG_TYPE_NOT_IMPL = 97,
    KNAS_MM_REJ_CAUSE_MSG_TYPE_NOT_COMPATIBLE = 98,
    KNAS_MM_REJ_CAUSE_INFO_ELEMENT_NOT_IMPL = 99,
    KNAS_MM_REJ_CAUSE_IE_ERROR = 100,
    KNAS_MM_REJ_CAUSE_MSG_NOT_COMPATIBLE = 101,
    KNAS_MM_REJ_CAUSE_PROTOCOL_ERROR_UNSPECIFIED = 111);

  PB_FIELD (1, "timestamp",          timestamp,        Timestamp,        uint64,                           timestamp,         "Time of the values", viewer::localTime);
  PB_FIELD (2, "reg_status",         regStatus,        RegStatus,        enumeration<RegStatus>,           none,              "Registration status");
  PB_FIELD (3, "update_status",      updateStatus,     UpdateStatus,     enumeration<UpdateStatus>,        none,              "Update status");
  PB_OBJECT(4, "lai",                lai,              Lai,              message<KCellularLocationAreaId>, "Location area");
  PB_FIELD (5, "tmsi",               tmsi,             Tmsi,             uint32,                           temporaryIdentity, "TMSI", personal);
  PB_FIELD (6, "t3212_dur_s",        t3212DurS,        T3212DurS,        uint32,                           seconds,           "T3212 (3GPP TS 24.008, 11.2)");
  PB_FIELD (7, "proc_failure_cause", procFailureCause, ProcFailureCause, enumeration<ProcFailureCause>,    none,              "Why the last procedure failed");
  PB_FIELD (8, "reject_cause",       rejectCause,      RejectCause,      enumeration<RejectCause>,         none,              "Cause with which the network rejected");
  PB_FIELD (9, "is_combined_proc",   isCombinedProc,   IsCombinedProc,   boolean,                          none,              "Whether the procedure was a combined one");
};

class RoutingAreaId final : public PBCodable {
  PB_MESSAGE(RoutingAreaId, "A routing area: PLMN in three bytes, LAC and RAC, 3GPP TS 24.008, 10.5.5.15.")
  PB_OBJECT(1, "encoded_plmn", encodedPlmn, EncodedPlmn, bytes,  "PLMN in three bytes of BCD digits (3GPP TS 24.008, 10.5.1.3)");
  PB_FIELD (3, "lac",          lac,         Lac,         uint32, locationAreaCode, "Location area code");
  PB_FIELD (4, "rac",          rac,         Rac,         uint32, routingAreaCode,  "Routing area code");
};

class KCellularGmmContext final : public PBCodable {
  PB_MESSAGE(KCellularGmmContext,
             "Mobility management of the packet-switched domain, 3GPP TS 24.008, 4.7.",
             "\"UMTS NAS GMM\" and \"GSM NAS GMM\"")

 public:
  PB_ENUMERATION(RegProc,
    KNAS_MM_REG_PROC_LOCATION_AREA_UPDATE = 0,
    KNAS_MM_REG_PROC_ATTACH = 1,
    KNAS_MM_REG_PROC_ROUTING_AREA_UPDATE = 2,
    KNAS_MM_REG_PROC_COMBINED_RAU = 3,
    KNAS_MM_REG_PROC_COMBINED_ATTACH = 4,
    KNAS_MM_REG_PROC_NW_DETACH = 5,
    KNAS_MM_REG_PROC_SERVICE_REQ = 6,
    KNAS_MM_REG_PROC_NW_ABORT = 7,
    KNAS_MM_REG_PROC_TRACKING_AREA_UPDATE = 8,
    KNAS_MM_REG_PROC_COMBINED_TAU = 9,
    KNAS_MM_REG_PROC_PROC_NONE = 10);

  PB_ENUMERATION(UpdateStatus,
    GPRS_STATUS_UPDATED = 0,
    GPRS_STATUS_NOT_UPDATED = 1,
    GPRS_STATUS_ROAMING_NOT_ALLOWED = 2);

  PB_FIELD (1, "timestamp",          timestamp,        Timestamp,        uint64,                                            timestamp,         "Time of the values", viewer::localTime);
  PB_FIELD (2, "reg_status",         regStatus,        RegStatus,        enumeration<KCellularMmContext::RegStatus>,        none,              "Registration status");
  PB_FIELD (3, "update_status",      updateStatus,     UpdateStatus,     enumeration<UpdateStatus>,                         none,              "Update status");
  PB_OBJECT(4, "rai",                rai,              Rai,              message<RoutingAreaId>,                            "Routing area");
  PB_FIELD (5, "p_tmsi",             pTmsi,            PTmsi,            uint32,                                            temporaryIdentity, "P-TMSI", personal);
  PB_FIELD (6, "t3312_dur_s",        t3312DurS,        T3312DurS,        uint32,                                            seconds,           "T3312 (3GPP TS 24.008, 11.2)");
  PB_FIELD (7, "proc_failure_cause", procFailureCause, ProcFailureCause, enumeration<KCellularMmContext::ProcFailureCause>, none,              "Why the last procedure failed");
  PB_FIELD (8, "reject_cause",       rejectCause,      RejectCause,      enumeration<KCellularMmContext::RejectCause>,      none,              "Cause with which the network rejected");
  PB_FIELD (9, "reg_proc",           regProc,          RegProc,          enumeration<RegProc>,                              none,              "Registration procedure under way");
};

class Guti final : public PBCodable {
  PB_MESSAGE(Guti, "The part of the GUTI that the MME assigns, 3GPP TS 23.003, 2.8.")
  PB_FIELD(1, "mmegi",  mmegi, Mmegi, uint32, mmeGroup,             "MME group identity");
  PB_FIELD(2, "mmec",   mmec,  Mmec,  uint32, mmeCode,              "MME code");
  PB_FIELD(3, "m_tmsi", mTmsi, MTmsi, uint32, mmeTemporaryIdentity, "M-TMSI", personal);
};

class KCellularEmmContext final : public PBCodable {
  PB_MESSAGE(KCellularEmmContext, "EPS mobility management, 3GPP TS 24.301, 5.", "\"LTE NAS\"")

 public:
  PB_ENUMERATION(UpdateStatus,
    EPS_STATUS_UPDATED = 0,
    EPS_STATUS_NOT_UPDATED = 1,
    EPS_STATUS_ROAMING_NOT_ALLOWED = 2);

  PB_ENUMERATION(UeOpMode,
    EPS_UE_OP_MODE_PS_MODE_1 = 0,
    EPS_UE_OP_MODE_PS_MODE_2 = 1,
    EPS_UE_OP_MODE_CSPS_MODE_1 = 2,
    EPS_UE_OP_MODE_CSPS_MODE_2 = 3);

  PB_ENUMERATION(RejectCause,
    EMM_CAUSE_NO_CAUSE = 0,
    EMM_CAUSE_IMSI_UNKNOWN_IN_HSS = 2,
    EMM_CAUSE_ILLEGAL_UE = 3,
    EMM_CAUSE_IMEI_NOT_ACCEPTED = 5,
    EMM_CAUSE_ILLEGAL_ME = 6,
    EMM_CAUSE_EPS_SERVICES_NOT_ALLOWED = 7,
    EMM_CAUSE_EPS_SERVICES_AND_NON_EPS_SERVICES_NOT_ALLOWED = 8,
    EMM_CAUSE_UE_IDENTITY_CANNOT_BE_DERIVED_BY_NETWORK = 9,
    EMM_CAUSE_IMPLICITLY_DETACHED = 10,
    EMM_CAUSE_PLMN_NOT_ALLOWED = 11,
    EMM_CAUSE_TRACKING_AREA_NOT_ALLOWED = 12,
    EMM_CAUSE_ROAMING_NOT_ALLOWED_IN_THIS_TRACKING_AREA = 13,
    EMM_CAUSE_EPS_SERVICES_NOT_ALLOWED_IN_THIS_PLMN = 14,
    EMM_CAUSE_NO_SUITABLE_CELLS_IN_TRACKING_AREA = 15,
    EMM_CAUSE_MSC_TEMPORARILY_NOT_REACHABLE = 16,
    EMM_CAUSE_NETWORK_FAILURE = 17,
    EMM_CAUSE_CS_DOMAIN_NOT_AVAILABLE = 18,
    EMM_CAUSE_ESM_FAILURE = 19,
    EMM_CAUSE_MAC_FAILURE = 20,
    EMM_CAUSE_SYNCH_FAILURE = 21,
    EMM_CAUSE_CONGESTION = 22,
    EMM_CAUSE_UE_SECURITY_CAPABILITY_MISMATCH = 23,
    EMM_CAUSE_SECURITY_MODE_REJECTED_UNSPECIFIED = 24,
    EMM_CAUSE_NOT_AUTHORIZED_FOR_THIS_CSG = 25,
    EMM_CAUSE_NON_EPS_AUTHENTICATION_UNACCEPTABLE = 26,
    EMM_CAUSE_REQUESTED_SERVICE_OPTION_NOT_AUTHORIZED_IN_THIS_PLMN = 35,
    EMM_CAUSE_CS_DOMAIN_TEMPORARILY_NOT_AVAILABLE = 39,
    EMM_CAUSE_NO_EPS_BEARER_CONTEXT_ACTIVATED = 40,
    EMM_CAUSE_SEMANTICALLY_INCORRECT_MESSAGE = 95,
    EMM_CAUSE_INVALID_MANDATORY_INFORMATION = 96,
    EMM_CAUSE_MESSAGE_TYPE_NON_EXISTENT_OR_NOT_IMPLEMENTED = 97,
    EMM_CAUSE_MESSAGE_TYPE_NOT_COMPATIBLE_WITH_PROTOCOL_STATE = 98,
    EMM_CAUSE_IE_NON_EXISTENT_OR_NOT_IMPLEMENTED = 99,
    EMM_CAUSE_CONDITIONAL_IE_ERROR = 100,
    EMM_CAUSE_MESSAGE_NOT_COMPATIBLE_WITH_PROTOCOL_STATE = 101,
    EMM_CAUSE_PROTOCOL_ERROR_UNSPECIFIED = 111);

  PB_ENUMERATION(RegProc,
    EMM_PROC_NO_PROC = 0,
    EMM_PROC_ATTACH = 1,
    EMM_PROC_ATTACH_COMB = 2,
    EMM_PROC_EMERGENCY_ATTACH = 3,
    EMM_PROC_TAU = 4,
    EMM_PROC_TAU_COMB = 5,
    EMM_PROC_PERIODIC_TAU = 6,
    EMM_PROC_SERV_REQ = 7);

  PB_FIELD ( 1, "timestamp",                 timestamp,              Timestamp,              uint64,
                timestamp, "Time of the values", viewer::localTime);
  PB_FIELD ( 2, "reg_status",                regStatus,              RegStatus,              enumeration<KCellularMmContext::RegStatus>,
                none, "Registration status");
  PB_FIELD ( 3, "update_status",             updateStatus,           UpdateStatus,           enumeration<UpdateStatus>,
                none, "Update status");
  PB_FIELD ( 4, "ue_op_mode",                ueOpMode,               UeOpMode,               enumeration<UeOpMode>,
                none, "UE mode of operation (3GPP TS 24.301, 4.3)");
  PB_LIST  ( 5, "tai_list",                  taiLists,               TaiLists, taiList, TaiList, repeated<message<KCellularTrackingAreaId>>,
                "Tracking areas of the registration", viewer::listText);
  PB_OBJECT( 6, "guti",                      guti,                   Guti,                   message<Guti>,
                "GUTI", personal, viewer::dictionaryText);
  PB_FIELD ( 7, "reject_cause",              rejectCause,            RejectCause,            enumeration<RejectCause>,
                none, "Cause with which the network rejected");
  PB_FIELD ( 8, "reg_proc",                  regProc,                RegProc,                enumeration<RegProc>,
                none, "Registration procedure under way");
  PB_FIELD ( 9, "t3412_dur_s",               t3412DurS,              T3412DurS,              uint32,
                seconds, "T3412 (3GPP TS 24.301, 10.2)");
  PB_FIELD (10, "is_ims_voice_supported",    isImsVoiceSupported,    IsImsVoiceSupported,    boolean,
                none, "Whether IMS voice over PS is supported");
  PB_FIELD (11, "is_emerg_bearer_supported", isEmergBearerSupported, IsEmergBearerSupported, boolean,
                none, "Whether emergency bearers are supported");
};

class BearerContext final : public PBCodable {
  PB_MESSAGE(BearerContext, "One active PDP or EPS bearer context; addresses as raw bytes.")

 public:
  PB_ENUMERATION(PdpType,
    PDP_TYPE_IPv4 = 0,
    PDP_TYPE_IPv6 = 1,
    PDP_TYPE_IPv4v6 = 2,
    PDP_TYPE_IPv4_PDN = 3,
    PDP_TYPE_IPv6_PDN = 4,
    PDP_TYPE_IPv4v6_PDN = 5,
    PDP_TYPE_PPP = 6,
    PDP_TYPE_NONE = 7);

  PB_FIELD ( 1, "cid",                 cid,              Cid,              uint32,               none, "Context identifier");
  PB_FIELD ( 2, "nsapi",               nsapi,            Nsapi,            uint32,               none, "NSAPI, 5 to 15 (3GPP TS 24.008, 10.5.6.2)");
  PB_OBJECT( 3, "apn",                 apn,              Apn,              string,               "Access point name");
  PB_FIELD ( 4, "pdp_type",            pdpType,          PdpType,          enumeration<PdpType>, none, "Type of the address");
  PB_OBJECT( 5, "pdp_addr",            pdpAddr,          PdpAddr,          bytes,                "Address: 4 bytes IPv4, 16 bytes IPv6, 20 bytes both", personal);
  PB_FIELD ( 6, "primary_dns_type",    primaryDnsType,   PrimaryDnsType,   enumeration<PdpType>, none, "Type of the primary DNS address");
  PB_OBJECT( 7, "primary_dns_addr",    primaryDnsAddr,   PrimaryDnsAddr,   bytes,                "Primary DNS address, 4 or 16 bytes", personal);
  PB_FIELD ( 8, "secondary_dns_type",  secondaryDnsType, SecondaryDnsType, enumeration<PdpType>, none, "Type of the secondary DNS address");
  PB_OBJECT( 9, "secondary_dns_addr",  secondaryDnsAddr, SecondaryDnsAddr, bytes,                "Secondary DNS address, 4 or 16 bytes", personal);
  PB_FIELD (10, "is_addr_irat_mobile", isAddrIratMobile, IsAddrIratMobile, boolean,              none, "Whether the address stays when the technology changes");
};

class KCellularActivatedBearerContexts final : public PBCodable {
  PB_MESSAGE(KCellularActivatedBearerContexts,
             "The active bearers. The count is a field of its own and need not be the number of elements.",
             "\"LTE Active Bearers\", \"UMTS Active Bearers\" and \"GSM Active Bearers\"")
  PB_FIELD(1, "timestamp",            timestamp,          Timestamp,          uint64, timestamp, "Time of the values", viewer::localTime);
  PB_FIELD(2, "bearer_context_count", bearerContextCount, BearerContextCount, uint32, none,      "Number of bearers; need not be that of the entries");
  PB_LIST (3, "bearer_contexts",      bearerContexts,     BearerContexts, bearerContexts, BearerContexts, repeated<message<BearerContext>>,
              "One entry per bearer", viewer::pageEntriesGetTimestamp);
};

class ElementaryFile final : public PBCodable {
  PB_MESSAGE(ElementaryFile, "One elementary file as it was read, 3GPP TS 31.102, 4.")
  PB_FIELD (1, "ef_id",   efId,    EfId,    uint32, simFileIdentifier, "File identifier, such as 0x6F07");
  PB_OBJECT(2, "content", content, Content, bytes,  "Content of the file as it was read", personal);
};

class KCellularSimCardFiles final : public PBCodable {
  PB_MESSAGE(KCellularSimCardFiles, "Elementary files of the SIM card.", "\"Device Info SIM Files\"")
  PB_FIELD(1, "timestamp", timestamp, Timestamp, uint64, timestamp, "Time of the values", viewer::localTime);
  PB_LIST (2, "ef_list",   efLists,   EfLists, efList, EfList, repeated<message<ElementaryFile>>, "One entry per elementary file");
};

// All of them, in the order of the registry.
#define NAS_MESSAGES(EACH) \
  EACH(KCellularMmCommonInfo) \
  EACH(Plmn) \
  EACH(KCellularLocationAreaId) \
  EACH(KCellularTrackingAreaId) \
  EACH(KCellularMmContext) \
  EACH(KCellularGmmContext) \
  EACH(RoutingAreaId) \
  EACH(KCellularEmmContext) \
  EACH(Guti) \
  EACH(KCellularActivatedBearerContexts) \
  EACH(BearerContext) \
  EACH(KCellularSimCardFiles) \
  EACH(ElementaryFile)

// clang-format on

}  // namespace probeview
