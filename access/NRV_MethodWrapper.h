// The one object through which the module calls the management library:
// constructing it initialises the library once per process; its static
// operations validate a port name, call the library and log the outcome.
//
// Contract: the provider agent owns the single instance and constructs it
// before any other management call; construction throws std::runtime_error
// when LRM_InitLib fails.  The static operations keep no state of their own
// (apart from the SAN-change handler) and may run on any thread.  The runtime
// loader must have been started.
//
// Statuses: 0 success; 1 when the port name is not a local adapter (the
// library is not called); kNrvFailure for a malformed argument the wrapper
// checks itself; 190 when the adapter lacks the feature an operation needs
// (2 for the FIP, priority-group and channel-management operations); any
// other value is the library's.  Records whose layout belongs to the caller
// come back as bytes, at most as many as the library reported.
#pragma once

#include <semaphore.h>

#include <string>
#include <utility>
#include <vector>

#include "access/NRV_Common.h"
#include "access/RM_Api.h"
#include "access/RM_SettingRecords.h"

namespace cimple {

class NRV_MethodWrapper {
 public:
  NRV_MethodWrapper();
  ~NRV_MethodWrapper();
  NRV_MethodWrapper(const NRV_MethodWrapper&) = delete;
  NRV_MethodWrapper& operator=(const NRV_MethodWrapper&) = delete;

  // Names of the process's initialisation semaphores.
  static std::string initSemaphoreName();
  static std::string doneSemaphoreName();

  // ---- Adapter tests ----
  // 0 when the library answers that `name` is a local adapter, else 1.
  static int Validatewwpn(const HBA_NAME& name);
  // 1 for a Tarnel-family adapter (feature 201), else 0.
  static int IsTarnelCNA(const HBA_NAME& name);
  // Fills the personality flags from features 403, 412, 401, 413, 439.
  static RM_STATUS GetCNAType(const HBA_NAME& name, bool& isNicOnly, bool& isISCSI, bool& isFCoE,
                              bool& isRoCE);
  // 0 with `available` set from LRM_GetHBAFeature; the library status otherwise.
  static RM_STATUS HasFeature(const HBA_NAME& name, HBA_UINT32 feature, bool& available);

  // Logs the library's text for `status` ("Status: <%d>:%s").
  static void logStatus(RM_STATUS status);

  // ---- Library information ----
  // Version text of the library named by `library` (102 the management
  // library, 104 the DFC library).
  static RM_STATUS GetLibraryVersion(HBA_UINT32 library, std::string& version);
  static RM_STATUS GetTIROLibVersion(std::string& version);
  static RM_STATUS SetTIROTraceLevel(HBA_UINT32 mask, HBA_UINT32 level);
  // The target operating-system text of the server (at most 40 characters).
  static RM_STATUS getTargetOS_info(std::string& os);

  // ---- Dump service ----
  static RM_STATUS nrvcimReset(const HBA_NAME& name);
  static RM_STATUS nrvcimGetRetentionCount(const HBA_NAME& name, HBA_UINT32& count);
  static RM_STATUS nrvcimSetRetentionCount(const HBA_NAME& name, HBA_UINT32 count);
  static RM_STATUS SetRetentionCount(const HBA_NAME& name, HBA_UINT32 count) {
    return nrvcimSetRetentionCount(name, count);
  }
  static RM_STATUS nrvcimDeleteDumpFiles(const HBA_NAME& name);
  static RM_STATUS nrvcimGetDumpDirectory(const HBA_NAME& name, std::string& directory);
  static RM_STATUS nrvcimSetDumpDirectory(const HBA_NAME& name, const std::string& directory);
  // Snapshot mode 1 (RAM) or 0 (flash) takes an extended FAT dump; -1 (the
  // Tarnel family) a plain dump.
  static RM_STATUS nrvcimDumpDiagnostic(const HBA_NAME& name, HBA_INT32 snapshotMode);
  static RM_STATUS nrvcimRetrieveFATDump(const HBA_NAME& name, std::string& fileName);
  // `options` "live", "dead" or the caller's text; a dead NIC port listed by
  // the library is accepted although it no longer answers as a local adapter.
  static RM_STATUS nrvcimGetCoreDump(const HBA_NAME& name, const std::string& options);
  static RM_STATUS GetDumpFileNames(const HBA_NAME& name, std::vector<std::string>& files);
  // The raw event-log configuration record (modules, modes, trace levels).
  static RM_STATUS GetExtFATAdvancedData(const HBA_NAME& name, std::vector<uint8_t>& record);
  static RM_STATUS SetExtFATAdvancedData(const HBA_NAME& name, const std::string& module,
                                         HBA_UINT32 modeFlags,
                                         const std::vector<HBA_UINT32>& levels);
  static RM_STATUS nrvcimSetAdvancedDumpTraceLevel(const HBA_NAME& name, HBA_UINT32 level,
                                                   HBA_UINT32 modeFlags);
  static RM_STATUS nrvcimRestoreDefaultSettings(const HBA_NAME& name);

  // ---- Firmware ----
  // Imports, verifies and flashes `path`; 247 means "done, reboot to activate".
  static RM_STATUS nrvcimDownloadFW(const HBA_NAME& name, const std::string& path);
  // The firmware version waiting on flash.
  static RM_STATUS UpdateFirmwareOnFlash(const HBA_NAME& name, std::string& version);

  // ---- FIP, CEE, priority groups, QoS ----
  struct FIPParams {
    std::string fabricName;  // "XX:XX:XX:XX:XX:XX:XX:XX"
    std::string switchName;
    std::string vlan;   // decimal, or "Any"
    std::string fcMap;  // "0x%02X%02X%02X"
    HBA_UINT32 cinVlanId = 0;
  };
  // 0; 190 when the feature query answers 190; 2 without FIP support; else
  // the status of the failed read.
  static RM_STATUS nrvGetFIPParams(const HBA_NAME& name, FIPParams& params);
  // Writes the texts back (same forms); kNrvFailure for a malformed text.
  static RM_STATUS nrvSetFIPParams(const HBA_NAME& name, const FIPParams& params);
  static RM_STATUS nrvcimGetCEEParams(const HBA_NAME& name, std::vector<uint8_t>& record);
  // `key` one of "dcbxstate", "txstate", "rxstate", "txportdesc", "txsysdesc",
  // "txsysname", "txsyscap", "pfcenabled", "fcoepriority", "iscsipriority",
  // "rocepriority"; any other answers kNrvFailure without a library call.
  static RM_STATUS nrvcimSetCEEParams(const HBA_NAME& name, const std::string& key,
                                      HBA_UINT32 value);
  // Writes the group bitmaps and the PFC bitmap; 2 without priority groups.
  static RM_STATUS nrvcimSetCeePriority(const HBA_NAME& name, const RM_PG_PRIORITY_BITMAPS& groups,
                                        HBA_UINT8 pfcBitmap);
  static RM_STATUS nrvcimSetPgBW(const HBA_NAME& name, const RM_PG_BANDWIDTH& bandwidth);
  static RM_STATUS SetPfcThrottle(const HBA_NAME& name, bool enable);
  static RM_STATUS GetQosInfo(const HBA_NAME& name, RM_QOS_LIMITS& limits);
  static RM_STATUS SetQOSParams(const HBA_NAME& name, const RM_QOS_LIMITS& limits);

  // ---- Boot ----
  static RM_STATUS nrvcimGetBootBiosState(const HBA_NAME& name, HBA_UINT32& state);
  static RM_STATUS nrvcimSetBootBiosState(const HBA_NAME& name, HBA_UINT32 state);
  static RM_STATUS GetNICNetworkBootParams(const HBA_NAME& name, std::string& method,
                                           bool& bothMethods, HBA_UINT32& state);
  // `flag` 'E' (enable with `method`) or 'D'; kNrvFailure for any other flag.
  static RM_STATUS SetNICNetworkBootParams(const HBA_NAME& name, char flag,
                                           const std::string& method);
  static RM_STATUS SetiSCSIBoot(const HBA_NAME& name, HBA_UINT32 enabled);
  static RM_STATUS GetiSCSIBootState(const HBA_NAME& name, HBA_UINT32& state);

  // ---- iSCSI ----
  // Told after a successful change of targets, sessions or portals, which
  // the SAN catalogue must follow: `rebuildNow` is false for a new portal
  // (the rebuild may wait for the next request).  Runs on the caller's thread
  // while the caller holds its locks; null (the default) tells no one.
  using SanChangeHandler = void (*)(bool rebuildNow);
  static void setSanChangeHandler(SanChangeHandler handler);

  // Operations taking an address text answer kBadAddress when it does not
  // form an address record.
  static constexpr RM_STATUS kBadAddress = 4;
  // Address record of `text` (dotted IPv4, IPv6 or a resolvable host) and `port`.
  static bool makeAddress(const std::string& text, HBA_UINT16 port, RM_IP_ADDRESS& out);
  static RM_STATUS Ping(const HBA_NAME& name, const std::string& address, HBA_UINT16 port,
                        bool& reachable);
  static RM_STATUS GetiSNSServer(const HBA_NAME& name, std::vector<RM_IP_ADDRESS>& servers);
  static RM_STATUS UpdateiSNSServer(const HBA_NAME& name, const std::string& address,
                                    HBA_UINT16 port, HBA_UINT32 enable);
  static RM_STATUS DeleteiSNSServer(const HBA_NAME& name, const std::string& address,
                                    HBA_UINT16 port);
  static RM_STATUS GetIscsiInitiatorProps(const HBA_NAME& name,
                                          RM_ISCSI_INITIATOR_PROPERTIES& properties);
  static RM_STATUS SetInitiatorProperties(const HBA_NAME& name,
                                          const RM_ISCSI_INITIATOR_PROPERTIES& properties);
  static RM_STATUS GetTargetLoginAuthProperties(const HBA_NAME& name, const std::string& target,
                                                RM_ISCSI_LOGIN_OPTIONS& options,
                                                RM_ISCSI_AUTH& auth);
  static RM_STATUS SetTargetLoginAuthProperties(const HBA_NAME& name, const std::string& target,
                                                const RM_ISCSI_LOGIN_OPTIONS& options,
                                                const RM_ISCSI_AUTH& auth);
  // A portal the library refuses with 116 because it still carries digests
  // the caller did not ask for is removed and added once more without them;
  // `options` holds what the library answered.
  static RM_STATUS AddTargetPortal(const HBA_NAME& name, const std::string& address,
                                   HBA_UINT16 port, RM_ISCSI_LOGIN_OPTIONS& options,
                                   const RM_ISCSI_AUTH& auth);
  static RM_STATUS RemoveTargetPortal(const HBA_NAME& name, const std::string& address,
                                      HBA_UINT16 port);
  static RM_STATUS GetTargetPortalProperties(const HBA_NAME& name, const std::string& address,
                                             HBA_UINT16 port,
                                             RM_ISCSI_PORTAL_PROPERTIES& properties);
  static RM_STATUS SetTargetPortalProperties(const HBA_NAME& name,
                                             const RM_ISCSI_PORTAL_PROPERTIES& properties);
  // A boot target goes through LRM_iSCSI_AddBootTarget.
  static RM_STATUS AddTarget(const HBA_NAME& name, const std::string& target,
                             const std::string& address, HBA_UINT16 port, bool login, bool boot,
                             const RM_ISCSI_LOGIN_OPTIONS& options, const RM_ISCSI_AUTH& auth);
  static RM_STATUS RemoveTarget(const HBA_NAME& name, const std::string& target);
  static RM_STATUS TargetLogin(const HBA_NAME& name, const std::string& target,
                               const std::string& address, HBA_UINT16 port,
                               const RM_ISCSI_LOGIN_OPTIONS& options, const RM_ISCSI_AUTH& auth);
  // The session record carries `address` (dotted IPv4) only when it is not empty.
  static RM_STATUS TargetLogout(const HBA_NAME& name, const std::string& target,
                                HBA_UINT32 sessionId, const std::string& address);
  static RM_STATUS SetBootTargetSession(const HBA_NAME& name, const std::string& target,
                                        HBA_UINT32 sessionId, const std::string& address,
                                        HBA_UINT32 enable);
  static RM_STATUS SetTargetProperties(const HBA_NAME& name, const std::string& target,
                                       RM_ISCSI_TARGET_PROPERTIES& properties);
  // Raw lists: targets (count + 516-byte entries), a target's LUNs and
  // sessions, a LUN's properties, a session's information, the port's iSCSI
  // statistics.
  static RM_STATUS GetiSCSITargetList(const HBA_NAME& name, HBA_UINT8 flag,
                                      std::vector<uint8_t>& list);
  static RM_STATUS GetiSCSILuns(const HBA_NAME& name, const std::string& target,
                                std::vector<uint8_t>& luns);
  static RM_STATUS GetiSCSISessions(const HBA_NAME& name, const std::string& target,
                                    std::vector<uint8_t>& sessions);
  static RM_STATUS GetiSCSILunProperties(const HBA_NAME& name, const std::string& target,
                                         HBA_UINT32 lun, std::vector<uint8_t>& properties);
  static RM_STATUS GetSessionInfo(const HBA_NAME& name, const void* session,
                                  std::vector<uint8_t>& info);
  static RM_STATUS GetIscsiPortStatistics(const HBA_NAME& name, std::vector<uint8_t>& statistics);
  static RM_STATUS SetNetworkSettings(const HBA_NAME& name, const RM_NETWORK_SETTINGS& settings);
  static RM_STATUS discoverARPTable(const HBA_NAME& name, std::vector<RM_ARP_ENTRY>& entries);
  static RM_STATUS discoverRoute(const HBA_NAME& name, std::vector<RM_ROUTE_ENTRY>& entries);

  // ---- Channel management, personality, profiles ----
  static constexpr RM_STATUS kNotSupported = 2;  // feature absent (FIP, PG, CM)
  static RM_STATUS GetChannelMgmtCNAInfo(const HBA_NAME& name, std::vector<uint8_t>& record);
  static RM_STATUS GetChannelMgmtPortInfo(const HBA_NAME& name, std::vector<uint8_t>& record);
  static RM_STATUS SetChannelMgmtPortInfo(const HBA_NAME& name, const std::vector<uint8_t>& record);
  // Writes `mode` into the adapter's channel-management record; 2 without the feature.
  static RM_STATUS SetCMMode(const HBA_NAME& name, HBA_UINT32 mode);
  static RM_STATUS GetAdapterPersonalities(const HBA_NAME& name, std::vector<uint8_t>& record);
  static RM_STATUS ChangeAdapterPersonality(const HBA_NAME& name,
                                            const std::vector<uint8_t>& record);
  static RM_STATUS GetAdpaterPortConfig(const HBA_NAME& name, std::vector<uint8_t>& record);
  static RM_STATUS SetAdpaterPortConfig(const HBA_NAME& name, const std::vector<uint8_t>& record);
  static RM_STATUS ListProfiles(const HBA_NAME& name, std::vector<uint8_t>& record);
  static RM_STATUS FactoryDefaults(const HBA_NAME& name);
  static RM_STATUS SetSRIOVEnabledState(const HBA_NAME& name, HBA_UINT32 state);
  static RM_STATUS SetVEPAState(const HBA_NAME& name, HBA_UINT32 state);

  // ---- Physical port ----
  static RM_STATUS SetPortEnabled(const HBA_NAME& name, HBA_UINT32 enabled,
                                  HBA_UINT8& configStatus);
  static RM_STATUS SetCableNVP(const HBA_NAME& name, HBA_UINT32 nvp);
  static RM_STATUS SetPhyPortSpeed(const HBA_NAME& name, const std::string& speed, HBA_UINT32 mode,
                                   HBA_UINT32 cableLength);
  struct PhyPortSpeed {
    HBA_UINT32 interfaceType = 0;
    std::string autoNegSupportedSpeeds;
    std::string forceSupportedSpeeds;
    std::string configuredPortSpeed;
    HBA_UINT32 portSpeedMode = 0;
    HBA_UINT32 dacCableLength = 0;
  };
  static RM_STATUS GetPhyPortSpeedAttributesValues(const HBA_NAME& name, PhyPortSpeed& values);
  static RM_STATUS SetLineRateAdvertised(const HBA_NAME& name, bool rate10G, bool rate1G,
                                         bool rate100MB);

  // ---- World-wide names ----
  static RM_STATUS GetWWNCapability(const HBA_NAME& name, HBA_UINT32& capability);
  static RM_STATUS ReadWWN(const HBA_NAME& name, HBA_UINT32 type, HBA_NAME& wwpn, HBA_NAME& wwnn,
                           HBA_UINT32& operationStatus);
  // Refuses (kNrvFailure) names the library does not accept or that a local
  // adapter or one of its virtual ports already uses.
  static RM_STATUS ChangeWWN(const HBA_NAME& name, HBA_UINT32 type, const HBA_NAME& wwpn,
                             const HBA_NAME& wwnn, HBA_UINT32& operationStatus);
  static RM_STATUS RestoreWWN(const HBA_NAME& name, HBA_UINT32 type, HBA_UINT32& operationStatus);

  // ---- Virtual ports and functions ----
  static RM_STATUS ListVPorts(const HBA_NAME& name, std::vector<RM_VPORT_ENTRY>& vports);
  static RM_STATUS ListVPortAttributes(const HBA_NAME& name, const HBA_NAME& vport,
                                       std::vector<uint8_t>& record);
  static RM_STATUS ListVPortTargets(const HBA_NAME& name, const HBA_NAME& vport,
                                    std::vector<uint8_t>& record);
  static RM_STATUS ListVMfromVPort(const HBA_NAME& name, const HBA_NAME& vport,
                                   std::vector<uint8_t>& record);
  static RM_STATUS GetVMInfo(const HBA_NAME& name, std::vector<uint8_t>& record);
  static RM_STATUS GetVirtualFuncList(const HBA_NAME& name, std::vector<uint8_t>& record);
  static RM_STATUS GetVirtualFuncPropertyList(const HBA_NAME& name, HBA_UINT32 function,
                                              std::vector<uint8_t>& record);

  // ---- Others ----
  // Identifier texts of the NIC ports that no longer answer.
  static RM_STATUS GetDeadNICPorts(std::vector<std::string>& ports);
  static RM_STATUS GetHBAFeatureList(const HBA_NAME& name, std::vector<uint8_t>& features);
  static RM_STATUS SetOASLunState(const HBA_NAME& name, const HBA_NAME& initiator,
                                  const HBA_NAME& target, HBA_UINT64 lun, HBA_UINT32 state,
                                  HBA_UINT32 option);
  static RM_STATUS GetOASLunList(const HBA_NAME& name, std::vector<uint8_t>& record);
  static RM_STATUS nrvcimSetDriverParam(const HBA_NAME& name, bool global, bool persistent,
                                        const std::string& parameter, const std::string& value);
  // The driver-wide (global) or the port's parameter records.
  static RM_STATUS ReadDriverParams(const HBA_NAME& name, bool global,
                                    std::vector<RM_DRIVER_PARAM>& params);
  // The general VPD as (keyword, value) pairs in the library's order.
  static RM_STATUS ReadVPD(const HBA_NAME& name,
                           std::vector<std::pair<std::string, std::string>>& entries);

 private:
  // Closes and removes both semaphores and stops counting this wrapper.
  void releaseSemaphores();

  sem_t* m_Sem = nullptr;      // "/NRV_RM_INIT_LIB_<pid>", held while alive
  sem_t* m_DoneSem = nullptr;  // "/NRV_RM_INIT_LIB_DONE_<pid>", first initialiser only
  std::string m_SemName;
  std::string m_DoneSemName;
};

}  // namespace cimple
