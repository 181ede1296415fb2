// Records of the simulated management library whose layout the shared
// interface header leaves to the library: iSCSI target, session and LUN lists,
// session information, LUN properties, driver parameters, virtual-port
// attributes.  Little-endian, packed as the static_asserts state; the module's
// readers must use the same offsets (documented in sim/README.md).
#pragma once

#include "access/RM_Types.h"

namespace nrvsim::rm {

// RM_iSCSI_GetTargets: u32 count at 0, entries from byte 8.
inline constexpr size_t kTargetListHeader = 8;
struct IscsiTargetEntry {
  char name[512];          //   0 iSCSI name, NUL-terminated
  HBA_UINT8 flags;         // 512 0x40: the target has sessions; 0x01: boot target
  HBA_UINT8 authMethod;    // 513 RM_AUTH_*
  HBA_UINT16 portalPort;   // 514 TCP port of the target portal
};
static_assert(sizeof(IscsiTargetEntry) == 516);
inline constexpr HBA_UINT8 kTargetHasSessions = 0x40;
inline constexpr HBA_UINT8 kTargetIsBoot = 0x01;

// RM_iSCSI_GetSessions: u32 count at 0, entries from byte 8.
inline constexpr size_t kSessionListHeader = 8;
struct IscsiSessionEntry {
  HBA_UINT64 isid;        //  0 initiator session identifier (48 bits used)
  HBA_UINT16 tsih;        //  8 target session identifying handle
  HBA_UINT16 reserved0;   // 10
  HBA_UINT32 sessionId;   // 12 library's handle; also RM_ISCSI_SESSION_ID::sessionId
  HBA_UINT8 reserved1[16];
};
static_assert(sizeof(IscsiSessionEntry) == 32);

struct IscsiConnectionInfo {
  HBA_UINT16 cid;          //  0
  HBA_UINT16 state;        //  2 0: connected
  RM_IP_ADDRESS local;     //  4 initiator address and TCP port
  RM_IP_ADDRESS remote;    // 24 target address and TCP port
};
static_assert(sizeof(IscsiConnectionInfo) == 44);

// RM_iSCSI_GetSessionInfo(name, IscsiSessionEntry*, record, size): 672 bytes.
struct IscsiSessionInfo {
  HBA_UINT64 isid;                      //   0
  HBA_UINT16 tsih;                      //   8
  HBA_UINT16 connectionCount;           //  10 entries used in connections[]
  HBA_UINT32 state;                     //  12 0 open, 1 closed, 2 login in progress, 3 login failed, 4 recovery, 5 deleted
  HBA_UINT32 sessionId;                 //  16
  HBA_UINT32 reserved0;                 //  20
  char targetName[224];                 //  24
  char initiatorName[224];              // 248
  IscsiConnectionInfo connections[4];   // 472
  HBA_UINT8 reserved1[24];              // 648
};
static_assert(sizeof(IscsiSessionInfo) == 672);

// RM_iSCSI_GetLuns: u32 count at 0, entries from byte 8.
inline constexpr size_t kLunListHeader = 8;
struct IscsiLunEntry {
  HBA_UINT32 lun;
  HBA_UINT8 deviceType;   // SCSI peripheral device type
  HBA_UINT8 reserved[3];
};
static_assert(sizeof(IscsiLunEntry) == 8);

// RM_iSCSI_GetLunProperties.
struct IscsiLunProperties {
  HBA_UINT32 lun;           //   0
  HBA_UINT8 deviceType;     //   4
  HBA_UINT8 reserved0[3];   //   5
  HBA_UINT64 blocks;        //   8 number of logical blocks
  HBA_UINT32 blockSize;     //  16
  HBA_UINT32 naaLength;     //  20 bytes used in naa[]
  char vendor[16];          //  24 INQUIRY vendor, trimmed, NUL-terminated
  char product[32];         //  40
  char revision[8];         //  72
  char serialNumber[64];    //  80
  char osDeviceName[64];    // 144
  HBA_UINT8 naa[16];        // 208 page 0x83 NAA designator
};
static_assert(sizeof(IscsiLunProperties) == 224);

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
