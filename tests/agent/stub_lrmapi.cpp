// Stand-in management library for the agent tests: only the library
// initialisation, whose status the test chooses through the environment
// (NRV_AGENT_STUB_INIT_STATUS, default 0).  Every other function is absent,
// so the module's forwarders answer their failure values.
#include <cstdlib>

#include "access/RM_Api.h"

extern "C" RM_STATUS LRM_InitLib(void) {
  const char* status = std::getenv("NRV_AGENT_STUB_INIT_STATUS");
  return status ? static_cast<RM_STATUS>(std::atoi(status)) : 0;
}
