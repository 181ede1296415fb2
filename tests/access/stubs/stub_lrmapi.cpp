// Test stand-in for liblrmapi: a few LRM_ functions, the RM_-only functions
// the module looks up in it, and controls for the initialisation test.
#include <atomic>
#include <condition_variable>
#include <cstdio>
#include <cstring>
#include <string>
#include <mutex>

#include "access/RM_Api.h"
#include "access/RM_SettingRecords.h"

namespace {
std::atomic<int> g_initCalls{0};
std::mutex g_mutex;
std::condition_variable g_cv;
bool g_holdInit = false;
bool g_inInit = false;

// Calls of the wrapper scenarios, in order ("name item value;" each).
std::string g_calls;
bool g_portalHasDigests = false;
void record(const char* call, HBA_UINT32 item = 0, HBA_UINT32 value = 0) {
  std::lock_guard<std::mutex> lock(g_mutex);
  char text[96];
  std::snprintf(text, sizeof text, "%s %u %u;", call, item, value);
  g_calls += text;
}

// Count-prefixed answer of `total` entries of `entry` bytes: 7 (count set)
// when `size` bytes cannot hold them.
RM_STATUS table(void* buffer, HBA_UINT32* size, HBA_UINT32 total, size_t entry) {
  HBA_UINT32* count = static_cast<HBA_UINT32*>(buffer);
  if (*size < sizeof(HBA_UINT32) + total * entry) {
    *count = total;
    return 7;
  }
  *count = total;
  auto* bytes = static_cast<unsigned char*>(buffer) + sizeof(HBA_UINT32);
  for (HBA_UINT32 i = 0; i < total; ++i) std::memset(bytes + i * entry, static_cast<int>(i + 1), entry);
  return 0;
}
}  // namespace

extern "C" {

// Controls: make LRM_InitLib wait until released, and observe it.
void stub_hold_init(int hold) {
  std::lock_guard<std::mutex> lock(g_mutex);
  g_holdInit = hold != 0;
  g_cv.notify_all();
}
void stub_wait_in_init() {
  std::unique_lock<std::mutex> lock(g_mutex);
  g_cv.wait(lock, [] { return g_inInit; });
}
int stub_init_calls() { return g_initCalls.load(); }
RM_STATUS g_stub_init_result = 0;

RM_STATUS LRM_InitLib(void) {
  g_initCalls.fetch_add(1);
  std::unique_lock<std::mutex> lock(g_mutex);
  g_inInit = true;
  g_cv.notify_all();
  g_cv.wait(lock, [] { return !g_holdInit; });
  g_inInit = false;
  return g_stub_init_result;
}

RM_STATUS LRM_GetHBAFeature(HBA_NAME name, HBA_UINT32 feature, HBA_UINT32* flag) {
  // Feature n is offered when n is named in the port name's last byte, or is 201/403.
  *flag = (feature == name.wwn[7] || feature == 201 || feature == 403) ? 1 : 0;
  return name.wwn[6] == 0xEE ? 190 : 0;
}

HBA_UINT32 RM_GetNumberOfLocalAdapters(void) { return 3; }

RM_STATUS RM_IsLocalHBA(HBA_NAME name, HBA_UINT32* isLocal) {
  *isLocal = name.wwn[0] == 0x20 ? 1 : 0;
  return name.wwn[0] == 0xFF ? 5 : 0;
}

RM_STATUS RM_StatusString(RM_STATUS status, char* text, HBA_UINT32 size) {
  if (status == 99) {
    if (size) text[0] = 0;
    return 0;
  }
  std::snprintf(text, size, "stub status %u", status);
  return 0;
}

RM_STATUS RM_GetVersion(HBA_UINT32 library, char* text, HBA_UINT32 size) {
  std::snprintf(text, size, library == 104 ? "dfc 5.2" : "12.4.270.9");
  return 0;
}

RM_STATUS RM_TiroVersion(char* text, HBA_UINT32 size) {
  std::snprintf(text, size, "3.1");
  return 0;
}

HBA_INT32 NrvGetBoardNumber(HBA_NAME) { return 7; }

RM_STATUS LRM_Ini_GetARPTable(HBA_NAME, void* table, HBA_UINT32* size) {
  if (*size < sizeof(HBA_UINT32)) return 7;
  static_cast<RM_TABLE_HEADER*>(table)->count = 0;
  return 0;
}

// ---- Wrapper scenarios -------------------------------------------------------
const char* stub_calls() { return g_calls.c_str(); }
void stub_clear_calls() {
  std::lock_guard<std::mutex> lock(g_mutex);
  g_calls.clear();
}
void stub_set_portal_digests(int on) { g_portalHasDigests = on != 0; }

RM_STATUS LRM_Ping(HBA_NAME, const RM_IP_ADDRESS* address, HBA_UINT8* reachable) {
  record("ping", address->address[0], address->port);
  // 10.x.x.x answers; everything else is silent.
  *reachable = address->address[0] == 10 ? 1 : 0;
  return 0;
}
RM_STATUS LRM_iSCSI_AddiSNSServer(HBA_NAME, const RM_IP_ADDRESS* address) {
  record("addisns", address->address[0], address->port);
  return address->address[0] == 192 ? 33 : 0;
}
RM_STATUS LRM_iSCSI_SetiSNSState(HBA_NAME, HBA_UINT32 enable) {
  record("isnsstate", enable);
  return 0;
}
RM_STATUS LRM_iSCSI_AddSendTargetPortal(HBA_NAME, const RM_IP_ADDRESS* address, HBA_UINT32,
                                        RM_ISCSI_LOGIN_OPTIONS* options, const RM_ISCSI_AUTH*) {
  record("addportal", options->headerDigest, options->dataDigest);
  if (!g_portalHasDigests) return 0;
  options->headerDigest = 1;  // what the existing portal carries
  (void)address;
  return 116;
}
RM_STATUS LRM_iSCSI_RemoveSendTargetPortal(HBA_NAME, const RM_IP_ADDRESS*) {
  record("removeportal");
  g_portalHasDigests = false;
  return 0;
}
RM_STATUS LRM_iSCSI_TargetLogout(HBA_NAME, const char*, const RM_ISCSI_SESSION_ID* session) {
  record("logout", session->sessionId, session->hasTargetAddress);
  return 0;
}

RM_STATUS LRM_CNA_FCOE_GetFCFConnectList(HBA_NAME name, void* record_, HBA_UINT32* size) {
  if (*size < sizeof(RM_FCF_CONNECT_LIST)) return 7;
  auto* list = static_cast<RM_FCF_CONNECT_LIST*>(record_);
  const HBA_NAME fabric{{0x10, 0x00, 0x00, 0x00, 0xC9, 0xAA, 0xBB, 0xCC}};
  const HBA_NAME sw{{0x20, 0x01, 0x00, 0x05, 0x1E, 0x0A, 0x0B, 0x0C}};
  list->fabricName = fabric;
  list->switchName = sw;
  list->flags = name.wwn[5] == 1 ? HBA_UINT32{RM_FCF_CONNECT_VLAN_VALID} : 0u;
  list->vlanId = 1002;
  return 0;
}
RM_STATUS LRM_CNA_FCOE_GetFIPParams(HBA_NAME, void* record_, HBA_UINT32* size) {
  if (*size < sizeof(RM_FIP_PARAMS)) return 7;
  auto* fip = static_cast<RM_FIP_PARAMS*>(record_);
  fip->fcMap[0] = 0x0E;
  fip->fcMap[1] = 0xFC;
  fip->fcMap[2] = 0x00;
  fip->cinVlanId = 7;
  return 0;
}
RM_STATUS LRM_CNA_FCOE_SetFCFConnectList(HBA_NAME, const void* record_, HBA_UINT32) {
  const auto* list = static_cast<const RM_FCF_CONNECT_LIST*>(record_);
  record("setfcf", list->flags, list->vlanId);
  return 0;
}
RM_STATUS LRM_CNA_FCOE_SetFIPParams(HBA_NAME, const void* record_, HBA_UINT32) {
  const auto* fip = static_cast<const RM_FIP_PARAMS*>(record_);
  record("setfip", (fip->fcMap[0] << 16) | (fip->fcMap[1] << 8) | fip->fcMap[2], fip->cinVlanId);
  return 0;
}

RM_STATUS LRM_CNA_GetCEE_Params(HBA_NAME, void*, HBA_UINT32* size) {
  return *size >= RM_CEE_PARAMS_SIZE ? RM_STATUS{0} : RM_STATUS{7};
}
#define STUB_CEE_SETTER(fn, tag)                                          \
  RM_STATUS fn(HBA_NAME, const void* record_, HBA_UINT32) {               \
    const auto* item = static_cast<const RM_CEE_ITEM*>(record_);          \
    record(tag, item->item, item->value);                                 \
    return 0;                                                             \
  }
STUB_CEE_SETTER(LRM_CNA_SetDcbxPortVars, "dcbx")
STUB_CEE_SETTER(LRM_CNA_SetLldp, "lldp")
STUB_CEE_SETTER(LRM_CNA_SetPGSetting, "pgsetting")
#undef STUB_CEE_SETTER
RM_STATUS LRM_CNA_SetPFC(HBA_NAME, const void* record_, HBA_UINT32 size) {
  HBA_UINT32 first = 0;
  std::memcpy(&first, record_, size < 4 ? size : 4);
  record("pfc", size, first);
  return 0;
}
RM_STATUS LRM_CNA_SetTLV(HBA_NAME, HBA_UINT32 tlv, const void* value, HBA_UINT32) {
  HBA_UINT32 v = 0;
  std::memcpy(&v, value, sizeof v);
  record("tlv", tlv, v);
  return 0;
}

// Six dump files; fewer slots answer 191 with the count needed.
RM_STATUS LRM_GetDumpFileNames(HBA_NAME, void* buffer) {
  HBA_UINT32* count = static_cast<HBA_UINT32*>(buffer);
  record("dumpnames", *count);
  if (*count < 6) {
    *count = 6;
    return 191;
  }
  *count = 6;
  char* names = static_cast<char*>(buffer) + sizeof(HBA_UINT32);
  for (int i = 0; i < 6; ++i) std::snprintf(names + i * RM_DUMP_FILE_NAME_SIZE, RM_DUMP_FILE_NAME_SIZE, "dump%d.fat", i);
  return 0;
}

RM_STATUS LRM_Ini_GetRouteTable(HBA_NAME, void* buffer, HBA_UINT32* size) {
  return table(buffer, size, 40, sizeof(RM_ROUTE_ENTRY));
}
// Global driver parameters: success with a count beyond the records it was
// given room for (every name filled to the last byte, no terminator).
RM_STATUS LRM_GetDriverParamsGlobal(HBA_NAME, void* records, HBA_UINT32* count) {
  auto* params = static_cast<RM_DRIVER_PARAM*>(records);
  for (HBA_UINT32 i = 0; i < *count; ++i) {
    std::memset(params[i].name, 'p', sizeof params[i].name);
    std::memset(params[i].help, 'h', sizeof params[i].help);
    params[i].currentValue = i;
  }
  *count = 1000;
  return 0;
}
// A port's driver parameters: always "too small", asking for more than any
// driver has.
RM_STATUS LRM_GetDriverParams(HBA_NAME, void*, HBA_UINT32* count) {
  *count = 0xFFFFFFFF;
  return 7;
}
// Claims more ports than its buffer carries when asked for more room.
RM_STATUS RM_ListDeadNicPorts(void* buffer, HBA_UINT32* size) {
  HBA_UINT32* count = static_cast<HBA_UINT32*>(buffer);
  if (*size < sizeof(HBA_UINT32) + RM_DEAD_NIC_PORT_ENTRY_SIZE) return 7;
  *count = 1000;
  std::snprintf(static_cast<char*>(buffer) + sizeof(HBA_UINT32), RM_DEAD_NIC_PORT_ENTRY_SIZE,
                "02-11-22-33-44-55");
  return 0;
}
RM_STATUS LRM_GenerateCoreDump(HBA_NAME, const char* options) {
  record("coredump", static_cast<HBA_UINT32>(std::strlen(options)));
  return 0;
}

}  // extern "C"
