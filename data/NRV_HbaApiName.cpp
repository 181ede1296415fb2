#include "data/NRV_HbaApiName.h"

#include <string.h>

#include "access/NRV_Common.h"
#include "access/RM_Api.h"
#include "data/NRV_DataLog.h"
#include "data/NRV_HbaHandle.h"

namespace cimple {

namespace {

// Whether a port of the open adapter carries `identifierText`.
bool hasMatchingPort(HBA_HANDLE handle, const std::string& identifierText) {
  HBA_ADAPTERATTRIBUTES attributes;
  memset(&attributes, 0, sizeof attributes);
  if (HBA_GetAdapterAttributes(handle, &attributes) != HBA_STATUS_OK) return false;
  for (HBA_UINT32 p = 0; p < attributes.NumberOfPorts; ++p) {
    HBA_PORTATTRIBUTES port;
    memset(&port, 0, sizeof port);
    if (HBA_GetAdapterPortAttributes(handle, p, &port) != HBA_STATUS_OK) continue;
    char hbaText[kHbaNamePlainSize] = {};
    HBAName2string(port.PortWWN, hbaText);
    NRV_DATA_LOG(NRV_DBG, "matching rmapi wwpn:%s with hbaapi wwpn:%s", identifierText.c_str(),
                 hbaText);
    if (strncmp(identifierText.c_str(), hbaText, 32) == 0) {
      NRV_DATA_LOG(NRV_DBG, "match succesful");
      return true;
    }
  }
  return false;
}

}  // namespace

std::string findHbaApiAdapterName(const std::string& identifierText) {
  NRV_DATA_LOG(NRV_DBG, "FCoEAdapter");
  const HBA_UINT32 count = HBA_GetNumberOfAdapters();
  if (count == 0) NRV_DATA_LOG(NRV_DBG, "HBAAPI reports that there are NO HBAs in the system.");
  for (HBA_UINT32 a = 0; a < count; ++a) {
    char name[256] = {};
    const HBA_STATUS status = HBA_GetAdapterName(a, name);
    if (status != HBA_STATUS_OK) {
      NRV_DATA_LOG(NRV_DBG, "HBA_GetAdapterName(%d) failed with status %d", static_cast<int>(a),
                   static_cast<int>(status));
      continue;
    }
    name[sizeof name - 1] = '\0';
    // Each handle is closed once its ports are compared.
    HbaAdapterHandle handle(name);
    if (handle.get() == 0) {
      NRV_DATA_LOG(NRV_DBG, "HBA_OpenAdapter(%s) failed", name);
      continue;
    }
    if (hasMatchingPort(handle.get(), identifierText)) return name;
  }
  return std::string();
}

}  // namespace cimple
