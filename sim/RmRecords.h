// Records of the simulated management library whose layout the shared
// interface header leaves to the library: iSCSI target, session and LUN lists,
// session information, LUN properties, driver parameters, virtual-port
// attributes.  Little-endian, packed as the static_asserts state; the module's
// readers must use the same offsets (documented in sim/README.md).
#pragma once

#include "access/RM_IscsiRecords.h"
#include "access/RM_Types.h"

namespace nrvsim::rm {

// The iSCSI lists and records are the module's (access/RM_IscsiRecords.h).
inline constexpr size_t kTargetListHeader = kRmIscsiListHeader;
inline constexpr size_t kSessionListHeader = kRmIscsiListHeader;
inline constexpr size_t kLunListHeader = kRmIscsiListHeader;
using IscsiTargetEntry = RM_ISCSI_TARGET_ENTRY;
using IscsiSessionEntry = RM_ISCSI_SESSION_ENTRY;
using IscsiConnectionInfo = RM_ISCSI_CONNECTION_INFO;
using IscsiSessionInfo = RM_ISCSI_SESSION_INFO;
using IscsiLunEntry = RM_ISCSI_LUN_ENTRY;
using IscsiLunProperties = RM_ISCSI_LUN_PROPERTIES;
inline constexpr HBA_UINT8 kTargetHasSessions = RM_ISCSI_TARGET_HAS_SESSIONS;
inline constexpr HBA_UINT8 kTargetIsBoot = RM_ISCSI_TARGET_IS_BOOT;

// RM_GetDriverParams / RM_GetDriverParamsGlobal: an array of these.
struct DriverParamRecord {
  char name[32];             //   0
  HBA_UINT32 minValue;       //  32
  HBA_UINT32 maxValue;       //  36
  HBA_UINT32 defaultValue;   //  40
  HBA_UINT32 currentValue;   //  44
  HBA_UINT32 reserved0;      //  48
  char help[44];             //  52
  HBA_UINT32 exportFlag;     //  96
  HBA_UINT32 changeableType; // 100
  HBA_UINT8 reserved1[28];   // 104
};
static_assert(sizeof(DriverParamRecord) == 132);

// RM_VPGetAttributes: the shared record.
using VPortAttributes = RM_VPORT_ATTRIBUTES;

// RM_DiagReadPCIRegistersV2 answers the standard 256-byte configuration space.
inline constexpr HBA_UINT32 kPciConfigSize = 256;

}  // namespace nrvsim::rm
