// Test stand-in for the HBA API library: answers its own adapter count so a
// test can tell libHBAAPI.so.2 from libHBAAPI.so.
#include "access/RM_Api.h"

extern "C" HBA_UINT32 HBA_GetNumberOfAdapters() { return NRV_STUB_ADAPTERS; }
extern "C" HBA_HANDLE HBA_OpenAdapter(char*) { return 42; }
