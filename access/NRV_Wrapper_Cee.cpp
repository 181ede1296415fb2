// Wrapper operations of the converged-Ethernet settings: FCoE initialization
// protocol, CEE/DCB parameters, priority groups, PFC, QoS limits and boot.
#include <cstdio>

#include "access/NRV_WrapperCall.h"

namespace cimple {

using wrapper::validated;

namespace {

// Writes one fixed record through a set function of the NRV_RM_SET shape.
template <class Record, class Fn>
RM_STATUS writeRecord(Fn fn, const HBA_NAME& name, const Record& record) {
  return fn(name, &record, static_cast<HBA_UINT32>(sizeof record));
}

// Reads one fixed record through a get function of the NRV_RM_GET shape.
template <class Record, class Fn>
RM_STATUS readRecord(Fn fn, const HBA_NAME& name, Record& record) {
  HBA_UINT32 size = sizeof record;
  return fn(name, &record, &size);
}

bool parseFcMap(const std::string& text, HBA_UINT8 (&fcMap)[3]) {
  unsigned value = 0;
  char extra = 0;
  if (std::sscanf(text.c_str(), "0x%6x%c", &value, &extra) != 1 &&
      std::sscanf(text.c_str(), "0X%6x%c", &value, &extra) != 1)
    return false;
  fcMap[0] = static_cast<HBA_UINT8>(value >> 16);
  fcMap[1] = static_cast<HBA_UINT8>(value >> 8);
  fcMap[2] = static_cast<HBA_UINT8>(value);
  return true;
}

bool parseVlan(const std::string& text, RM_FCF_CONNECT_LIST& list) {
  if (text == "Any") {
    list.flags &= ~RM_FCF_CONNECT_VLAN_VALID;
    return true;
  }
  unsigned value = 0;
  char extra = 0;
  if (std::sscanf(text.c_str(), "%u%c", &value, &extra) != 1 || value > 4095) return false;
  list.flags |= RM_FCF_CONNECT_VLAN_VALID;
  list.vlanId = static_cast<HBA_UINT16>(value);
  return true;
}

}  // namespace

RM_STATUS NRV_MethodWrapper::nrvGetFIPParams(const HBA_NAME& name, FIPParams& params) {
  NRV_LOG(NRV_DBG, "Entering NRV_MethodWrapper::nrvGetFIPParams");
  bool available = false;
  RM_STATUS status = HasFeature(name, RM_FEATURE_FCOE, available);
  if (status == RM_STATUS_ITEM_NOT_OFFERED) {
    NRV_LOG(NRV_ERR, "Failed to get the feature, returned with value %d", static_cast<int>(status));
    return status;
  }
  if (!available) {
    NRV_LOG(NRV_WARN, "Not a valid card, Feature is not supported");
    return kNotSupported;
  }
  NRV_LOG(NRV_DBG, "Fetching the FIP data from FCF list");
  RM_FCF_CONNECT_LIST list{};
  status = readRecord(LRM_CNA_FCOE_GetFCFConnectList, name, list);
  if (status != RM_STATUS_SUCCESS) {
    NRV_LOG(NRV_ERR, "Error getting DCB FIP Parameters, RM returned with value %d",
            static_cast<int>(status));
    return status;
  }
  char text[kHbaNameColonSize];
  params.fabricName = HBAName2Id(list.fabricName, text);
  params.switchName = HBAName2Id(list.switchName, text);
  params.vlan = (list.flags & RM_FCF_CONNECT_VLAN_VALID) ? std::to_string(list.vlanId) : "Any";
  RM_FIP_PARAMS fip{};
  status = readRecord(LRM_CNA_FCOE_GetFIPParams, name, fip);
  if (status != RM_STATUS_SUCCESS) {
    NRV_LOG(NRV_ERR, "Error getting CIN FIP Parameters, RM returned with value %d",
            static_cast<int>(status));
    return status;
  }
  char fcMap[16];
  std::snprintf(fcMap, sizeof fcMap, "0x%02X%02X%02X", fip.fcMap[0], fip.fcMap[1], fip.fcMap[2]);
  params.fcMap = fcMap;
  params.cinVlanId = fip.cinVlanId;
  return RM_STATUS_SUCCESS;
}

RM_STATUS NRV_MethodWrapper::nrvSetFIPParams(const HBA_NAME& name, const FIPParams& params) {
  return validated(name, "nrvSetFIPParams", [&]() -> RM_STATUS {
    if (!wrapper::offers(name, RM_FEATURE_FCOE, "FIP is not supported on this adapter"))
      return kNotSupported;
    // Start from what the adapter holds, so that parts the caller does not
    // name keep their values.
    RM_FCF_CONNECT_LIST list{};
    RM_STATUS status = readRecord(LRM_CNA_FCOE_GetFCFConnectList, name, list);
    if (status != RM_STATUS_SUCCESS) return status;
    RM_FIP_PARAMS fip{};
    status = readRecord(LRM_CNA_FCOE_GetFIPParams, name, fip);
    if (status != RM_STATUS_SUCCESS) return status;
    if ((!params.fabricName.empty() &&
         str2HBAName(&list.fabricName, params.fabricName.c_str()) != 0) ||
        (!params.switchName.empty() &&
         str2HBAName(&list.switchName, params.switchName.c_str()) != 0) ||
        (!params.vlan.empty() && !parseVlan(params.vlan, list)) ||
        (!params.fcMap.empty() && !parseFcMap(params.fcMap, fip.fcMap))) {
      NRV_LOG(NRV_ERR, "nrvSetFIPParams: malformed FIP parameter");
      return kNrvFailure;
    }
    fip.cinVlanId = params.cinVlanId;
    status = writeRecord(LRM_CNA_FCOE_SetFCFConnectList, name, list);
    if (status != RM_STATUS_SUCCESS) return status;
    return writeRecord(LRM_CNA_FCOE_SetFIPParams, name, fip);
  });
}

RM_STATUS NRV_MethodWrapper::nrvcimGetCEEParams(const HBA_NAME& name,
                                                std::vector<uint8_t>& record) {
  return validated(name, "nrvcimGetCEEParams", [&] {
    return wrapper::readSized(record, RM_CEE_PARAMS_SIZE, [&](void* buffer, HBA_UINT32* size) {
      return LRM_CNA_GetCEE_Params(name, buffer, size);
    });
  });
}

namespace {

enum class CeeWriter { kDcbx, kLldp, kTlv, kPfc, kPgSetting };

struct CeeKey {
  const char* key;
  CeeWriter writer;
  HBA_UINT32 item;  // RM_CEE_* or the TLV number
};

constexpr CeeKey kCeeKeys[] = {
    {"dcbxstate", CeeWriter::kDcbx, RM_CEE_DCBX_STATE},
    {"txstate", CeeWriter::kLldp, RM_CEE_LLDP_TX_STATE},
    {"rxstate", CeeWriter::kLldp, RM_CEE_LLDP_RX_STATE},
    {"txportdesc", CeeWriter::kTlv, RM_TLV_PORT_DESCRIPTION},
    {"txsysdesc", CeeWriter::kTlv, RM_TLV_SYSTEM_DESCRIPTION},
    {"txsysname", CeeWriter::kTlv, RM_TLV_SYSTEM_NAME},
    {"txsyscap", CeeWriter::kTlv, RM_TLV_SYSTEM_CAPABILITIES},
    {"pfcenabled", CeeWriter::kPfc, RM_CEE_PFC_ENABLED},
    {"fcoepriority", CeeWriter::kPgSetting, RM_CEE_FCOE_PRIORITY},
    {"iscsipriority", CeeWriter::kPgSetting, RM_CEE_ISCSI_PRIORITY},
    {"rocepriority", CeeWriter::kPgSetting, RM_CEE_ROCE_PRIORITY},
};

}  // namespace

RM_STATUS NRV_MethodWrapper::nrvcimSetCEEParams(const HBA_NAME& name, const std::string& key,
                                                HBA_UINT32 value) {
  const CeeKey* found = nullptr;
  for (const CeeKey& k : kCeeKeys)
    if (key == k.key) found = &k;
  if (found == nullptr) {
    NRV_LOG(NRV_ERR, "nrvcimSetCEEParams: unknown parameter %s", key.c_str());
    return kNrvFailure;
  }
  return validated(name, "nrvcimSetCEEParams", [&] {
    // The port must answer its CEE parameters before any of them is changed.
    std::vector<uint8_t> current;
    RM_STATUS status = wrapper::readSized(current, RM_CEE_PARAMS_SIZE, [&](void* b, HBA_UINT32* s) {
      return LRM_CNA_GetCEE_Params(name, b, s);
    });
    if (status != RM_STATUS_SUCCESS) return status;
    const RM_CEE_ITEM item{found->item, value};
    switch (found->writer) {
      case CeeWriter::kDcbx:
        return writeRecord(LRM_CNA_SetDcbxPortVars, name, item);
      case CeeWriter::kLldp:
        return writeRecord(LRM_CNA_SetLldp, name, item);
      case CeeWriter::kPfc:
        return writeRecord(LRM_CNA_SetPFC, name, item);
      case CeeWriter::kPgSetting:
        return writeRecord(LRM_CNA_SetPGSetting, name, item);
      case CeeWriter::kTlv:
        return LRM_CNA_SetTLV(name, found->item, &value, sizeof value);
    }
    return static_cast<RM_STATUS>(RM_STATUS_ERROR);
  });
}

RM_STATUS NRV_MethodWrapper::nrvcimSetCeePriority(const HBA_NAME& name,
                                                  const RM_PG_PRIORITY_BITMAPS& groups,
                                                  HBA_UINT8 pfcBitmap) {
  return validated(name, "nrvcimSetCeePriority", [&]() -> RM_STATUS {
    if (!wrapper::offers(name, RM_FEATURE_PRIORITY_GROUPS, "Priority groups are not supported"))
      return kNotSupported;
    std::vector<uint8_t> current;
    RM_STATUS status = wrapper::readSized(current, RM_CEE_PARAMS_SIZE, [&](void* b, HBA_UINT32* s) {
      return LRM_CNA_GetCEE_Params(name, b, s);
    });
    if (status != RM_STATUS_SUCCESS) return status;
    status = writeRecord(LRM_CNA_SetPGPriorityBitmapsExt, name, groups);
    if (status != RM_STATUS_SUCCESS) return status;
    const RM_PFC_SETTING pfc{pfcBitmap, {}};
    return writeRecord(LRM_CNA_SetPFC, name, pfc);
  });
}

RM_STATUS NRV_MethodWrapper::nrvcimSetPgBW(const HBA_NAME& name, const RM_PG_BANDWIDTH& bandwidth) {
  return validated(name, "nrvcimSetPgBW", [&]() -> RM_STATUS {
    if (!wrapper::offers(name, RM_FEATURE_PRIORITY_GROUPS, "Priority groups are not supported"))
      return kNotSupported;
    RM_PG_PRIORITY_BITMAPS groups{};
    const RM_STATUS status = readRecord(LRM_CNA_GetPGPriorityBitmaps, name, groups);
    if (status != RM_STATUS_SUCCESS) return status;
    return writeRecord(LRM_CNA_SetPGBandwidth, name, bandwidth);
  });
}

RM_STATUS NRV_MethodWrapper::SetPfcThrottle(const HBA_NAME& name, bool enable) {
  return validated(name, "SetPfcThrottle", [&] {
    const HBA_UINT32 value = enable ? 1 : 0;
    return LRM_SetAdapterAttribute(name, RM_PA_PFC_THROTTLE, &value, sizeof value);
  });
}

RM_STATUS NRV_MethodWrapper::GetQosInfo(const HBA_NAME& name, RM_QOS_LIMITS& limits) {
  return validated(name, "GetQosInfo", [&] { return readRecord(LRM_GetQoS, name, limits); });
}

RM_STATUS NRV_MethodWrapper::SetQOSParams(const HBA_NAME& name, const RM_QOS_LIMITS& limits) {
  return validated(name, "SetQOSParams", [&] { return writeRecord(LRM_SetQoS, name, limits); });
}

// ---- Boot -------------------------------------------------------------------------------

namespace {

RM_STATUS readHbaAttributes(const HBA_NAME& name, std::vector<uint8_t>& blob) {
  return wrapper::readSized(blob, RM_HBA_ATTRIBUTES_SIZE, [&](void* buffer, HBA_UINT32* size) {
    return LRM_GetHBAAttributes(name, buffer, size);
  });
}

}  // namespace

RM_STATUS NRV_MethodWrapper::nrvcimGetBootBiosState(const HBA_NAME& name, HBA_UINT32& state) {
  return validated(name, "nrvcimGetBootBiosState", [&]() -> RM_STATUS {
    std::vector<uint8_t> blob;
    const RM_STATUS status = readHbaAttributes(name, blob);
    if (status != RM_STATUS_SUCCESS) return status;
    return wrapper::blobInteger(blob.data(), RM_HA_BOOT_CODE_ENABLED, state)
               ? RM_STATUS_SUCCESS
               : RM_STATUS_ITEM_NOT_OFFERED;
  });
}

RM_STATUS NRV_MethodWrapper::nrvcimSetBootBiosState(const HBA_NAME& name, HBA_UINT32 state) {
  return validated(name, "nrvcimSetBootBiosState",
                   [&] { return LRM_SetBootBiosState(name, state); });
}

RM_STATUS NRV_MethodWrapper::GetNICNetworkBootParams(const HBA_NAME& name, std::string& method,
                                                     bool& bothMethods, HBA_UINT32& state) {
  return validated(name, "GetNICNetworkBootParams", [&]() -> RM_STATUS {
    std::vector<uint8_t> blob;
    const RM_STATUS status = readHbaAttributes(name, blob);
    if (status != RM_STATUS_SUCCESS) return status;
    if (!wrapper::blobInteger(blob.data(), RM_HA_BOOT_CODE_ENABLED, state))
      return RM_STATUS_ITEM_NOT_OFFERED;
    if (!wrapper::blobText(blob.data(), RM_HA_NETBOOT_METHOD, method)) method.clear();
    HBA_UINT32 both = 0;
    bothMethods = wrapper::blobInteger(blob.data(), RM_HA_NETBOOT_BOTH_METHODS, both) && both != 0;
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS NRV_MethodWrapper::SetNICNetworkBootParams(const HBA_NAME& name, char flag,
                                                     const std::string& method) {
  if (flag != 'E' && flag != 'D') {
    NRV_LOG(NRV_ERR, "SetNICNetworkBootParams: invalid flag %c", flag);
    return kNrvFailure;
  }
  return validated(name, "SetNICNetworkBootParams", [&] {
    const RM_STATUS status = LRM_SetNetbootParams(name, flag, method.c_str());
    if (status != RM_STATUS_SUCCESS) return status;
    return LRM_SetBootBiosState(name, flag == 'E' ? 1 : 0);
  });
}

RM_STATUS NRV_MethodWrapper::SetiSCSIBoot(const HBA_NAME& name, HBA_UINT32 enabled) {
  return validated(name, "SetiSCSIBoot", [&] {
    return LRM_SetAdapterAttribute(name, RM_PA_ISCSI_BOOT_ENABLED, &enabled, sizeof enabled);
  });
}

RM_STATUS NRV_MethodWrapper::GetiSCSIBootState(const HBA_NAME& name, HBA_UINT32& state) {
  return validated(name, "GetiSCSIBootState", [&]() -> RM_STATUS {
    std::vector<uint8_t> blob;
    const RM_STATUS status = wrapper::readSized(
        blob, RM_PORT_ATTRIBUTES_SIZE,
        [&](void* buffer, HBA_UINT32* size) { return LRM_GetPortAttributes(name, buffer, size); });
    if (status != RM_STATUS_SUCCESS) return status;
    return wrapper::blobInteger(blob.data(), RM_PA_ISCSI_BOOT_ENABLED, state)
               ? RM_STATUS_SUCCESS
               : RM_STATUS_ITEM_NOT_OFFERED;
  });
}

}  // namespace cimple
