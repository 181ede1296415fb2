// Wrapper operations on adapter-wide data: dead NIC ports, feature lists,
// FCoE driver parameters, optimized-access LUNs and general VPD.
#include <algorithm>

#include "access/NRV_VpdWalk.h"
#include "access/NRV_WrapperCall.h"

namespace cimple {

using wrapper::validated;

RM_STATUS NRV_MethodWrapper::GetDeadNICPorts(std::vector<std::string>& ports) {
  NRV_LOG(NRV_DBG, "Entering NRV_MethodWrapper::GetDeadNICPorts");
  ports.clear();
  struct Entry {
    char text[RM_DEAD_NIC_PORT_ENTRY_SIZE];
  };
  std::vector<Entry> entries;
  const RM_STATUS status = wrapper::readTable(entries, 16, RM_ListDeadNicPorts);
  if (status != RM_STATUS_SUCCESS) {
    logStatus(status);
    return status;
  }
  for (const Entry& e : entries) {
    std::string text = wrapper::fieldText(e.text, sizeof e.text);
    if (!text.empty()) ports.push_back(std::move(text));
  }
  return status;
}

RM_STATUS NRV_MethodWrapper::GetHBAFeatureList(const HBA_NAME& name,
                                               std::vector<uint8_t>& features) {
  return validated(name, "GetHBAFeatureList", [&] {
    return wrapper::readSized(features, 1024, [&](void* buffer, HBA_UINT32* size) {
      return LRM_GetHBAFeatureList(name, buffer, size);
    });
  });
}

RM_STATUS NRV_MethodWrapper::SetOASLunState(const HBA_NAME& name, const HBA_NAME& initiator,
                                            const HBA_NAME& target, HBA_UINT64 lun,
                                            HBA_UINT32 state, HBA_UINT32 option) {
  return validated(name, "SetOASLunState",
                   [&] { return LRM_SetOASLunState(name, initiator, target, lun, state, option); });
}

RM_STATUS NRV_MethodWrapper::GetOASLunList(const HBA_NAME& name, std::vector<uint8_t>& record) {
  return validated(name, "GetOASLunList", [&] {
    return wrapper::readSized(record, 4096, [&](void* buffer, HBA_UINT32* size) {
      return LRM_GetOASLunList(name, buffer, size);
    });
  });
}

RM_STATUS NRV_MethodWrapper::nrvcimSetDriverParam(const HBA_NAME& name, bool global,
                                                  bool persistent, const std::string& parameter,
                                                  const std::string& value) {
  return validated(name, "nrvcimSetDriverParam", [&] {
    return LRM_SetDriverParam(name, global ? 1 : 0, persistent ? 1 : 0, parameter.c_str(),
                              value.c_str());
  });
}

namespace {
constexpr HBA_UINT32 kMostDriverParams = 4096;
}  // namespace

RM_STATUS NRV_MethodWrapper::ReadDriverParams(const HBA_NAME& name, bool global,
                                              std::vector<RM_DRIVER_PARAM>& params) {
  const char* call = global ? "RM_GetDriverParamsGlobal" : "RM_GetDriverParams";
  return validated(name, "ReadDriverParams", [&] {
    auto read = [&](HBA_UINT32& count) {
      params.assign(count, RM_DRIVER_PARAM{});
      return global ? LRM_GetDriverParamsGlobal(name, params.data(), &count)
                    : LRM_GetDriverParams(name, params.data(), &count);
    };
    const char* caller = global ? "nrvcimGetDriverParamsGlobal" : "nrvcimGetDriverParams";
    HBA_UINT32 count = 52;
    RM_STATUS status = read(count);
    NRV_LOG(NRV_DBG, "%s: status=%d", call, static_cast<int>(status));
    if ((status == RM_STATUS_ERROR_BUFFER_TOO_SMALL || status == RM_STATUS_ERROR_MORE_DATA) &&
        count > params.size()) {
      // A count no driver has is a broken answer, not a reason to allocate it.
      count = std::min(count, kMostDriverParams);
      status = read(count);
      if (status != RM_STATUS_SUCCESS)
        NRV_LOG(NRV_ERR, "ERROR: %s: %s call failed (a) (%d)", caller, call, static_cast<int>(status));
    } else if (status != RM_STATUS_SUCCESS) {
      NRV_LOG(NRV_ERR, "ERROR: %s: %s call failed (b) (%d)", caller, call, static_cast<int>(status));
    }
    if (status != RM_STATUS_SUCCESS) {
      params.clear();
      return status;
    }
    // Never believe a count larger than the records handed over.
    if (count < params.size()) params.resize(count);
    NRV_LOG(NRV_DBG, "number of driver parameters %d", static_cast<int>(params.size()));
    return status;
  });
}

RM_STATUS NRV_MethodWrapper::ReadVPD(const HBA_NAME& name,
                                     std::vector<std::pair<std::string, std::string>>& entries) {
  return validated(name, "ReadVPD", [&] {
    entries.clear();
    std::vector<uint8_t> vpd;
    const RM_STATUS status = wrapper::readSized(
        vpd, RM_VPD_SIZE,
        [&](void* buffer, HBA_UINT32* size) { return LRM_GetVPD(name, buffer, size); });
    if (status != RM_STATUS_SUCCESS) {
      NRV_LOG(NRV_ERR, "ERROR: RM_GetVPD call failed : %d", static_cast<int>(status));
      return status;
    }
    for (const Vpd_Entry& entry : walkVpd(vpd)) entries.emplace_back(entry.keyword, entry.text());
    return status;
  });
}

}  // namespace cimple
