#include "data/NRV_HbaApiName.h"

#include <string.h>

#include "access/NRV_Common.h"
#include "access/RM_Api.h"
#include "data/NRV_DataLog.h"
#include "data/NRV_HbaHandle.h"

namespace cimple {

void HbaApiNameIndex::read() {
  read_ = true;
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
    // Each handle is closed once its ports are read.
    HbaAdapterHandle handle(name);
    if (handle.get() == 0) {
      NRV_DATA_LOG(NRV_DBG, "HBA_OpenAdapter(%s) failed", name);
      continue;
    }
    HBA_ADAPTERATTRIBUTES attributes;
    memset(&attributes, 0, sizeof attributes);
    if (HBA_GetAdapterAttributes(handle.get(), &attributes) != HBA_STATUS_OK) continue;
    for (HBA_UINT32 p = 0; p < attributes.NumberOfPorts; ++p) {
      HBA_PORTATTRIBUTES port;
      memset(&port, 0, sizeof port);
      if (HBA_GetAdapterPortAttributes(handle.get(), p, &port) != HBA_STATUS_OK) continue;
      char text[kHbaNamePlainSize] = {};
      HBAName2string(port.PortWWN, text);
      names_.emplace(text, name);
    }
  }
}

std::string HbaApiNameIndex::find(const std::string& identifierText) {
  NRV_DATA_LOG(NRV_DBG, "FCoEAdapter");
  if (!read_) read();
  // The identifier is compared over at most 32 characters, as its text form allows.
  const auto it = names_.find(identifierText.substr(0, 32));
  if (it == names_.end()) return std::string();
  NRV_DATA_LOG(NRV_DBG, "matching rmapi wwpn:%s with hbaapi wwpn:%s", identifierText.c_str(), it->first.c_str());
  NRV_DATA_LOG(NRV_DBG, "match succesful");
  return it->second;
}

std::string findHbaApiAdapterName(const std::string& identifierText) {
  HbaApiNameIndex index;
  return index.find(identifierText);
}

}  // namespace cimple
