// Test stand-in for liblrmapi: a few LRM_ functions, the RM_-only functions
// the module looks up in it, and controls for the initialisation test.
#include <atomic>
#include <condition_variable>
#include <cstdio>
#include <mutex>

#include "access/RM_Api.h"

namespace {
std::atomic<int> g_initCalls{0};
std::mutex g_mutex;
std::condition_variable g_cv;
bool g_holdInit = false;
bool g_inInit = false;
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

}  // extern "C"
