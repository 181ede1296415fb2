#include "data/NRV_PortAttributes.h"

#include <string.h>

#include <vector>

#include "access/NRV_Common.h"
#include "access/RM_Api.h"
#include "data/NRV_DataLog.h"

namespace cimple {

namespace {

enum KindBit : unsigned { kNic = 1, kIscsi = 2, kFcoe = 4 };
using Kind = PortAttributes::Kind;

// Every member of the port sets read from the port attribute blob: attribute
// number, type, kinds that read it, label, and the NIC label where it differs
// (labels only name the member in the log; some end in a blank).
#define NRV_PORT_FIELDS(X)                                                                                     \
  X(RM_PA_PORT_SYMBOLIC_NAME, kText, kFcoe, "_PortSymbolicName", nullptr)                                      \
  X(RM_PA_PORT_FC_ID, kInteger, kFcoe, "_PortFcId", nullptr)                                                   \
  X(RM_PA_PORT_TYPE, kInteger, kFcoe, "_PortType", nullptr)                                                    \
  X(RM_PA_PORT_STATE, kInteger, kNic | kIscsi | kFcoe, "_FunctionalPortState", nullptr)                        \
  X(RM_PA_PORT_SERVICE_TYPE, kServiceType, kFcoe, "_PORT_SERVICE_TYPE", nullptr)                               \
  X(RM_PA_PORT_SERVICE_TYPE, kInteger, kFcoe, "_PortSupportedClassofService", nullptr)                         \
  X(RM_PA_PORT_NODE_WWN, kWwn, kIscsi | kFcoe, "_NodeWWN", nullptr)                                            \
  X(RM_PA_PORT_PORT_WWN, kWwn, kIscsi | kFcoe, "_PortWWN", nullptr)                                            \
  X(RM_PA_PORT_SUPPORTED_SPEED, kInteger, kNic | kIscsi | kFcoe, "_PortSupportedSpeed", "_SupportedPortSpeed") \
  X(RM_PA_PORT_SPEED, kInteger, kNic | kIscsi | kFcoe, "_PortSpeed", nullptr)                                  \
  X(RM_PA_PORT_MAX_FRAME_SIZE, kInteger, kFcoe, "_PortMaxFrameSize", nullptr)                                  \
  X(RM_PA_OS_DEVICE_NAME, kText, kFcoe, "_OSDeviceName", nullptr)                                              \
  X(RM_PA_NUMBER_OF_DISCOVERED_PORTS, kInteger, kFcoe, "_NumberofDiscoveredPorts", nullptr)                    \
  X(RM_PA_FABRIC, kFabric, kIscsi | kFcoe, "_FabricName", nullptr)                                             \
  X(RM_PA_MAXIMUM_MTU, kInteger, kNic | kIscsi, "_MaximumMTU", nullptr)                                        \
  X(RM_PA_LDTO, kInteger, kIscsi, "_LDTO ", nullptr)                                                           \
  X(RM_PA_DEFAULT_ETO, kInteger, kIscsi, "_DefaultETO ", nullptr)                                              \
  X(RM_PA_FUNCTION_TYPE, kInteger, kNic, "_FunctionType", nullptr)                                             \
  X(RM_PA_MAX_CDB_LENGTH, kInteger, kIscsi, "_MaxCDBLength", nullptr)                                          \
  X(RM_PA_PHYSICAL_PORT_STATE, kInteger, kNic | kIscsi | kFcoe, "_PhysicalPortState", nullptr)                 \
  X(RM_PA_IF_NAME, kText, kNic, "_IfName", nullptr)                                                            \
  X(RM_PA_PERMANENT_MAC_ADDRESS, kText, kNic | kIscsi, "_PermanentMACAddress", nullptr)                        \
  X(RM_PA_CURRENT_MTU, kInteger, kNic | kIscsi, "_CurrentMTU ", nullptr)                                       \
  X(RM_PA_PROTOCOL_IF_TYPE, kText, kNic, "_ProtocolIFType", nullptr)                                           \
  X(RM_PA_LINK_TECHNOLOGY, kText, kNic, "_LinkTechnology", nullptr)                                            \
  X(RM_PA_CAPABILITIES, kText, kNic, "_Capabilities", nullptr)                                                 \
  X(RM_PA_ENABLED_CAPABILITIES, kText, kNic, "_EnabledCapabilities", nullptr)                                  \
  X(RM_PA_IP_PROTOCOL_ENDPOINT_NAME, kText, kNic, "_IPProtocolEndpointName", nullptr)                          \
  X(RM_PA_IP_PROTOCOL_IF_TYPE, kText, kNic, "_IPProtocolIFType", nullptr)                                      \
  X(RM_PA_IPV4_ADDRESS, kText, kNic, "_IPv4Address", nullptr)                                                  \
  X(RM_PA_SUBNET_MASK, kText, kNic, "_SubnetMask", nullptr)                                                    \
  X(RM_PA_ADDRESS_ORIGIN, kText, kNic, "_AddressOrigin", nullptr)                                              \
  X(RM_PA_FUNC_PORT_SPEED, kText, kNic | kIscsi | kFcoe, "_FuncPortSpeed", nullptr)                            \
  X(RM_PA_FUNC_QOS_BANDWIDTH, kText, kNic | kIscsi | kFcoe, "_FuncQosBandwidth", nullptr)                      \
  X(RM_PA_SPECIAL_FEATURE, kInteger, kNic, "_SpecialFeature", nullptr)                                         \
  X(RM_PA_VNIC_ENABLED_STATE, kInteger, kNic, "_vNICEnabledState", nullptr)                                    \
  X(RM_PA_VNIC_NAME, kText, kNic, "_VNICName", nullptr)                                                        \
  X(RM_PA_VNIC_OUTER_VLAN_ID, kInteger, kNic, "_vNICOuterVLANId", nullptr)                                     \
  X(RM_PA_VNIC_MIN_BANDWIDTH, kText, kNic, "_VNICMinBandwidth", nullptr)                                       \
  X(RM_PA_VNIC_MAX_BANDWIDTH, kText, kNic, "_VNICMaxBandwidth", nullptr)                                       \
  X(RM_PA_PFC_THROTTLE, kInteger, kFcoe, "_PFCThrottle", nullptr)                                              \
  X(RM_PA_PHYSICAL_PORT_SPEED, kInteger, kIscsi | kFcoe, "_PhysicalPortSpeed", nullptr)                        \
  X(RM_PA_GATEWAY_ADDRESS, kText, kNic, "_GatewayAddress", nullptr)                                            \
  X(RM_PA_SRIOV_STATE, kInteger, kNic, "_SRIOVState", nullptr)                                                 \
  X(RM_PA_PHY_LINK_DOWN_REASON, kInteger, kNic | kIscsi | kFcoe, "_PhyLinkDownReason", nullptr)                \
  X(RM_PA_FUNC_QOS_MIN_BANDWIDTH, kText, kNic | kIscsi, "_FuncQosMinBandwidth", nullptr)                       \
  X(RM_PA_IPV6_GATEWAY_ADDR, kText, kNic | kIscsi, "_IPV6GatewayAddr", nullptr)                                \
  X(RM_PA_VEPA_STATE, kInteger, kNic, "_VEPAState", nullptr)

struct Row {
  uint16_t number;
  AttributeSet::Type type;
  unsigned kinds;
  const char* label;
  const char* nicLabel;
};

const std::vector<AttributeSet::Field>& fieldsOf(Kind kind) {
  using Field = AttributeSet::Field;
  static const Row rows[] = {
#define NRV_ROW_(number, type, kinds, label, nic) {number, AttributeSet::Type::type, kinds, label, nic},
      NRV_PORT_FIELDS(NRV_ROW_)
#undef NRV_ROW_
  };
  auto select = [](Kind k) {
    const unsigned bit = k == Kind::kNic ? kNic : k == Kind::kIscsi ? kIscsi : kFcoe;
    std::vector<Field> out;
    for (const Row& r : rows)
      if ((r.kinds & bit) != 0)
        out.push_back(Field{r.number, r.type, k == Kind::kNic && r.nicLabel ? r.nicLabel : r.label});
    return out;
  };
  static const std::vector<Field> nic = select(Kind::kNic);
  static const std::vector<Field> iscsi = select(Kind::kIscsi);
  static const std::vector<Field> fcoe = select(Kind::kFcoe);
  return kind == Kind::kNic ? nic : kind == Kind::kIscsi ? iscsi : fcoe;
}

const char* authMethodText(HBA_UINT32 method) {
  switch (method) {
    case RM_AUTH_NONE: return "None";
    case RM_AUTH_ONE_WAY_CHAP: return "One-Way CHAP";
    default: return "Mutual CHAP";
  }
}

}  // namespace

void PortAttributes::fill(Kind kind, const std::string& identifierText,
                          const RM_LOCAL_HBA_INFO_V4* info) {
  setText(NRV_ATTR_PORT_IDENTIFIER, identifierText);
  NRV_DATA_LOG(NRV_DBG, "Port 0's WWPN: %s", identifierText.c_str());
  HBA_NAME name{};
  if (string2HBAName(&name, identifierText.c_str()) != 1) {
    NRV_DATA_LOG(NRV_DBG, "NRV_MethodWrapper::string2HBAName failed");
    return;
  }
  std::vector<unsigned char> blob(RM_PORT_ATTRIBUTES_SIZE);
  HBA_UINT32 size = RM_PORT_ATTRIBUTES_SIZE;
  const RM_STATUS status = RM_GetPortAttributes(name, blob.data(), &size);
  if (status != RM_STATUS_SUCCESS) {
    NRV_DATA_LOG(NRV_DBG, "RM_GetPortAttributes call failed (%d)\n", static_cast<int>(status));
  } else {
    readFields(blob.data(), Scope::kPort, fieldsOf(kind));
    if (kind == Kind::kNic) {
      NRV_DATA_LOG(NRV_DBG, "Port MAC Address : [%s]", text(RM_PA_PERMANENT_MAC_ADDRESS).c_str());
      NRV_DATA_LOG(NRV_ERR, " hbaInfo.SpecialFeatures : (%d) _SpecialFeature : %d \n",
                   info != nullptr ? static_cast<int>(info->specialFeatures) : 0,
                   static_cast<int>(integer(RM_PA_SPECIAL_FEATURE)));
    }
  }
  if (kind == Kind::kIscsi) readIscsiRecords(name);
}

void PortAttributes::readIscsiRecords(const HBA_NAME& name) {
  RM_NETWORK_SETTINGS net{};
  HBA_UINT32 size = sizeof net;
  if (LRM_Ini_GetNetworkProperties(name, &net, &size) != RM_STATUS_SUCCESS) {
    NRV_DATA_LOG(NRV_ERR, "ERROR: HBACMD_GetNetConfig: RM_iSCSI_GetNetConfig() Failed.");
  } else {
    const std::pair<NRV_ATTRIBUTE, const RM_IP_ADDRESS*> addresses[] = {
        {NRV_ATTR_NET_IP_ADDRESS, &net.ipv4Address},
        {NRV_ATTR_NET_SUBNET_MASK, &net.subnetMask},
        {NRV_ATTR_NET_GATEWAY, &net.gateway},
    };
    for (const auto& [key, address] : addresses) {
      std::string textForm;
      ipInfo2String(*address, textForm);
      setText(key, std::move(textForm));
    }
    setInteger(NRV_ATTR_NET_VLAN_ID, net.vlanId);
    setInteger(NRV_ATTR_NET_VLAN_ENABLED, net.vlanEnabled);
  }

  RM_ISCSI_INITIATOR_PROPERTIES props{};
  RM_ISCSI_INITIATOR_EXTRA extra{};
  if (LRM_iSCSI_GetInitiatorProperties(name, &props, &extra) != RM_STATUS_SUCCESS) {
    NRV_DATA_LOG(NRV_ERR, "ERROR: RM_iSCSI_GetInitiatorProperties() Failed.");
    return;
  }
  auto bounded = [](const char* p, size_t size) { return std::string(p, strnlen(p, size)); };
  setText(NRV_ATTR_INITIATOR_NAME, bounded(props.initiatorName, sizeof props.initiatorName));
  setText(NRV_ATTR_INITIATOR_ALIAS, bounded(props.initiatorAlias, sizeof props.initiatorAlias));
  setText(NRV_ATTR_AUTH_METHOD, authMethodText(props.auth.method));
  if (props.auth.method == RM_AUTH_NONE)
    setText(NRV_ATTR_CHAP_NAME, "Not Available");
  else if (props.auth.method == RM_AUTH_ONE_WAY_CHAP)
    setText(NRV_ATTR_CHAP_NAME, bounded(props.auth.initiatorChapName, sizeof props.auth.initiatorChapName));
}

FCPortAttributes::FCPortAttributes(const std::string& identifierText) {
  fill(Kind::kFcoe, identifierText, nullptr);
}

NICPortAttributes::NICPortAttributes(const std::string& identifierText,
                                     const RM_LOCAL_HBA_INFO_V4& info) {
  fill(Kind::kNic, identifierText, &info);
}

iSCSIPortAttributes::iSCSIPortAttributes(const std::string& identifierText) {
  fill(Kind::kIscsi, identifierText, nullptr);
}

FCoEPortAttributes::FCoEPortAttributes(const std::string& identifierText) {
  fill(Kind::kFcoe, identifierText, nullptr);
}

}  // namespace cimple
