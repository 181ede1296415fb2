// The one list of every function the module reaches in the run-time loaded
// libraries (management library, HBA API, QoS library), as X-macro tables.
//
// Contract: RM_Api.h turns these tables into prototypes and the runtime loader
// turns them into forwarders; nothing else spells a signature.  A line gives
// the group (which library slot and lookup rule), the return type, the name,
// the failure value a forwarder answers when the function is unavailable, and
// the parameter types.  Record parameters whose layout the module does not fix
// are "void* record, HBA_UINT32* size" for reads (size in bytes, in and out)
// and "const void* record, HBA_UINT32 size" for writes.
#pragma once

#include "access/RM_Types.h"

// ---- Parameter-list helpers (types only; names a1..aN are generated) -------
#define NRV_PP_CAT_(a, b) a##b
#define NRV_PP_CAT(a, b) NRV_PP_CAT_(a, b)
#define NRV_PP_NARGS_(_1, _2, _3, _4, _5, _6, _7, _8, _9, _10, _11, _12, N, ...) N
#define NRV_PP_NARGS(...) \
  NRV_PP_NARGS_(__VA_ARGS__ __VA_OPT__(, ) 12, 11, 10, 9, 8, 7, 6, 5, 4, 3, 2, 1, 0)

#define NRV_PP_PARAMS_0() void
#define NRV_PP_PARAMS_1(t1) t1 a1
#define NRV_PP_PARAMS_2(t1, t2) t1 a1, t2 a2
#define NRV_PP_PARAMS_3(t1, t2, t3) t1 a1, t2 a2, t3 a3
#define NRV_PP_PARAMS_4(t1, t2, t3, t4) t1 a1, t2 a2, t3 a3, t4 a4
#define NRV_PP_PARAMS_5(t1, t2, t3, t4, t5) t1 a1, t2 a2, t3 a3, t4 a4, t5 a5
#define NRV_PP_PARAMS_6(t1, t2, t3, t4, t5, t6) t1 a1, t2 a2, t3 a3, t4 a4, t5 a5, t6 a6
#define NRV_PP_PARAMS_7(t1, t2, t3, t4, t5, t6, t7) \
  t1 a1, t2 a2, t3 a3, t4 a4, t5 a5, t6 a6, t7 a7
#define NRV_PP_PARAMS_8(t1, t2, t3, t4, t5, t6, t7, t8) \
  t1 a1, t2 a2, t3 a3, t4 a4, t5 a5, t6 a6, t7 a7, t8 a8
#define NRV_PP_PARAMS_9(t1, t2, t3, t4, t5, t6, t7, t8, t9) \
  t1 a1, t2 a2, t3 a3, t4 a4, t5 a5, t6 a6, t7 a7, t8 a8, t9 a9

#define NRV_PP_ARGS_0()
#define NRV_PP_ARGS_1(t1) a1
#define NRV_PP_ARGS_2(t1, t2) a1, a2
#define NRV_PP_ARGS_3(t1, t2, t3) a1, a2, a3
#define NRV_PP_ARGS_4(t1, t2, t3, t4) a1, a2, a3, a4
#define NRV_PP_ARGS_5(t1, t2, t3, t4, t5) a1, a2, a3, a4, a5
#define NRV_PP_ARGS_6(t1, t2, t3, t4, t5, t6) a1, a2, a3, a4, a5, a6
#define NRV_PP_ARGS_7(t1, t2, t3, t4, t5, t6, t7) a1, a2, a3, a4, a5, a6, a7
#define NRV_PP_ARGS_8(t1, t2, t3, t4, t5, t6, t7, t8) a1, a2, a3, a4, a5, a6, a7, a8
#define NRV_PP_ARGS_9(t1, t2, t3, t4, t5, t6, t7, t8, t9) a1, a2, a3, a4, a5, a6, a7, a8, a9

// "T1 a1, T2 a2, ..." (or "void") and "a1, a2, ..." from a list of types.
#define NRV_PP_PARAMS(...) NRV_PP_CAT(NRV_PP_PARAMS_, NRV_PP_NARGS(__VA_ARGS__))(__VA_ARGS__)
#define NRV_PP_ARGS(...) NRV_PP_CAT(NRV_PP_ARGS_, NRV_PP_NARGS(__VA_ARGS__))(__VA_ARGS__)

// Common record shapes.
#define NRV_RM_GET HBA_NAME, void*, HBA_UINT32*
#define NRV_RM_SET HBA_NAME, const void*, HBA_UINT32

// Callback of the HBA API's port events (as hbaapi.h declares it inline).
typedef void (*NRV_HBA_PORT_EVENT_CALLBACK)(void* data, HBA_WWN port, HBA_UINT32 eventType,
                                            HBA_UINT32 fabricPortId);

// ---- Paired management functions: LRM_<op> and RM_<op> ---------------------
// P(op, parameter types...); both return RM_STATUS, failure value 1.
// Lookup: "LRM_<op>" in liblrmapi; without liblrmapi, "LRM_<op>" and then
// "RM_<op>" in librmapi.
#define NRV_RM_PAIRED_FUNCTIONS(P)                                                        \
  P(CNA_FCOE_GetFCFConnectList, NRV_RM_GET)                                               \
  P(CNA_FCOE_GetFIPParams, NRV_RM_GET)                                                    \
  P(CNA_FCOE_GetFcfList, HBA_NAME, void* /*RM_FCF_LIST_HEADER + entries*/)                \
  P(CNA_FCOE_SetFCFConnectList, NRV_RM_SET)                                               \
  P(CNA_FCOE_SetFIPParams, NRV_RM_SET)                                                    \
  P(CNA_GetCEE_Params, NRV_RM_GET /*1520 bytes*/)                                         \
  P(CNA_GetPGPriorityBitmaps, NRV_RM_GET)                                                 \
  P(CNA_GetTLV, HBA_NAME, HBA_UINT32 /*tlv*/, void*, HBA_UINT32*)                         \
  P(CNA_SetDcbxPortVars, NRV_RM_SET)                                                      \
  P(CNA_SetLldp, NRV_RM_SET)                                                              \
  P(CNA_SetPFC, NRV_RM_SET)                                                               \
  P(CNA_SetPGBandwidth, NRV_RM_SET)                                                       \
  P(CNA_SetPGPriorityBitmaps, NRV_RM_SET)                                                 \
  P(CNA_SetPGPriorityBitmapsExt, NRV_RM_SET)                                              \
  P(CNA_SetPGSetting, NRV_RM_SET)                                                         \
  P(CNA_SetTLV, HBA_NAME, HBA_UINT32 /*tlv*/, const void*, HBA_UINT32)                    \
  P(ChangeAdapterPersonality, NRV_RM_SET)                                                 \
  P(ChangeWWN, HBA_NAME, HBA_UINT32 /*type*/, HBA_NAME /*wwpn*/, HBA_NAME /*wwnn*/,       \
    HBA_UINT32* /*operation status*/)                                                     \
  P(DeleteDumpFiles, HBA_NAME)                                                            \
  P(DiagBeacon, HBA_NAME, HBA_UINT32 /*state*/)                                           \
  P(DiagBeaconState, HBA_NAME, HBA_UINT32* /*state*/)                                     \
  P(DiagCancelDiagnostic, HBA_NAME, HBA_UINT32 /*test handle*/)                           \
  P(DiagEchoTest, HBA_NAME, HBA_NAME /*target*/, HBA_UINT32 /*cycles*/,                   \
    HBA_UINT32 /*halt on error*/, const char* /*pattern*/, HBA_UINT32* /*handle*/)        \
  P(DiagEchoTestV2, HBA_NAME, HBA_NAME /*target*/, HBA_UINT32 /*cycles*/,                 \
    HBA_UINT32 /*halt on error*/, const char* /*pattern*/, HBA_UINT32* /*handle*/)        \
  P(DiagGetLoadListParams, NRV_RM_GET)                                                    \
  P(DiagGetResults, HBA_NAME, HBA_UINT32 /*handle*/, RM_DIAG_RESULT*)                     \
  P(DiagGetWakeupParams, NRV_RM_GET)                                                      \
  P(DiagLoopBackTest, HBA_NAME, HBA_UINT32 /*type*/, HBA_UINT32 /*cycles*/,               \
    HBA_UINT32 /*halt on error*/, HBA_UINT32* /*handle*/)                                 \
  P(DiagLoopBackTestV2, HBA_NAME, HBA_UINT32 /*type*/, HBA_UINT32 /*cycles*/,             \
    HBA_UINT32 /*halt on error*/, HBA_UINT32* /*handle*/, const char* /*pattern*/)        \
  P(DiagLoopBackTestV3, HBA_NAME, HBA_UINT32 /*type*/, HBA_UINT32 /*cycles*/,             \
    HBA_UINT32 /*halt on error*/, HBA_UINT32* /*handle*/, HBA_UINT32 /*0*/,               \
    const char* /*pattern*/)                                                              \
  P(DiagMDIOSelfTest, NRV_RM_GET)                                                         \
  P(DiagPciLoopBackTest, HBA_NAME, HBA_UINT32 /*cycles*/, HBA_UINT32 /*halt on error*/,   \
    HBA_UINT32* /*handle*/)                                                               \
  P(DiagPciLoopBackTestV2, HBA_NAME, HBA_UINT32 /*cycles*/, HBA_UINT32 /*halt*/,          \
    HBA_UINT32* /*handle*/, const char* /*pattern*/)                                      \
  P(DiagReadPCIRegistersV2, NRV_RM_GET /*PCI configuration space*/)                       \
  P(DiagRunPOST, HBA_NAME, HBA_UINT32* /*handle*/)                                        \
  P(DiagRunTDR, HBA_NAME, HBA_UINT32* /*handle*/)                                         \
  P(DiagSetNVP, HBA_NAME, HBA_UINT32 /*cable NVP 1..100*/)                                \
  P(DownloadFirmware, HBA_NAME, HBA_UINT32 /*image id*/, HBA_UINT32 /*flags*/)            \
  P(ExitLib)                                                                              \
  P(GenerateCoreDump, HBA_NAME, const char* /*"live", "dead" or options*/)                \
  P(GenerateDump, HBA_UINT32 /*0*/, HBA_NAME)                                             \
  P(GenerateEfdDump, HBA_NAME, HBA_INT32 /*snapshot mode*/, HBA_UINT32 /*0*/)             \
  P(GetAdapterPersonalityInfo, NRV_RM_GET)                                                \
  P(GetAdapterPortConfig, NRV_RM_GET)                                                     \
  P(GetChannelMgmtCNAInfo, NRV_RM_GET)                                                    \
  P(GetChannelMgmtPortInfo, NRV_RM_GET)                                                   \
  P(GetDriverParams, HBA_NAME, void* /*records*/, HBA_UINT32* /*count in/out*/)           \
  P(GetDriverParamsGlobal, HBA_NAME, void* /*records*/, HBA_UINT32* /*count in/out*/)     \
  P(GetDriverType, HBA_NAME, HBA_UINT32* /*type*/)                                        \
  P(GetDumpDirectoryA, HBA_NAME, char* /*text*/, HBA_UINT32 /*size*/)                     \
  P(GetDumpFileNames, HBA_NAME, void* /*count word + 256-byte names*/)                    \
  P(GetDumpRetentionCount, HBA_NAME, HBA_UINT32*)                                         \
  P(GetFcpTargetMapping, NRV_RM_GET)                                                      \
  P(GetHBAAttributes, NRV_RM_GET /*HBA attribute blob*/)                                  \
  P(GetHBAFeature, HBA_NAME, HBA_UINT32 /*feature*/, HBA_UINT32* /*flag*/)                \
  P(GetHBAFeatureList, NRV_RM_GET /*one byte per feature*/)                               \
  P(GetLunAttributes, HBA_NAME, HBA_NAME /*target*/, HBA_UINT64 /*lun*/, void*,           \
    HBA_UINT32*)                                                                          \
  P(GetLunList, HBA_NAME, HBA_NAME /*target*/, void*, HBA_UINT32*)                        \
  P(GetOASLunList, NRV_RM_GET)                                                            \
  P(GetPortAttributes, NRV_RM_GET /*port attribute blob*/)                                \
  P(GetPortState, NRV_RM_GET /*port attribute blob*/)                                     \
  P(GetPortStatistics, NRV_RM_GET /*statistics blob*/)                                    \
  P(GetQoS, NRV_RM_GET)                                                                   \
  P(GetServerAttributes, NRV_RM_GET)                                                      \
  P(GetSffData, NRV_RM_GET /*948-byte SFF record*/)                                       \
  P(GetVMFromVPort, HBA_NAME, HBA_NAME /*vport*/, void*, HBA_UINT32*)                     \
  P(GetVMInfo, NRV_RM_GET)                                                                \
  P(GetVPD, NRV_RM_GET /*walked with RM_GetNextVpdEntry*/)                                \
  P(GetVPDV2, HBA_NAME, HBA_UINT32 /*kind*/, void*, HBA_UINT32*)                          \
  P(GetVirtualFunctionList, NRV_RM_GET)                                                   \
  P(GetVirtualFunctionProperties, HBA_NAME, HBA_UINT32 /*vf*/, void*, HBA_UINT32*)        \
  P(GetWWNCapability, HBA_NAME, HBA_UINT32* /*capability bits*/)                          \
  P(Get_VG_EventLogConfigDataAll, NRV_RM_GET)                                             \
  P(Ini_GetNetworkProperties, NRV_RM_GET)                                                 \
  P(Ini_SetNetworkProperties, HBA_NAME, const RM_NETWORK_SETTINGS*)                       \
  P(InitLib)                                                                              \
  P(ListProfiles, NRV_RM_GET)                                                             \
  P(ListVM, NRV_RM_GET)                                                                   \
  P(Ping, HBA_NAME, const RM_IP_ADDRESS*, HBA_UINT8* /*reachable*/)                       \
  P(ReadWWN, HBA_NAME, HBA_UINT32 /*type*/, HBA_NAME* /*wwpn*/, HBA_NAME* /*wwnn*/,       \
    HBA_UINT32* /*pending name state*/)                                                   \
  P(RegisterForAdapterPortEvents, HBA_NAME, RM_EVENT_CALLBACK, void* /*user data*/,       \
    void** /*registration*/)                                                              \
  P(ResetHBA, HBA_NAME)                                                                   \
  P(RestoreWWN, HBA_NAME, HBA_UINT32 /*type*/, HBA_UINT32* /*operation status*/)          \
  P(RetrieveFATDump, HBA_NAME, char* /*file name*/, HBA_UINT32 /*size*/)                  \
  P(RetrieveFATDump2, HBA_NAME, char* /*file name*/, HBA_UINT32 /*size*/)                 \
  P(ScsiInquiry, HBA_NAME, HBA_NAME /*target*/, HBA_UINT64 /*lun*/, HBA_UINT8 /*evpd*/,   \
    HBA_UINT32 /*page*/, void*, HBA_UINT32*, void* /*sense*/, HBA_UINT32*)                \
  P(ScsiReadCapacity, HBA_NAME, HBA_NAME /*target*/, HBA_UINT64 /*lun*/, void*,           \
    HBA_UINT32*, void* /*sense*/, HBA_UINT32*)                                            \
  P(SetAdapterAttribute, HBA_NAME, HBA_UINT32 /*attribute*/, const void*, HBA_UINT32)     \
  P(SetAdapterPortConfig, NRV_RM_SET)                                                     \
  P(SetAdapterPortConfigDefaults, HBA_NAME)                                               \
  P(SetBootBiosState, HBA_NAME, HBA_UINT32 /*state*/)                                     \
  P(SetChannelMgmtCNAInfo, NRV_RM_SET)                                                    \
  P(SetChannelMgmtPortInfo, NRV_RM_SET)                                                   \
  P(SetDebugTraces, HBA_UINT32 /*mask*/, HBA_UINT32 /*level*/)                            \
  P(SetDriverParam, HBA_NAME, HBA_UINT32 /*global*/, HBA_UINT32 /*persistent*/,           \
    const char* /*name*/, const char* /*value*/)                                          \
  P(SetDumpDirectory, HBA_NAME, const char*)                                              \
  P(SetDumpRetentionCount, HBA_NAME, HBA_UINT32)                                          \
  P(SetNetbootParams, HBA_NAME, char /*'E' or 'D'*/, const char* /*method*/)              \
  P(SetOASLunState, HBA_NAME, HBA_NAME /*initiator*/, HBA_NAME /*target*/,                \
    HBA_UINT64 /*lun*/, HBA_UINT32 /*state*/, HBA_UINT32 /*option*/)                      \
  P(SetPhyPortSpeedSettings, HBA_NAME, const char* /*speed*/, HBA_UINT32 /*mode*/,        \
    HBA_UINT32 /*cable length*/)                                                          \
  P(SetPortEnabled, HBA_NAME, HBA_UINT32 /*enabled*/, HBA_UINT8* /*config status*/)       \
  P(SetQoS, NRV_RM_SET)                                                                   \
  P(Set_VG_DefaultLoggingConfig, HBA_NAME)                                                \
  P(Set_VG_EventLogConfigDataModule, HBA_NAME, const char* /*module*/,                    \
    HBA_UINT32 /*mode flags*/, const HBA_UINT32* /*levels*/, HBA_UINT32 /*count*/)        \
  P(Set_VG_EventLogTraceLevel, HBA_NAME, HBA_UINT32 /*level*/, HBA_UINT32 /*mode flags*/) \
  P(UnRegisterForAdapterPortEvents, HBA_NAME, void* /*registration*/)                     \
  P(VPAutoGenCreate, NRV_RM_GET)                                                          \
  P(VPCreate, NRV_RM_SET)                                                                 \
  P(VPDelete, HBA_NAME, HBA_NAME /*vport*/)                                               \
  P(VPGetAttributes, HBA_NAME, HBA_NAME /*vport*/, void*, HBA_UINT32*)                    \
  P(VPList, NRV_RM_GET /*count + RM_VPORT_ENTRY*/)                                        \
  P(VPListTargets, HBA_NAME, HBA_NAME /*vport*/, void*, HBA_UINT32*)                      \
  P(iSCSI_AddBootTarget, HBA_NAME, HBA_UINT32 /*login*/, const char* /*target*/,          \
    const RM_IP_ADDRESS*, const RM_ISCSI_LOGIN_OPTIONS*, const RM_ISCSI_AUTH*)            \
  P(iSCSI_AddSendTargetPortal, HBA_NAME, const RM_IP_ADDRESS*, HBA_UINT32 /*0*/,          \
    RM_ISCSI_LOGIN_OPTIONS* /*in/out*/, const RM_ISCSI_AUTH*)                             \
  P(iSCSI_AddTarget, HBA_NAME, HBA_UINT32 /*login*/, const char* /*target*/,              \
    const RM_IP_ADDRESS*, const RM_ISCSI_LOGIN_OPTIONS*, const RM_ISCSI_AUTH*)            \
  P(iSCSI_AddiSNSServer, HBA_NAME, const RM_IP_ADDRESS*)                                  \
  P(iSCSI_GetInitiatorProperties, HBA_NAME, RM_ISCSI_INITIATOR_PROPERTIES*,               \
    RM_ISCSI_INITIATOR_EXTRA*)                                                            \
  P(iSCSI_GetLunProperties, HBA_NAME, const char* /*target*/, HBA_UINT32 /*lun*/, void*,  \
    HBA_UINT32*)                                                                          \
  P(iSCSI_GetLuns, HBA_NAME, const char* /*target*/, void*, HBA_UINT32*)                  \
  P(iSCSI_GetPortStatistics, NRV_RM_GET)                                                  \
  P(iSCSI_GetSendTargetPortalProperties, HBA_NAME, const RM_IP_ADDRESS*,                  \
    RM_ISCSI_PORTAL_PROPERTIES*)                                                          \
  P(iSCSI_GetSessionInfo, HBA_NAME, const void* /*session entry*/, void*, HBA_UINT32*)    \
  P(iSCSI_GetSessions, HBA_NAME, const char* /*target*/, void* /*count + entries*/,       \
    HBA_UINT32* /*size*/)                                                                 \
  P(iSCSI_GetTargetLoginAuthProperties, HBA_NAME, const char* /*target*/,                 \
    RM_ISCSI_LOGIN_OPTIONS*, RM_ISCSI_AUTH*)                                              \
  P(iSCSI_GetTargets, HBA_NAME, HBA_UINT8 /*flag*/, void* /*count + entries*/,            \
    HBA_UINT32* /*size*/)                                                                 \
  P(iSCSI_GetiSNSServers, NRV_RM_GET /*count + RM_IP_ADDRESS*/)                           \
  P(iSCSI_RemoveSendTargetPortal, HBA_NAME, const RM_IP_ADDRESS*)                         \
  P(iSCSI_RemoveTarget, HBA_NAME, const char* /*target*/)                                 \
  P(iSCSI_RemoveiSNSServer, HBA_NAME, const RM_IP_ADDRESS*)                               \
  P(iSCSI_SetBootSession, HBA_NAME, const char* /*target*/, const RM_ISCSI_SESSION_ID*,   \
    HBA_UINT32 /*enable*/)                                                                \
  P(iSCSI_SetInitiatorProperties, HBA_NAME, const RM_ISCSI_INITIATOR_PROPERTIES*)         \
  P(iSCSI_SetSendTargetPortalProperties, HBA_NAME, const RM_ISCSI_PORTAL_PROPERTIES*)     \
  P(iSCSI_SetTargetLoginAuthProperties, HBA_NAME, const char* /*target*/,                 \
    const RM_ISCSI_LOGIN_OPTIONS*, const RM_ISCSI_AUTH*)                                  \
  P(iSCSI_SetTargetProperties, HBA_NAME, const char* /*target*/,                          \
    RM_ISCSI_TARGET_PROPERTIES*)                                                          \
  P(iSCSI_SetiSNSState, HBA_NAME, HBA_UINT32 /*enable*/)                                  \
  P(iSCSI_TargetLogin, HBA_NAME, const char* /*target*/, HBA_UINT32 /*0*/,                \
    const RM_IP_ADDRESS*, const RM_ISCSI_LOGIN_OPTIONS*, const RM_ISCSI_AUTH*)            \
  P(iSCSI_TargetLogout, HBA_NAME, const char* /*target*/, const RM_ISCSI_SESSION_ID*)

// ---- Functions under one name only ------------------------------------------
// X(group, return type, name, failure value, parameter types...).
// Groups: MGMT (slot 1, fallback librmapi), HBA (slot 0, declared by
// hbaapi.h), QOS (slot 3), QOS_CLOSE (DOZER_CloseAdapter's own rule).
#define NRV_RM_SINGLE_FUNCTIONS(X)                                                        \
  X(MGMT, RM_STATUS, RM_GetAdapterType, 1, HBA_NAME, HBA_UINT32*)                         \
  X(MGMT, RM_STATUS, RM_GetAllLocalHBAInstances, 1, HBA_UINT32* /*count in/out*/,         \
    HBA_UINT32* /*instances*/)                                                            \
  X(MGMT, void*, RM_GetAttributeValue, nullptr, void* /*blob*/, HBA_UINT16 /*attribute*/, \
    HBA_UINT16* /*length*/, HBA_UINT32* /*status*/)                                       \
  X(MGMT, RM_STATUS, RM_GetLocalHBAInfo, 1, RM_ADAPTER_INSTANCE*, RM_LOCAL_HBA_INFO*)     \
  X(MGMT, RM_STATUS, RM_GetLocalHBAInfoV3, 1, RM_ADAPTER_INSTANCE*,                       \
    RM_LOCAL_HBA_INFO_V3*)                                                                \
  X(MGMT, RM_STATUS, RM_GetLocalHBAInfoV4, 1, RM_ADAPTER_INSTANCE*,                       \
    RM_LOCAL_HBA_INFO_V4*)                                                                \
  X(MGMT, void*, RM_GetNextVpdEntry, nullptr, void* /*cursor*/, char* /*keyword[4]*/,     \
    char* /*value[256]*/)                                                                 \
  X(MGMT, HBA_UINT32, RM_GetNumberOfLocalAdapters, 0)                                     \
  X(MGMT, RM_STATUS, RM_GetVersion, 1, HBA_UINT32 /*library code*/, char* /*text*/,        \
    HBA_UINT32 /*size*/)                                                                  \
  X(MGMT, RM_STATUS, RM_ImportHBAFileA, 1, const char* /*path*/, HBA_UINT32* /*image*/)   \
  X(MGMT, RM_STATUS, RM_IsLocalHBA, 1, HBA_NAME, HBA_UINT32* /*is local*/)                \
  X(MGMT, RM_STATUS, RM_ListDeadNicPorts, 1, void* /*count + entries*/,                   \
    HBA_UINT32* /*size*/)                                                                 \
  X(MGMT, RM_STATUS, RM_TiroVersion, 1, char* /*text*/, HBA_UINT32 /*size*/)              \
  X(MGMT, RM_STATUS, RM_StatusString, 1, RM_STATUS, char* /*text*/, HBA_UINT32 /*size*/)  \
  X(MGMT, RM_STATUS, RM_ValidateWwn, 1, HBA_NAME)                                         \
  X(MGMT, RM_STATUS, RM_VerifyFirmwareA, 1, HBA_NAME, HBA_UINT32 /*image*/)               \
  X(MGMT, RM_STATUS, LRM_Ini_AddARPTableEntry, 1, HBA_NAME, const RM_ARP_ENTRY*)          \
  X(MGMT, RM_STATUS, LRM_Ini_AddRouteTableEntry, 1, HBA_NAME, const RM_ROUTE_ENTRY*)      \
  X(MGMT, RM_STATUS, LRM_Ini_DeleteARPTableEntry, 1, HBA_NAME, const RM_ARP_ENTRY*)       \
  X(MGMT, RM_STATUS, LRM_Ini_DeleteRouteTableEntry, 1, HBA_NAME, const RM_ROUTE_ENTRY*)   \
  X(MGMT, RM_STATUS, LRM_Ini_GetARPTable, 1, NRV_RM_GET /*count + RM_ARP_ENTRY*/)         \
  X(MGMT, RM_STATUS, LRM_Ini_GetRouteTable, 1, NRV_RM_GET /*count + RM_ROUTE_ENTRY*/)     \
  X(MGMT, HBA_INT32, NrvGetBoardNumber, -1, HBA_NAME)                                     \
  X(HBA, void, HBA_CloseAdapter, void(), HBA_HANDLE)                                      \
  X(HBA, HBA_STATUS, HBA_GetAdapterAttributes, 1, HBA_HANDLE, HBA_ADAPTERATTRIBUTES*)     \
  X(HBA, HBA_STATUS, HBA_GetAdapterName, 1, HBA_UINT32, char*)                            \
  X(HBA, HBA_STATUS, HBA_GetAdapterPortAttributes, 1, HBA_HANDLE, HBA_UINT32,             \
    HBA_PORTATTRIBUTES*)                                                                  \
  X(HBA, HBA_STATUS, HBA_GetFcpTargetMapping, 1, HBA_HANDLE, HBA_FCPTARGETMAPPING*)       \
  X(HBA, HBA_UINT32, HBA_GetNumberOfAdapters, 0)                                          \
  X(HBA, HBA_STATUS, HBA_LoadLibrary, 1)                                                  \
  X(HBA, HBA_HANDLE, HBA_OpenAdapter, 0, char*)                                           \
  X(HBA, void, HBA_RefreshInformation, void(), HBA_HANDLE)                                \
  X(HBA, HBA_STATUS, HBA_RegisterForAdapterPortEvents, 1, NRV_HBA_PORT_EVENT_CALLBACK,    \
    void*, HBA_HANDLE, HBA_WWN, HBA_CALLBACKHANDLE*)                                      \
  X(HBA, HBA_STATUS, HBA_RemoveCallback, 1, HBA_CALLBACKHANDLE)                           \
  X(HBA, HBA_STATUS, HBA_SendReadCapacity, 1, HBA_HANDLE, HBA_WWN, HBA_UINT64, void*,     \
    HBA_UINT32, void*, HBA_UINT32)                                                        \
  X(HBA, HBA_STATUS, HBA_SendScsiInquiry, 1, HBA_HANDLE, HBA_WWN, HBA_UINT64, HBA_UINT8,  \
    HBA_UINT32, void*, HBA_UINT32, void*, HBA_UINT32)                                     \
  X(QOS_CLOSE, void, DOZER_CloseAdapter, void(), HBA_UINT32 /*handle*/)                   \
  X(QOS, HBA_UINT32, DOZER_FreeLibrary, 1)                                                \
  X(QOS, HBA_UINT32, DOZER_GetNumberOfAdapters, 1)                                        \
  X(QOS, HBA_UINT32, DOZER_LoadLibrary, 1)                                                \
  X(QOS, HBA_UINT32, DOZER_OpenAdapter, 1, const char* /*adapter name*/,                  \
    HBA_UINT32* /*handle*/)                                                               \
  X(QOS, HBA_UINT32, DOZER_QoSGetConfig, 1, HBA_UINT32 /*handle*/, void*, HBA_UINT32*)    \
  X(QOS, HBA_UINT32, DOZER_QoSGetGlobalFlag, 1, HBA_UINT32 /*handle*/, HBA_UINT32*)       \
  X(QOS, HBA_UINT32, DOZER_QoSSetConfig, 1, HBA_UINT32 /*handle*/, const void*,           \
    HBA_UINT32)                                                                           \
  X(QOS, HBA_UINT32, DOZER_QoSSetGlobalFlag, 1, HBA_UINT32 /*handle*/, HBA_UINT32)
