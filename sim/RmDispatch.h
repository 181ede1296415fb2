// How the management library's exported names reach their implementations.
// Every paired operation `op` has a signature type Sig_op (from the one
// function table in access/RM_Functions.h) and a handler declaration
// `Sig_op handle_op;`.  Operations listed in NRVSIM_IMPLEMENTED get their
// calls forwarded to handle_op; every other operation answers 190 ("item not
// offered").  A handler defined with a signature other than the table's is a
// different overload, so the declared one stays undefined and the link fails:
// the table and the implementations cannot drift apart silently.
#pragma once

#include "access/RM_Api.h"
#include "sim/SimSite.h"

namespace nrvsim::rm {

#define NRVSIM_SIG_(op, ...)                                \
  using Sig_##op = RM_STATUS(NRV_PP_PARAMS(__VA_ARGS__));   \
  Sig_##op handle_##op;                                     \
  struct Tag_##op {};
NRV_RM_PAIRED_FUNCTIONS(NRVSIM_SIG_)
#undef NRVSIM_SIG_

// The paired operations this library implements (the rest answer 190).
#define NRVSIM_IMPLEMENTED(X)                                                              \
  X(InitLib) X(ExitLib) X(GetHBAAttributes) X(GetPortAttributes) X(GetPortState)           \
  X(GetPortStatistics) X(GetHBAFeature) X(GetHBAFeatureList) X(GetDriverType) X(GetVPD)    \
  X(GetVPDV2) X(GetSffData) X(DiagReadPCIRegistersV2) X(Ini_GetNetworkProperties)          \
  X(Ini_SetNetworkProperties) X(iSCSI_GetInitiatorProperties)                              \
  X(iSCSI_SetInitiatorProperties) X(iSCSI_GetTargets) X(iSCSI_GetSessions)                 \
  X(iSCSI_GetSessionInfo) X(iSCSI_GetLuns) X(iSCSI_GetLunProperties) X(iSCSI_AddTarget)    \
  X(iSCSI_RemoveTarget) X(iSCSI_TargetLogin) X(iSCSI_TargetLogout)                         \
  X(iSCSI_AddSendTargetPortal) X(iSCSI_RemoveSendTargetPortal) X(iSCSI_AddiSNSServer)      \
  X(iSCSI_RemoveiSNSServer) X(iSCSI_GetiSNSServers) X(iSCSI_SetiSNSState)                  \
  X(GetDriverParams) X(GetDriverParamsGlobal) X(SetDriverParam) X(VPList)                  \
  X(VPGetAttributes) X(ReadWWN) X(ChangeWWN) X(RestoreWWN) X(GetWWNCapability)             \
  X(SetPortEnabled) X(DiagBeacon) X(DiagBeaconState) X(GetDumpDirectoryA)                  \
  X(SetDumpDirectory) X(GetDumpRetentionCount) X(SetDumpRetentionCount)                    \
  X(GetFcpTargetMapping) X(ScsiInquiry) X(ScsiReadCapacity) X(SetOASLunState)                \
  X(DiagLoopBackTest) X(DiagLoopBackTestV2) X(DiagLoopBackTestV3) X(DiagPciLoopBackTest)     \
  X(DiagPciLoopBackTestV2) X(DiagEchoTest) X(DiagEchoTestV2) X(DiagRunPOST) X(DiagRunTDR)    \
  X(DiagGetResults) X(DiagCancelDiagnostic) X(DiagSetNVP) X(DownloadFirmware) X(ResetHBA)    \
  X(GenerateDump) X(GenerateEfdDump) X(GenerateCoreDump) X(GetDumpFileNames)                 \
  X(DeleteDumpFiles) X(RetrieveFATDump) X(RetrieveFATDump2) X(iSCSI_AddBootTarget)         \
  X(iSCSI_SetBootSession) X(iSCSI_GetTargetLoginAuthProperties)                              \
  X(iSCSI_SetTargetLoginAuthProperties) X(iSCSI_SetTargetProperties)                         \
  X(iSCSI_GetSendTargetPortalProperties) X(iSCSI_SetSendTargetPortalProperties) X(Ping)      \
  X(CNA_FCOE_GetFIPParams) X(CNA_FCOE_SetFIPParams) X(CNA_FCOE_GetFCFConnectList)            \
  X(CNA_FCOE_SetFCFConnectList) X(CNA_FCOE_GetFcfList) X(CNA_GetCEE_Params)                  \
  X(CNA_GetPGPriorityBitmaps) X(CNA_SetPGPriorityBitmaps) X(CNA_SetPGPriorityBitmapsExt)     \
  X(CNA_SetPGBandwidth) X(CNA_SetPFC) X(CNA_SetDcbxPortVars) X(CNA_SetLldp)                  \
  X(CNA_SetPGSetting) X(CNA_SetTLV) X(CNA_GetTLV) X(GetQoS) X(SetQoS) X(SetAdapterAttribute) \
  X(SetBootBiosState) X(SetNetbootParams) X(SetPhyPortSpeedSettings) X(GetServerAttributes) \
  X(RegisterForAdapterPortEvents) X(UnRegisterForAdapterPortEvents) X(SetDebugTraces)        \
  X(VPDelete) X(Get_VG_EventLogConfigDataAll)

template <class Tag>
struct Dispatch {
  template <class... A>
  static RM_STATUS call(A...) {
    return RM_STATUS_ITEM_NOT_OFFERED;
  }
};

#define NRVSIM_DISPATCH_(op)                    \
  template <>                                   \
  struct Dispatch<Tag_##op> {                   \
    template <class... A>                       \
    static RM_STATUS call(A... a) {             \
      return handle_##op(a...);                 \
    }                                           \
  };
NRVSIM_IMPLEMENTED(NRVSIM_DISPATCH_)
#undef NRVSIM_DISPATCH_

// The function a call is addressed to, for fault rules that name an adapter.
inline std::optional<Wwn> addressee() { return std::nullopt; }
template <class First, class... Rest>
std::optional<Wwn> addressee(const First& first, const Rest&...) {
  if constexpr (std::is_same_v<First, HBA_NAME>) {
    Wwn w{};
    for (size_t i = 0; i < 8; ++i) w[i] = first.wwn[i];
    return w;
  } else {
    return std::nullopt;
  }
}

// Entry of every paired name: faults first, then the implementation.
template <class Tag, class... A>
RM_STATUS enter(const char* name, A... a) {
  if (auto st = SimSite::instance().gate(name, RM_STATUS_ERROR, addressee(a...))) return *st;
  return Dispatch<Tag>::call(a...);
}

}  // namespace nrvsim::rm
