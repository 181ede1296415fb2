#include "data/NRV_Data.h"

#include <stdio.h>
#include <string.h>

#include <chrono>
#include <thread>
#include <vector>

#include "access/RM_Api.h"
#include "data/NRV_DataLog.h"

namespace cimple {

namespace {

constexpr int kMaxRetries = 2;
constexpr auto kRetryWait = std::chrono::microseconds(1000000);

}  // namespace

Data::Data() {
  (void)HBA_LoadLibrary();
  NRV_DATA_LOG(NRV_DBG, "Data Pointer Constructed.");
}

Data::~Data() {
  freeAllData();
  NRV_DATA_LOG(NRV_DBG, "Data Pointer deleted.");
}

Adapter* Data::getAdapter(size_t index) const {
  return index < m_Adapters.size() ? m_Adapters[index].get() : nullptr;
}

void Data::freeAllData() {
  NRV_DATA_LOG(NRV_DBG, "freeAllData: Entry");
  for (auto& adapter : m_Adapters) {
    NRV_DATA_LOG(NRV_DBG, "Freeing adapter: %s", adapter->getAdapterName().c_str());
    try {
      adapter.reset();
    } catch (...) {
      NRV_DATA_LOG(NRV_ERR, "Error in freeAllData -- do nothing");
    }
  }
  m_Adapters.clear();
  m_AdapterCount = 0;
  m_HbaApiNames = HbaApiNameIndex();
  m_HasNicAdapter = m_HasFcoeAdapter = m_HasIscsiAdapter = false;
  NRV_DATA_LOG(NRV_DBG, "freeAllData: cleanExit");
}

void Data::buildAdapterData() {
  NRV_DATA_LOG(NRV_DBG, "buildAdapterData");
  freeAllData();
  HBA_UINT32 capacity = 1;
  bool nicSeen = false;
  int retries = 0;
  while (m_AdapterCount == 0) {
    const bool scanning = !nicSeen;
    enumeratePass(&capacity, &nicSeen);
    if (m_AdapterCount != 0 || retries >= kMaxRetries) break;
    // The pass that first sees a NIC function ends there; the building pass
    // follows at once.  A building pass that creates nothing is retried like
    // a scanning pass, so a library that keeps failing cannot hold the
    // data-fetch thread forever.
    if (scanning && nicSeen) continue;
    std::this_thread::sleep_for(kRetryWait);
    ++retries;
  }
}

void Data::enumeratePass(HBA_UINT32* capacity, bool* nicSeen) {
  std::vector<HBA_UINT32> list(*capacity);
  HBA_UINT32 count = *capacity;
  NRV_DATA_LOG(NRV_DBG, "Invoking RM_GetAllLocalHBAInstances.");
  RM_STATUS status = RM_GetAllLocalHBAInstances(&count, list.data());
  if (status == RM_STATUS_ERROR_BUFFER_TOO_SMALL) {
    *capacity = count;
    list.assign(count, 0);
    status = RM_GetAllLocalHBAInstances(&count, list.data());
    if (status != RM_STATUS_SUCCESS) {
      NRV_DATA_LOG(NRV_CRIT, "ERROR: RM_GetAllLocalHBAInstances failed errorcode = %d",
                   static_cast<int>(status));
      return;
    }
    NRV_DATA_LOG(NRV_DBG, "Number of Adapters detected = %d", static_cast<int>(count));
  } else if (status != RM_STATUS_SUCCESS) {
    NRV_DATA_LOG(NRV_CRIT, "ERROR: RM_GetAllLocalHBAInstances failed (2). status = %d",
                 static_cast<int>(status));
    return;
  }
  // Never trust a count beyond the list handed in.
  const size_t instances = count < list.size() ? count : list.size();
  for (size_t i = 0; i < instances; ++i) {
    const int index = static_cast<int>(i);
    RM_ADAPTER_INSTANCE instance{0, list[i]};
    RM_LOCAL_HBA_INFO_V4 info;
    RM_LOCAL_HBA_INFO_V3 v3;
    memset(&info, 0, sizeof info);
    memset(&v3, 0, sizeof v3);
    status = RM_GetLocalHBAInfoV4(&instance, &info);
    if (status != RM_STATUS_SUCCESS) {
      if (status != RM_STATUS_ITEM_NOT_OFFERED)
        NRV_DATA_LOG(NRV_DBG, "ERROR: RM_GetLocalHBAInfoV4 failed for adapter %d. status = %d",
                     index, static_cast<int>(status));
      status = RM_GetLocalHBAInfoV3(&instance, &v3);
      if (status != RM_STATUS_SUCCESS) {
        if (status != RM_STATUS_ITEM_NOT_OFFERED)
          NRV_DATA_LOG(NRV_DBG, "ERROR: RM_GetLocalHBAInfoV3 failed for adapter %d. status = %d",
                       index, static_cast<int>(status));
        continue;
      }
      memset(&info, 0, sizeof info);
      memcpy(&info, &v3, sizeof v3);
    }
    const HBA_UINT32 mask = info.protocolMask;
    if ((mask & RM_PROTOCOL_HANDLED_MASK) == 0) continue;
    if (!*nicSeen) {
      if ((mask & RM_PROTOCOL_NIC) == 0) continue;
      *nicSeen = true;
      return;
    }
    createAdapter(static_cast<uint32_t>(i), info);
  }
}

void Data::createAdapter(uint32_t index, const RM_LOCAL_HBA_INFO_V4& info) {
  const uint8_t* id = info.wwpn.wwn;
  NRV_DATA_LOG(NRV_DBG, "NIC/FCoE/iSCSI PortWWN : [%02X-%02X-%02X-%02X-%02X-%02X-%02X-%02X]",
               id[0], id[1], id[2], id[3], id[4], id[5], id[6], id[7]);
  char name[256] = {};
  const int modelLength = static_cast<int>(strnlen(info.modelName, sizeof info.modelName));
  snprintf(name, sizeof name, "Norvane %.*s-%02X", modelLength, info.modelName,
           static_cast<unsigned>(info.functionNumber));
  const HBA_UINT32 mask = info.protocolMask;
  const int i = static_cast<int>(index);
  try {
    if (mask & (RM_PROTOCOL_NIC | RM_PROTOCOL_NIC2)) {
      NRV_DATA_LOG(NRV_DBG, "Got NIC adapter %d", i);
      m_Adapters.push_back(std::make_unique<NICAdapter>(name, index, info));
      m_HasNicAdapter = true;
    } else if (mask & RM_PROTOCOL_ISCSI) {
      NRV_DATA_LOG(NRV_DBG, "Got ISCSI adapter %d", i);
      m_Adapters.push_back(std::make_unique<iSCSIAdapter>(name, index, info));
      m_HasIscsiAdapter = true;
    } else {
      m_Adapters.push_back(std::make_unique<FCoEAdapter>(name, index, info, &m_HbaApiNames));
      m_HasFcoeAdapter = true;
      NRV_DATA_LOG(NRV_DBG, "Got FCOE adapter %d", i);
    }
    ++m_AdapterCount;
  } catch (...) {
    NRV_DATA_LOG(NRV_ERR, "Catch ALL error during creating adapter..., Skipping Adapter# %d", i);
  }
}

void Data::buildSANData() {
  NRV_DATA_LOG(NRV_DBG, "buildSANData");
  for (auto& adapter : m_Adapters) {
    NRV_DATA_LOG(NRV_DBG, "Target Scan from adapter: %s", adapter->getAdapterName().c_str());
    try {
      adapter->rescanTargets();
    } catch (...) {
      NRV_DATA_LOG(NRV_ERR, "Issue with Target Rescan with Adapter- moving to the next adapter");
    }
  }
}

}  // namespace cimple
