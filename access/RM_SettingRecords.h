// Records and numbers of the management library's setting calls (FIP, CEE,
// QoS, channel management, network boot, dump settings) whose layout only the
// method wrapper and whatever stands in for the library need to agree on.
//
// Contract: plain little-endian data, packed as the static_asserts state; a
// library standing in for the real one includes this header to answer these
// calls.  Fields marked "library's" may hold anything.
#pragma once

#include "access/RM_Types.h"

// ---- FCoE initialization protocol ----------------------------------------------
// LRM_CNA_FCOE_GetFCFConnectList / SetFCFConnectList.
enum : HBA_UINT32 { RM_FCF_CONNECT_VLAN_VALID = 0x20 };
struct RM_FCF_CONNECT_LIST {
  HBA_NAME fabricName;  //  0
  HBA_NAME switchName;  //  8
  HBA_UINT32 flags;     // 16 RM_FCF_CONNECT_VLAN_VALID: vlanId holds the VLAN
  HBA_UINT16 vlanId;    // 20
  HBA_UINT8 reserved[2];
};
static_assert(sizeof(RM_FCF_CONNECT_LIST) == 24);

// LRM_CNA_FCOE_GetFIPParams / SetFIPParams.
struct RM_FIP_PARAMS {
  HBA_UINT8 fcMap[3];    // 0
  HBA_UINT8 reserved;    // 3
  HBA_UINT32 cinVlanId;  // 4
  HBA_UINT8 library[8];  // 8 library's
};
static_assert(sizeof(RM_FIP_PARAMS) == 16);

// ---- Converged Ethernet (CEE / DCB) ------------------------------------------------
// One item written by LRM_CNA_SetDcbxPortVars, SetLldp, SetPFC or SetPGSetting.
enum : HBA_UINT32 {
  RM_CEE_DCBX_STATE = 1,
  RM_CEE_LLDP_TX_STATE = 2,
  RM_CEE_LLDP_RX_STATE = 3,
  RM_CEE_PFC_ENABLED = 4,
  RM_CEE_FCOE_PRIORITY = 5,
  RM_CEE_ISCSI_PRIORITY = 6,
  RM_CEE_ROCE_PRIORITY = 7,
};
struct RM_CEE_ITEM {
  HBA_UINT32 item;  // RM_CEE_*
  HBA_UINT32 value;
};
static_assert(sizeof(RM_CEE_ITEM) == 8);

// TLV numbers of LRM_CNA_SetTLV / GetTLV (4-byte value: 1 transmit, 0 not).
enum : HBA_UINT32 {
  RM_TLV_PORT_DESCRIPTION = 4,
  RM_TLV_SYSTEM_NAME = 5,
  RM_TLV_SYSTEM_DESCRIPTION = 6,
  RM_TLV_SYSTEM_CAPABILITIES = 7,
};

// Priority-group bitmaps: one bitmap of priorities per group 0..7, and group 15.
struct RM_PG_PRIORITY_BITMAPS {
  HBA_UINT8 groups[8];
  HBA_UINT8 group15;
  HBA_UINT8 reserved[3];
};
static_assert(sizeof(RM_PG_PRIORITY_BITMAPS) == 12);

// PFC: bitmap of the priorities with flow control.
struct RM_PFC_SETTING {
  HBA_UINT8 priorityBitmap;
  HBA_UINT8 reserved[3];
};
static_assert(sizeof(RM_PFC_SETTING) == 4);

// Group bandwidths in percent.
struct RM_PG_BANDWIDTH {
  HBA_UINT8 percent[8];
};
static_assert(sizeof(RM_PG_BANDWIDTH) == 8);

// ---- QoS limits (LRM_GetQoS / LRM_SetQoS) ------------------------------------------
struct RM_QOS_LIMITS {
  HBA_UINT32 maxBytesPerSecond;  // iSCSI
  HBA_UINT32 maxIOsPerSecond;    // iSCSI
  HBA_UINT32 maxBitsPerSecond;   // NIC bandwidth
  HBA_UINT32 reserved;
};
static_assert(sizeof(RM_QOS_LIMITS) == 16);

// ---- Adapter attributes the wrapper reads or writes ------------------------------
enum : HBA_UINT16 {
  RM_HA_NETBOOT_METHOD = 592,        // text "pxe" or "ibft"
  RM_HA_NETBOOT_BOTH_METHODS = 593,  // 32-bit: 1 when both methods are offered
};
// LRM_SetAdapterAttribute RM_PA_PHY_LINE_RATE_ADVERTISED: bits of the rates.
enum : HBA_UINT32 {
  RM_LINE_RATE_10G = 0x1,
  RM_LINE_RATE_1G = 0x2,
  RM_LINE_RATE_100MB = 0x4,
};

// ---- Firmware download statuses -------------------------------------------------------
enum : RM_STATUS {
  RM_STATUS_MAILBOX_BUSY = 17,
  RM_STATUS_MAILBOX_FAILED = 18,
};

// ---- Server attributes (LRM_GetServerAttributes) -------------------------------------
// The record opens with the target operating-system text.
inline constexpr size_t RM_TARGET_OS_TEXT_SIZE = 41;  // 40 characters and the terminator
inline constexpr HBA_UINT32 RM_SERVER_ATTRIBUTES_SIZE = 512;

// ---- FCoE driver parameters (LRM_GetDriverParams / GetDriverParamsGlobal) ----------
// The count argument is a number of these records, in and out.
struct RM_DRIVER_PARAM {
  char name[32];              //   0
  HBA_UINT32 minValue;        //  32
  HBA_UINT32 maxValue;        //  36
  HBA_UINT32 defaultValue;    //  40
  HBA_UINT32 currentValue;    //  44
  HBA_UINT32 reserved0;       //  48
  char help[44];              //  52
  HBA_UINT32 exportFlag;      //  96
  HBA_UINT32 changeableType;  // 100
  HBA_UINT8 reserved1[28];    // 104 library's
};
static_assert(sizeof(RM_DRIVER_PARAM) == 132);
static_assert(offsetof(RM_DRIVER_PARAM, help) == 52);
static_assert(offsetof(RM_DRIVER_PARAM, changeableType) == 100);

// ---- Event-log (extended FAT dump) configuration ---------------------------------------
// LRM_Get_VG_EventLogConfigDataAll answers a header and one record per firmware
// module; the size argument is in bytes and "too small" (7) answers the size
// needed.  Mode i of a module is the flag 1 << i; trace levels are the
// library's numbers 1 (disable) to 11 (always).
enum : HBA_UINT32 {
  RM_EVENT_LOG_MODE_RAM = 0x1,
  RM_EVENT_LOG_MODE_UART = 0x2,
  RM_EVENT_LOG_MODE_NVRAM = 0x4,
  RM_EVENT_LOG_MODE_TFTP = 0x8,
};
inline constexpr size_t RM_EVENT_LOG_MODE_COUNT = 4;  // ram, uart, nvram, tftp

struct RM_EVENT_LOG_MODE_SETTING {
  HBA_UINT32 traceLevel;   // 0 library's numbering
  HBA_UINT32 portMask;     // 4 ports the mode logs for
  HBA_UINT32 pciFuncMask;  // 8 PCI functions the mode logs for
};
static_assert(sizeof(RM_EVENT_LOG_MODE_SETTING) == 12);

struct RM_EVENT_LOG_MODULE {
  char name[32];                                              //  0 NUL-terminated
  HBA_UINT32 modeFlags;                                       // 32 RM_EVENT_LOG_MODE_* the module logs to
  RM_EVENT_LOG_MODE_SETTING modes[RM_EVENT_LOG_MODE_COUNT];  // 36 by mode index; meaningful when its flag is set
};
static_assert(sizeof(RM_EVENT_LOG_MODULE) == 84);
static_assert(offsetof(RM_EVENT_LOG_MODULE, modes) == 36);

struct RM_EVENT_LOG_CONFIG_HEADER {
  HBA_UINT32 count;     // modules that follow
  HBA_UINT32 reserved;  // library's
};
static_assert(sizeof(RM_EVENT_LOG_CONFIG_HEADER) == 8);
