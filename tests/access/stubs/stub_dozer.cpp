// Test stand-in for a QoS library that some other component put into the
// process's default scope.
#include <atomic>

#include "access/RM_Api.h"

namespace {
std::atomic<int> g_closed{0};
}

extern "C" {
HBA_UINT32 DOZER_QoSGetGlobalFlag(HBA_UINT32 handle, HBA_UINT32* flag) {
  *flag = handle + 1;
  return 0;
}
void DOZER_CloseAdapter(HBA_UINT32) { g_closed.fetch_add(1); }
int stub_dozer_closed() { return g_closed.load(); }
}
