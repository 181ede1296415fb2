// Test stand-in for librmapi, built twice: exporting the LRM_ names of its
// functions, or only the RM_ names.
#include "access/RM_Api.h"

extern "C" {

#if NRV_STUB_LRM_NAMES
RM_STATUS LRM_GetHBAFeature(HBA_NAME, HBA_UINT32, HBA_UINT32* flag) {
  *flag = 1;
  return 11;
}
HBA_UINT32 RM_GetNumberOfLocalAdapters(void) { return 5; }
#else
RM_STATUS RM_GetHBAFeature(HBA_NAME, HBA_UINT32, HBA_UINT32* flag) {
  *flag = 1;
  return 22;
}
HBA_UINT32 RM_GetNumberOfLocalAdapters(void) { return 6; }
#endif

// Present in neither liblrmapi stub: found only through the fallback.
RM_STATUS RM_ValidateWwn(HBA_NAME) { return 33; }

}  // extern "C"
