#include "agent/Catalogue_Function.h"

#include "access/NRV_Common.h"
#include "logging/Log.h"

namespace cimple {

bool port_handle(const std::string& device_id, HBA_NAME& handle, const char* id_failure, const char* str_failure) {
  char colon[kHbaNameColonSize] = {};
  if (Id2HBAName(colon, device_id.c_str()) != 0) {
    NRV_LOG(NRV_ERR, "%s", id_failure);
    return false;
  }
  if (str2HBAName(&handle, colon) != 0) {
    NRV_LOG(NRV_ERR, "%s", str_failure);
    return false;
  }
  return true;
}

}  // namespace cimple
