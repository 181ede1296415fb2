// Value types exchanged with the adapter management library (liblrmapi /
// librmapi): names, statuses, instance pairs and the fixed-layout records.
//
// Contract: every record here is plain data, little-endian, packed exactly as
// the static_asserts below state; both this module and any library standing in
// for the real one (the simulator under sim/) build against these definitions.
// Fields the module never reads are marked "library's" and may hold anything.
#pragma once

#include <stddef.h>
#include <stdint.h>
#include <time.h>  // hbaapi.h uses struct tm without including it

#include <hbaapi.h>

// The 8-byte world-wide port name by which the library names an adapter
// function or port.  Passed by value.
typedef HBA_WWN HBA_NAME;
static_assert(sizeof(HBA_NAME) == 8, "HBA_NAME is 8 bytes");

// 32-bit library status; 0 is success.
typedef HBA_UINT32 RM_STATUS;

// ---- Status values callers rely on -----------------------------------------
enum : RM_STATUS {
  RM_STATUS_SUCCESS = 0,
  RM_STATUS_ERROR = 1,                      // generic failure; forwarder failure value
  RM_STATUS_NOT_SUPPORTED = 2,              // beacon / feature not supported
  RM_STATUS_ERROR_BUFFER_TOO_SMALL = 7,     // list too small; count updated
  RM_STATUS_ERROR_DIAG_IN_PROGRESS = 60,    // diagnostic still running
  RM_STATUS_DIAG_NOT_AVAILABLE = 63,        // diagnostics service unavailable
  RM_STATUS_ISCSI_DIGEST_MISMATCH = 116,    // portal add refused the digests
  RM_STATUS_ITEM_NOT_OFFERED = 190,         // adapter does not offer the item
  RM_STATUS_ERROR_MORE_DATA = 191,          // name/parameter buffer too small
  RM_STATUS_REBOOT_REQUIRED = 247,          // done; reboot to activate
};

// ---- Adapter enumeration ----------------------------------------------------
// Names an adapter during discovery: { 0, instance number }, passed by pointer.
struct RM_ADAPTER_INSTANCE {
  HBA_UINT32 reserved;  // always 0
  HBA_UINT32 instance;
};
static_assert(sizeof(RM_ADAPTER_INSTANCE) == 8);

// Protocol-mask bits of the local HBA information record.
enum : HBA_UINT32 {
  RM_PROTOCOL_ISCSI = 0x04,
  RM_PROTOCOL_NIC = 0x08,
  RM_PROTOCOL_FCOE = 0x10,
  RM_PROTOCOL_NIC2 = 0x400,
  RM_PROTOCOL_HANDLED_MASK = 0x41C,
};

// Local HBA information, V4 form (284 bytes); the V3 form (248 bytes) is its
// prefix.  Offsets 0, 92, 240 and 244 are what discovery reads; the rest is
// the layout this module and the simulator agree on.
struct RM_LOCAL_HBA_INFO_V4 {
  HBA_NAME wwpn;                 //   0 adapter/port identifier
  HBA_NAME wwnn;                 //   8 node name
  char serialNumber[32];         //  16
  char driverName[44];           //  48
  char modelName[64];            //  92 NUL-terminated
  char osDeviceName[64];         // 156 interface name ("eth0") or device
  HBA_UINT32 boardNumber;        // 220
  HBA_UINT32 pciBus;             // 224
  HBA_UINT32 pciDevice;          // 228
  HBA_UINT16 vendorId;           // 232
  HBA_UINT16 deviceId;           // 234
  HBA_UINT16 subVendorId;        // 236
  HBA_UINT16 subDeviceId;        // 238
  HBA_UINT16 functionNumber;     // 240
  HBA_UINT16 physicalPort;       // 242
  HBA_UINT32 protocolMask;       // 244 RM_PROTOCOL_* bits
  // ---- V4 only ----
  HBA_UINT32 specialFeatures;    // 248
  HBA_UINT8 macAddress[6];       // 252 permanent MAC of the function
  HBA_UINT8 reserved0[2];        // 258
  HBA_UINT32 virtualPortCount;   // 260 library's
  HBA_UINT8 reserved1[20];       // 264 library's
};
static_assert(sizeof(RM_LOCAL_HBA_INFO_V4) == 284);
static_assert(offsetof(RM_LOCAL_HBA_INFO_V4, modelName) == 92);
static_assert(offsetof(RM_LOCAL_HBA_INFO_V4, functionNumber) == 240);
static_assert(offsetof(RM_LOCAL_HBA_INFO_V4, protocolMask) == 244);

inline constexpr size_t RM_LOCAL_HBA_INFO_V3_SIZE = 248;

// The V3 record: the first 248 bytes of the V4 one.
struct RM_LOCAL_HBA_INFO_V3 {
  unsigned char bytes[RM_LOCAL_HBA_INFO_V3_SIZE];
};
static_assert(sizeof(RM_LOCAL_HBA_INFO_V3) == 248);
static_assert(offsetof(RM_LOCAL_HBA_INFO_V4, specialFeatures) == RM_LOCAL_HBA_INFO_V3_SIZE);

// The un-versioned RM_GetLocalHBAInfo answers the V3 record.
typedef RM_LOCAL_HBA_INFO_V3 RM_LOCAL_HBA_INFO;

// ---- Address record (portals, iSNS servers, ping, ARP and route entries) ----
enum : HBA_UINT8 { RM_IP_FLAG_IPV6 = 0x01 };

struct RM_IP_ADDRESS {
  HBA_UINT8 address[16];  // IPv4 in the first 4 bytes, in dotted order
  HBA_UINT16 port;        // 16
  HBA_UINT8 flags;        // 18 bit 0: IPv6
  HBA_UINT8 reserved;     // 19
};
static_assert(sizeof(RM_IP_ADDRESS) == 20);
static_assert(offsetof(RM_IP_ADDRESS, port) == 16);
static_assert(offsetof(RM_IP_ADDRESS, flags) == 18);

// ---- iSCSI records ----------------------------------------------------------
struct RM_ISCSI_LOGIN_OPTIONS {
  HBA_UINT8 reserved;       // library's
  HBA_UINT8 immediateData;  // 0 or 1
  HBA_UINT8 headerDigest;
  HBA_UINT8 dataDigest;
};
static_assert(sizeof(RM_ISCSI_LOGIN_OPTIONS) == 4);

enum : HBA_UINT32 { RM_AUTH_NONE = 0, RM_AUTH_ONE_WAY_CHAP = 1, RM_AUTH_MUTUAL_CHAP = 2 };

struct RM_ISCSI_AUTH {
  HBA_UINT32 method;              //    0 RM_AUTH_*
  char initiatorChapName[512];    //    4
  char targetChapName[512];       //  516
  char initiatorSecret[256];      // 1028
  char targetSecret[256];         // 1284
  HBA_UINT8 hasInitiatorChapName; // 1540 presence bytes: 1 = carries a value
  HBA_UINT8 hasTargetChapName;
  HBA_UINT8 hasInitiatorSecret;
  HBA_UINT8 hasTargetSecret;
};
static_assert(sizeof(RM_ISCSI_AUTH) == 1544);
static_assert(offsetof(RM_ISCSI_AUTH, targetChapName) == 516);
static_assert(offsetof(RM_ISCSI_AUTH, initiatorSecret) == 1028);
static_assert(offsetof(RM_ISCSI_AUTH, targetSecret) == 1284);
static_assert(offsetof(RM_ISCSI_AUTH, hasInitiatorChapName) == 1540);

struct RM_ISCSI_PORTAL_PROPERTIES {
  RM_IP_ADDRESS address;
  RM_ISCSI_LOGIN_OPTIONS loginOptions;
  RM_ISCSI_AUTH auth;
};
static_assert(sizeof(RM_ISCSI_PORTAL_PROPERTIES) == 1568);

struct RM_ISCSI_INITIATOR_PROPERTIES {
  char initiatorName[256];              //    0 at most 255 characters used
  char initiatorAlias[256];             //  256
  HBA_UINT8 library0[256];              //  512 library's
  RM_ISCSI_LOGIN_OPTIONS loginOptions;  //  768
  RM_ISCSI_AUTH auth;                   //  772
};
// The authentication record at 772 runs to 2316, four bytes past the 2312
// often quoted for this record; the record is sized to hold it whole so that
// copying the presence bytes never writes past the caller's buffer.
static_assert(sizeof(RM_ISCSI_INITIATOR_PROPERTIES) == 2316);
static_assert(offsetof(RM_ISCSI_INITIATOR_PROPERTIES, loginOptions) == 768);
static_assert(offsetof(RM_ISCSI_INITIATOR_PROPERTIES, auth) == 772);

// The separate block that RM_iSCSI_GetInitiatorProperties fills beside the record.
inline constexpr size_t RM_ISCSI_INITIATOR_EXTRA_SIZE = 36;
struct RM_ISCSI_INITIATOR_EXTRA {
  HBA_UINT8 bytes[RM_ISCSI_INITIATOR_EXTRA_SIZE];  // library's
};

struct RM_ISCSI_TARGET_PROPERTIES {
  HBA_UINT8 library0[516];            //   0 library's
  HBA_UINT32 extendedTimeOut;         // 516
  HBA_UINT8 library1[3];              // 520
  HBA_UINT8 statusDetail;             // 523 set by the library on refusal
  HBA_UINT8 library2[4];              // 524
};
static_assert(sizeof(RM_ISCSI_TARGET_PROPERTIES) == 528);
static_assert(offsetof(RM_ISCSI_TARGET_PROPERTIES, extendedTimeOut) == 516);
static_assert(offsetof(RM_ISCSI_TARGET_PROPERTIES, statusDetail) == 523);

// Names one session for logout and boot-session calls.
struct RM_ISCSI_SESSION_ID {
  HBA_UINT32 sessionId;          //  0
  RM_IP_ADDRESS targetAddress;   //  4 dotted IPv4 when present
  HBA_UINT8 hasTargetAddress;    // 24 1 = targetAddress carries a value
  HBA_UINT8 reserved[3];
};
static_assert(sizeof(RM_ISCSI_SESSION_ID) == 28);

// Network settings written with LRM_Ini_SetNetworkProperties (160 bytes).
struct RM_NETWORK_SETTINGS {
  HBA_UINT8 header[6];          //   0 first six bytes of the port name
  HBA_UINT8 reserved0[2];       //   6
  RM_IP_ADDRESS ipv4Address;    //   8
  RM_IP_ADDRESS subnetMask;     //  28
  RM_IP_ADDRESS gateway;        //  48
  HBA_UINT8 reserved1[2];       //  68
  HBA_UINT8 vlanId;             //  70
  HBA_UINT8 reserved2[2];       //  71
  HBA_UINT8 vlanEnabled;        //  73
  HBA_UINT8 reserved3[3];       //  74
  HBA_UINT8 priority;           //  77
  HBA_UINT8 reserved4[82];      //  78
};
static_assert(sizeof(RM_NETWORK_SETTINGS) == 160);
static_assert(offsetof(RM_NETWORK_SETTINGS, subnetMask) == 28);
static_assert(offsetof(RM_NETWORK_SETTINGS, vlanId) == 70);
static_assert(offsetof(RM_NETWORK_SETTINGS, vlanEnabled) == 73);
static_assert(offsetof(RM_NETWORK_SETTINGS, priority) == 77);

// ---- ARP and route entries --------------------------------------------------
struct RM_ARP_ENTRY {
  RM_IP_ADDRESS ipAddress;     // destination IP
  HBA_UINT8 macAddress[6];     // destination MAC
  HBA_UINT8 reserved[2];
};
static_assert(sizeof(RM_ARP_ENTRY) == 28);

struct RM_ROUTE_ENTRY {
  RM_IP_ADDRESS destination;
  RM_IP_ADDRESS subnetMask;
  RM_IP_ADDRESS gateway;
};
static_assert(sizeof(RM_ROUTE_ENTRY) == 60);

// Tables (LRM_Ini_GetARPTable / LRM_Ini_GetRouteTable, iSNS server list) are a
// 32-bit entry count followed by the entries; the size argument is the buffer
// size in bytes.  Status 7 answers "too small" with the count needed.
struct RM_TABLE_HEADER {
  HBA_UINT32 count;
};

// ---- Diagnostics ------------------------------------------------------------
enum : HBA_UINT32 {
  RM_DIAG_STATE_RUNNING = 1,
  RM_DIAG_STATE_PENDING = 2,
  RM_DIAG_STATE_CANCELLED = 4,
  RM_DIAG_STATE_FINISHED = 6,
};

struct RM_DIAG_RESULT {
  HBA_UINT32 state;            // RM_DIAG_STATE_*
  HBA_UINT32 cyclesComplete;
  HBA_UINT32 timeToExecuteMs;
  HBA_UINT32 result;           // 0 success, else a library failure code
  HBA_UINT32 errorCycles;
  HBA_UINT32 transmitErrors;
  HBA_UINT32 receiveErrors;
  HBA_UINT32 xmitErrors;
  char resultText[64];         // "Success" or the failure text
  HBA_INT32 pairLengthCm[4];   // TDR: cable length per pair A..D, -1 invalid
  HBA_UINT32 pairStatus[4];    // TDR: 0 OK, 1 open, 2 short, other library's
};
static_assert(sizeof(RM_DIAG_RESULT) == 128);

// ---- FCF list ---------------------------------------------------------------
struct RM_FCF_ENTRY {
  HBA_NAME fabricName;         //   0
  HBA_NAME switchName;         //   8
  HBA_UINT8 fcfMac[6];         //  16
  HBA_UINT16 state;            //  22
  HBA_UINT8 vlanBitmap[512];   //  24 VLAN n: bit n%8 of byte n/8
  HBA_UINT8 fcMap[3];          // 536
  HBA_UINT8 reserved0;         // 539
  HBA_UINT32 period;           // 540
  HBA_UINT8 reserved1[2];      // 544
  HBA_UINT16 priority;         // 546
  HBA_UINT8 reserved2[4];      // 548
};
static_assert(sizeof(RM_FCF_ENTRY) == 552);
static_assert(offsetof(RM_FCF_ENTRY, fcMap) == 536);
static_assert(offsetof(RM_FCF_ENTRY, priority) == 546);

struct RM_FCF_LIST_HEADER {
  HBA_UINT32 count;        // in: capacity; out: number of entries
  HBA_UINT32 activeCount;  // number of active FCFs
};
static_assert(sizeof(RM_FCF_LIST_HEADER) == 8);

// ---- Virtual ports ----------------------------------------------------------
// LRM_VPList answers a 32-bit count followed by 24-byte entries.
struct RM_VPORT_ENTRY {
  HBA_UINT32 reserved;
  HBA_NAME portName;   //  4 (bytes 4..11 of the entry)
  HBA_NAME nodeName;   // 12
  HBA_UINT32 fcId;     // 20
};
static_assert(sizeof(RM_VPORT_ENTRY) == 24);

// LRM_VPGetAttributes answers one virtual port's attributes.
struct RM_VPORT_ATTRIBUTES {
  HBA_NAME portName;   //   0
  HBA_NAME nodeName;   //   8
  HBA_UINT32 fcId;     //  16
  HBA_UINT32 state;    //  20 1 online
  char name[64];       //  24 the virtual port's symbolic name, NUL-terminated
  char vmName[64];     //  88 the virtual machine using it
};
static_assert(sizeof(RM_VPORT_ATTRIBUTES) == 152);
static_assert(offsetof(RM_VPORT_ATTRIBUTES, name) == 24);

// ---- Dump file names ---------------------------------------------------------
// LRM_GetDumpFileNames: a 32-bit count (in: capacity, out: number needed or
// written) followed by that many 256-byte names; 191 means "too small".
inline constexpr size_t RM_DUMP_FILE_NAME_SIZE = 256;

// ---- Dead NIC ports ------------------------------------------------------------
// RM_ListDeadNicPorts: a 32-bit count followed by 64-byte NUL-terminated port
// identifier texts (the adapter's MAC or WWPN text).
inline constexpr size_t RM_DEAD_NIC_PORT_ENTRY_SIZE = 64;

// ---- Event callback -----------------------------------------------------------
typedef void (*RM_EVENT_CALLBACK)(void* userData, HBA_NAME port, HBA_UINT32 eventType);

// ---- Sizes callers pass --------------------------------------------------------
inline constexpr HBA_UINT32 RM_HBA_ATTRIBUTES_SIZE = 2864;
inline constexpr HBA_UINT32 RM_HBA_ATTRIBUTES_FLASH_QUERY_SIZE = 2048;
inline constexpr HBA_UINT32 RM_PORT_ATTRIBUTES_SIZE = 2048;
inline constexpr HBA_UINT32 RM_PORT_STATE_SIZE = 2048;
inline constexpr HBA_UINT32 RM_PORT_STATISTICS_SIZE = 512;
inline constexpr HBA_UINT32 RM_VPD_SIZE = 1024;
inline constexpr HBA_UINT32 RM_VPD_V2_SIZE = 1536;
inline constexpr HBA_UINT32 RM_SFF_DATA_SIZE = 948;
inline constexpr HBA_UINT32 RM_CEE_PARAMS_SIZE = 1520;
inline constexpr HBA_UINT32 RM_STATUS_STRING_SIZE = 256;
inline constexpr HBA_UINT32 RM_VPD_KEYWORD_SIZE = 4;
inline constexpr HBA_UINT32 RM_VPD_VALUE_SIZE = 256;
