// Wrapper operations on adapter ports: channel management, personality and
// profiles, physical-port settings, world-wide names, virtual ports and
// functions, feature lists, driver parameters, OAS LUNs and VPD.
#include "access/NRV_WrapperCall.h"

namespace cimple {

using wrapper::validated;

namespace {

// Raw record reads and writes of the NRV_RM_GET / NRV_RM_SET shapes.
template <class Fn>
RM_STATUS readRaw(Fn fn, const HBA_NAME& name, std::vector<uint8_t>& record,
                  HBA_UINT32 size = 4096) {
  return wrapper::readSized(
      record, size, [&](void* buffer, HBA_UINT32* length) { return fn(name, buffer, length); });
}

template <class Fn>
RM_STATUS writeRaw(Fn fn, const HBA_NAME& name, const std::vector<uint8_t>& record) {
  return fn(name, record.data(), static_cast<HBA_UINT32>(record.size()));
}

// Writes one 32-bit adapter attribute once the adapter offers `feature`.
RM_STATUS setFeatureAttribute(const HBA_NAME& name, HBA_UINT32 feature, const char* absentText,
                              HBA_UINT32 attribute, HBA_UINT32 value) {
  if (!wrapper::offers(name, feature, absentText)) return RM_STATUS_ITEM_NOT_OFFERED;
  return LRM_SetAdapterAttribute(name, attribute, &value, sizeof value);
}

}  // namespace

// ---- Channel management, personality, profiles -------------------------------------------

RM_STATUS NRV_MethodWrapper::GetChannelMgmtCNAInfo(const HBA_NAME& name,
                                                   std::vector<uint8_t>& record) {
  return validated(name, "GetChannelMgmtCNAInfo",
                   [&] { return readRaw(LRM_GetChannelMgmtCNAInfo, name, record); });
}

RM_STATUS NRV_MethodWrapper::GetChannelMgmtPortInfo(const HBA_NAME& name,
                                                    std::vector<uint8_t>& record) {
  return validated(name, "GetChannelMgmtPortInfo",
                   [&] { return readRaw(LRM_GetChannelMgmtPortInfo, name, record); });
}

RM_STATUS NRV_MethodWrapper::SetChannelMgmtPortInfo(const HBA_NAME& name,
                                                    const std::vector<uint8_t>& record) {
  return validated(name, "SetChannelMgmtPortInfo",
                   [&] { return writeRaw(LRM_SetChannelMgmtPortInfo, name, record); });
}

RM_STATUS NRV_MethodWrapper::SetCMMode(const HBA_NAME& name, HBA_UINT32 mode) {
  return validated(name, "SetCMMode", [&]() -> RM_STATUS {
    if (!wrapper::offers(name, RM_FEATURE_CHANNEL_MANAGEMENT,
                         "Channel management is not supported on this adapter"))
      return kNotSupported;
    std::vector<uint8_t> record;
    const RM_STATUS status = readRaw(LRM_GetChannelMgmtCNAInfo, name, record);
    if (status != RM_STATUS_SUCCESS) return status;
    // The configured mode is the record's first word.
    if (record.size() < sizeof mode) record.resize(sizeof mode);
    std::memcpy(record.data(), &mode, sizeof mode);
    return writeRaw(LRM_SetChannelMgmtCNAInfo, name, record);
  });
}

RM_STATUS NRV_MethodWrapper::GetAdapterPersonalities(const HBA_NAME& name,
                                                     std::vector<uint8_t>& record) {
  return validated(name, "GetAdapterPersonalities",
                   [&] { return readRaw(LRM_GetAdapterPersonalityInfo, name, record); });
}

RM_STATUS NRV_MethodWrapper::ChangeAdapterPersonality(const HBA_NAME& name,
                                                      const std::vector<uint8_t>& record) {
  return validated(name, "ChangeAdapterPersonality",
                   [&] { return writeRaw(LRM_ChangeAdapterPersonality, name, record); });
}

RM_STATUS NRV_MethodWrapper::GetAdpaterPortConfig(const HBA_NAME& name,
                                                  std::vector<uint8_t>& record) {
  return validated(name, "GetAdpaterPortConfig",
                   [&] { return readRaw(LRM_GetAdapterPortConfig, name, record); });
}

RM_STATUS NRV_MethodWrapper::SetAdpaterPortConfig(const HBA_NAME& name,
                                                  const std::vector<uint8_t>& record) {
  return validated(name, "SetAdpaterPortConfig", [&]() -> RM_STATUS {
    if (!wrapper::offers(name, RM_FEATURE_ADAPTER_PORT_CONFIG,
                         "Port configuration is not supported"))
      return RM_STATUS_ITEM_NOT_OFFERED;
    return writeRaw(LRM_SetAdapterPortConfig, name, record);
  });
}

RM_STATUS NRV_MethodWrapper::ListProfiles(const HBA_NAME& name, std::vector<uint8_t>& record) {
  return validated(name, "ListProfiles", [&]() -> RM_STATUS {
    if (!wrapper::offers(name, RM_FEATURE_PROFILES, "Profiles are not supported"))
      return RM_STATUS_ITEM_NOT_OFFERED;
    return readRaw(LRM_ListProfiles, name, record);
  });
}

RM_STATUS NRV_MethodWrapper::FactoryDefaults(const HBA_NAME& name) {
  return validated(name, "FactoryDefaults", [&]() -> RM_STATUS {
    if (!wrapper::offers(name, RM_FEATURE_FACTORY_DEFAULTS, "Factory defaults are not supported"))
      return RM_STATUS_ITEM_NOT_OFFERED;
    return LRM_SetAdapterPortConfigDefaults(name);
  });
}

RM_STATUS NRV_MethodWrapper::SetSRIOVEnabledState(const HBA_NAME& name, HBA_UINT32 state) {
  return validated(name, "SetSRIOVEnabledState", [&]() -> RM_STATUS {
    // The port configuration and the profile list must answer before the
    // state is changed: an adapter without them cannot take the change.
    std::vector<uint8_t> config, profiles;
    RM_STATUS status = readRaw(LRM_GetAdapterPortConfig, name, config);
    if (status != RM_STATUS_SUCCESS) return status;
    status = readRaw(LRM_ListProfiles, name, profiles);
    if (status != RM_STATUS_SUCCESS) return status;
    return setFeatureAttribute(name, RM_FEATURE_SRIOV, "SR-IOV is not supported", RM_PA_SRIOV_STATE,
                               state);
  });
}

RM_STATUS NRV_MethodWrapper::SetVEPAState(const HBA_NAME& name, HBA_UINT32 state) {
  return validated(name, "SetVEPAState", [&] {
    return setFeatureAttribute(name, RM_FEATURE_VEPA, "VEPA is not supported", RM_PA_VEPA_STATE,
                               state);
  });
}

// ---- Physical port --------------------------------------------------------------------------

RM_STATUS NRV_MethodWrapper::SetPortEnabled(const HBA_NAME& name, HBA_UINT32 enabled,
                                            HBA_UINT8& configStatus) {
  return validated(name, "SetPortEnabled",
                   [&] { return LRM_SetPortEnabled(name, enabled, &configStatus); });
}

RM_STATUS NRV_MethodWrapper::SetCableNVP(const HBA_NAME& name, HBA_UINT32 nvp) {
  return validated(name, "SetCableNVP", [&] { return LRM_DiagSetNVP(name, nvp); });
}

RM_STATUS NRV_MethodWrapper::SetPhyPortSpeed(const HBA_NAME& name, const std::string& speed,
                                             HBA_UINT32 mode, HBA_UINT32 cableLength) {
  return validated(name, "SetPhyPortSpeed", [&] {
    return LRM_SetPhyPortSpeedSettings(name, speed.c_str(), mode, cableLength);
  });
}

RM_STATUS NRV_MethodWrapper::GetPhyPortSpeedAttributesValues(const HBA_NAME& name,
                                                             PhyPortSpeed& values) {
  return validated(name, "GetPhyPortSpeedAttributesValues", [&]() -> RM_STATUS {
    std::vector<uint8_t> blob;
    const RM_STATUS status = readRaw(LRM_GetPortAttributes, name, blob, RM_PORT_ATTRIBUTES_SIZE);
    if (status != RM_STATUS_SUCCESS) return status;
    void* b = blob.data();
    values = PhyPortSpeed{};
    // Every value is optional: a port answers those its PHY has.
    wrapper::blobInteger(b, RM_PA_PHY_INTERFACE_TYPE, values.interfaceType);
    wrapper::blobText(b, RM_PA_PHY_AUTONEG_SUPPORTED_SPEEDS, values.autoNegSupportedSpeeds);
    wrapper::blobText(b, RM_PA_PHY_FORCE_SUPPORTED_SPEEDS, values.forceSupportedSpeeds);
    wrapper::blobText(b, RM_PA_PHY_CONFIGURED_PORT_SPEED, values.configuredPortSpeed);
    wrapper::blobInteger(b, RM_PA_PHY_PORT_SPEED_MODE, values.portSpeedMode);
    wrapper::blobInteger(b, RM_PA_PHY_DAC_CABLE_LENGTH, values.dacCableLength);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS NRV_MethodWrapper::SetLineRateAdvertised(const HBA_NAME& name, bool rate10G, bool rate1G,
                                                   bool rate100MB) {
  return validated(name, "SetLineRateAdvertised", [&] {
    const HBA_UINT32 rates = (rate10G ? RM_LINE_RATE_10G : 0u) | (rate1G ? RM_LINE_RATE_1G : 0u) |
                             (rate100MB ? RM_LINE_RATE_100MB : 0u);
    return setFeatureAttribute(name, RM_FEATURE_LINE_RATE_ADVERTISEMENT,
                               "Line-rate advertisement is not supported",
                               RM_PA_PHY_LINE_RATE_ADVERTISED, rates);
  });
}

// ---- World-wide names -------------------------------------------------------------------------

RM_STATUS NRV_MethodWrapper::GetWWNCapability(const HBA_NAME& name, HBA_UINT32& capability) {
  return validated(name, "GetWWNCapability",
                   [&] { return LRM_GetWWNCapability(name, &capability); });
}

RM_STATUS NRV_MethodWrapper::ReadWWN(const HBA_NAME& name, HBA_UINT32 type, HBA_NAME& wwpn,
                                     HBA_NAME& wwnn, HBA_UINT32& operationStatus) {
  return validated(name, "ReadWWN", [&] {
    const RM_STATUS status = LRM_ReadWWN(name, type, &wwpn, &wwnn, &operationStatus);
    const HBA_NAME none{};
    if (status == RM_STATUS_SUCCESS && std::memcmp(&wwpn, &none, sizeof none) == 0 &&
        std::memcmp(&wwnn, &none, sizeof none) == 0)
      NRV_LOG(NRV_INFO, "Volatile WWNs DO NOT EXIST on this adapter");
    return status;
  });
}

namespace {

bool sameName(const HBA_NAME& a, const HBA_NAME& b) { return std::memcmp(&a, &b, sizeof a) == 0; }

// Whether a local adapter or one of its virtual ports already carries `wwn`.
bool nameInUse(const HBA_NAME& wwn, const HBA_NAME& self) {
  const HBA_UINT32 adapters = RM_GetNumberOfLocalAdapters();
  for (HBA_UINT32 i = 0; i < adapters; ++i) {
    RM_ADAPTER_INSTANCE pair{0, i};
    RM_LOCAL_HBA_INFO_V4 info{};  // the un-versioned record is its prefix
    if (RM_GetLocalHBAInfo(&pair, reinterpret_cast<RM_LOCAL_HBA_INFO*>(&info)) != RM_STATUS_SUCCESS)
      continue;
    if (!sameName(info.wwpn, self) && (sameName(info.wwpn, wwn) || sameName(info.wwnn, wwn)))
      return true;
    std::vector<RM_VPORT_ENTRY> vports;
    if (wrapper::readTable(vports, 64, [&](void* b, HBA_UINT32* s) {
          return LRM_VPList(info.wwpn, b, s);
        }) != RM_STATUS_SUCCESS)
      continue;
    for (const RM_VPORT_ENTRY& v : vports)
      if (sameName(v.portName, wwn) || sameName(v.nodeName, wwn)) return true;
  }
  return false;
}

}  // namespace

RM_STATUS NRV_MethodWrapper::ChangeWWN(const HBA_NAME& name, HBA_UINT32 type, const HBA_NAME& wwpn,
                                       const HBA_NAME& wwnn, HBA_UINT32& operationStatus) {
  return validated(name, "ChangeWWN", [&]() -> RM_STATUS {
    if (RM_ValidateWwn(wwpn) != RM_STATUS_SUCCESS) {
      NRV_LOG(NRV_ERR, "The supplied 'New WWPN' is not valid");
      return kNrvFailure;
    }
    if (RM_ValidateWwn(wwnn) != RM_STATUS_SUCCESS) {
      NRV_LOG(NRV_ERR, "The supplied 'New WWNN' is not valid");
      return kNrvFailure;
    }
    if (nameInUse(wwpn, name)) {
      NRV_LOG(NRV_ERR, "ChangeWWN: Duplication of vport WWPN detected.");
      return kNrvFailure;
    }
    if (nameInUse(wwnn, name)) {
      NRV_LOG(NRV_ERR, "ChangeWWN: Duplication of vport WWNN detected.");
      return kNrvFailure;
    }
    return LRM_ChangeWWN(name, type, wwpn, wwnn, &operationStatus);
  });
}

RM_STATUS NRV_MethodWrapper::RestoreWWN(const HBA_NAME& name, HBA_UINT32 type,
                                        HBA_UINT32& operationStatus) {
  return validated(name, "RestoreWWN",
                   [&] { return LRM_RestoreWWN(name, type, &operationStatus); });
}

// ---- Virtual ports and functions
// -----------------------------------------------------------------

RM_STATUS NRV_MethodWrapper::ListVPorts(const HBA_NAME& name, std::vector<RM_VPORT_ENTRY>& vports) {
  return validated(name, "ListVPorts", [&] {
    return wrapper::readTable(vports, 64,
                              [&](void* b, HBA_UINT32* s) { return LRM_VPList(name, b, s); });
  });
}

RM_STATUS NRV_MethodWrapper::ListVPortAttributes(const HBA_NAME& name, const HBA_NAME& vport,
                                                 std::vector<uint8_t>& record) {
  return validated(name, "ListVPortAttributes", [&] {
    return wrapper::readSized(record, 4096, [&](void* b, HBA_UINT32* s) {
      return LRM_VPGetAttributes(name, vport, b, s);
    });
  });
}

RM_STATUS NRV_MethodWrapper::ListVPortTargets(const HBA_NAME& name, const HBA_NAME& vport,
                                              std::vector<uint8_t>& record) {
  return validated(name, "ListVPortTargets", [&] {
    return wrapper::readSized(
        record, 4096, [&](void* b, HBA_UINT32* s) { return LRM_VPListTargets(name, vport, b, s); });
  });
}

RM_STATUS NRV_MethodWrapper::ListVMfromVPort(const HBA_NAME& name, const HBA_NAME& vport,
                                             std::vector<uint8_t>& record) {
  return validated(name, "ListVMfromVPort", [&] {
    return wrapper::readSized(record, 4096, [&](void* b, HBA_UINT32* s) {
      return LRM_GetVMFromVPort(name, vport, b, s);
    });
  });
}

RM_STATUS NRV_MethodWrapper::GetVMInfo(const HBA_NAME& name, std::vector<uint8_t>& record) {
  return validated(name, "GetVMInfo", [&] { return readRaw(LRM_GetVMInfo, name, record); });
}

RM_STATUS NRV_MethodWrapper::GetVirtualFuncList(const HBA_NAME& name,
                                                std::vector<uint8_t>& record) {
  return validated(name, "GetVirtualFuncList",
                   [&] { return readRaw(LRM_GetVirtualFunctionList, name, record); });
}

RM_STATUS NRV_MethodWrapper::GetVirtualFuncPropertyList(const HBA_NAME& name, HBA_UINT32 function,
                                                        std::vector<uint8_t>& record) {
  return validated(name, "GetVirtualFuncPropertyList", [&] {
    return wrapper::readSized(record, 4096, [&](void* b, HBA_UINT32* s) {
      return LRM_GetVirtualFunctionProperties(name, function, b, s);
    });
  });
}

}  // namespace cimple
