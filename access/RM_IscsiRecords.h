// The iSCSI lists and records the management library answers for the SAN
// catalogue: target list, session list, session information, LUN list and
// LUN properties, with the offsets the library writes them at.
//
// Contract: plain little-endian data packed as the static_asserts state; lists
// are a 32-bit count at byte 0 and entries from byte 8.  Texts are
// NUL-terminated within their field unless the field is full, so readers cut
// them at the field's size.
#pragma once

#include "access/RM_Types.h"

inline constexpr size_t kRmIscsiListHeader = 8;

struct RM_ISCSI_TARGET_ENTRY {
  char name[512];          //   0 iSCSI name
  HBA_UINT8 flags;         // 512 RM_ISCSI_TARGET_HAS_SESSIONS, RM_ISCSI_TARGET_IS_BOOT
  HBA_UINT8 authMethod;    // 513
  HBA_UINT16 portalPort;   // 514 TCP port of the target portal
};
static_assert(sizeof(RM_ISCSI_TARGET_ENTRY) == 516);
inline constexpr HBA_UINT8 RM_ISCSI_TARGET_HAS_SESSIONS = 0x40;
inline constexpr HBA_UINT8 RM_ISCSI_TARGET_IS_BOOT = 0x01;

// Names a session for RM_iSCSI_GetSessionInfo.
struct RM_ISCSI_SESSION_ENTRY {
  HBA_UINT64 isid;        //  0 initiator session identifier (48 bits used)
  HBA_UINT16 tsih;        //  8 target session identifying handle
  HBA_UINT16 reserved0;   // 10
  HBA_UINT32 sessionId;   // 12 library's handle; also RM_ISCSI_SESSION_ID::sessionId
  HBA_UINT8 reserved1[16];
};
static_assert(sizeof(RM_ISCSI_SESSION_ENTRY) == 32);

struct RM_ISCSI_CONNECTION_INFO {
  HBA_UINT16 cid;          //  0
  HBA_UINT16 state;        //  2 0: connected
  RM_IP_ADDRESS local;     //  4 initiator address and TCP port
  RM_IP_ADDRESS remote;    // 24 target address and TCP port
};
static_assert(sizeof(RM_ISCSI_CONNECTION_INFO) == 44);

inline constexpr size_t kRmIscsiMaxConnections = 4;

struct RM_ISCSI_SESSION_INFO {
  HBA_UINT64 isid;                      //   0
  HBA_UINT16 tsih;                      //   8
  HBA_UINT16 connectionCount;           //  10 entries used in connections[]
  HBA_UINT32 state;                     //  12 0 open, 1 closed, 2 login in progress, 3 login failed, 4 recovery, 5 deleted
  HBA_UINT32 sessionId;                 //  16
  HBA_UINT32 reserved0;                 //  20
  char targetName[224];                 //  24
  char initiatorName[224];              // 248
  RM_ISCSI_CONNECTION_INFO connections[kRmIscsiMaxConnections];  // 472
  HBA_UINT8 reserved1[24];              // 648
};
static_assert(sizeof(RM_ISCSI_SESSION_INFO) == 672);

struct RM_ISCSI_LUN_ENTRY {
  HBA_UINT32 lun;
  HBA_UINT8 deviceType;   // SCSI peripheral device type
  HBA_UINT8 reserved[3];
};
static_assert(sizeof(RM_ISCSI_LUN_ENTRY) == 8);

struct RM_ISCSI_LUN_PROPERTIES {
  HBA_UINT32 lun;           //   0
  HBA_UINT8 deviceType;     //   4
  HBA_UINT8 reserved0[3];   //   5
  HBA_UINT64 blocks;        //   8 number of logical blocks
  HBA_UINT32 blockSize;     //  16
  HBA_UINT32 naaLength;     //  20 bytes used in naa[]
  char vendor[16];          //  24 INQUIRY vendor, trimmed
  char product[32];         //  40
  char revision[8];         //  72
  char serialNumber[64];    //  80
  char osDeviceName[64];    // 144
  HBA_UINT8 naa[16];        // 208 page 0x83 NAA designator
};
static_assert(sizeof(RM_ISCSI_LUN_PROPERTIES) == 224);
