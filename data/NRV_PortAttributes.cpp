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

// Every member of the port sets read from the port attribute blob: number,
// type, kinds that read it, label, and the NIC label where it differs.
#define NRV_PORT_FIELDS(X)                                                             \
  X(771, kText, kFcoe, "_PortSymbolicName", nullptr)                                   \
  X(772, kInteger, kFcoe, "_PortFcId", nullptr)                                        \
  X(773, kInteger, kFcoe, "_PortType", nullptr)                                        \
  X(774, kInteger, kNic | kIscsi | kFcoe, "_FunctionalPortState", nullptr)             \
  X(775, kServiceType, kFcoe, "_PORT_SERVICE_TYPE", nullptr)                           \
  X(775, kInteger, kFcoe, "_PortSupportedClassofService", nullptr)                     \
  X(776, kWwn, kIscsi | kFcoe, "_NodeWWN", nullptr)                                    \
  X(777, kWwn, kIscsi | kFcoe, "_PortWWN", nullptr)                                    \
  X(778, kInteger, kNic | kIscsi | kFcoe, "_PortSupportedSpeed", "_SupportedPortSpeed") \
  X(779, kInteger, kNic | kIscsi | kFcoe, "_PortSpeed", nullptr)                       \
  X(780, kInteger, kFcoe, "_PortMaxFrameSize", nullptr)                                \
  X(781, kText, kFcoe, "_OSDeviceName", nullptr)                                       \
  X(782, kInteger, kFcoe, "_NumberofDiscoveredPorts", nullptr)                         \
  X(783, kFabric, kIscsi | kFcoe, "_FabricName", nullptr)                              \
  X(784, kInteger, kNic | kIscsi, "_MaximumMTU", nullptr)                              \
  X(785, kInteger, kIscsi, "_LDTO ", nullptr)                                          \
  X(786, kInteger, kIscsi, "_DefaultETO ", nullptr)                                    \
  X(800, kInteger, kNic, "_FunctionType", nullptr)                                     \
  X(801, kInteger, kIscsi, "_MaxCDBLength", nullptr)                                   \
  X(802, kInteger, kNic | kIscsi | kFcoe, "_PhysicalPortState", nullptr)               \
  X(803, kText, kNic, "_IfName", nullptr)                                              \
  X(804, kText, kNic | kIscsi, "_PermanentMACAddress", nullptr)                        \
  X(805, kInteger, kNic | kIscsi, "_CurrentMTU ", nullptr)                             \
  X(806, kText, kNic, "_ProtocolIFType", nullptr)                                      \
  X(807, kText, kNic, "_LinkTechnology", nullptr)                                      \
  X(808, kText, kNic, "_Capabilities", nullptr)                                        \
  X(809, kText, kNic, "_EnabledCapabilities", nullptr)                                 \
  X(810, kText, kNic, "_IPProtocolEndpointName", nullptr)                              \
  X(811, kText, kNic, "_IPProtocolIFType", nullptr)                                    \
  X(812, kText, kNic, "_IPv4Address", nullptr)                                         \
  X(813, kText, kNic, "_SubnetMask", nullptr)                                          \
  X(814, kText, kNic, "_AddressOrigin", nullptr)                                       \
  X(815, kText, kNic | kIscsi | kFcoe, "_FuncPortSpeed", nullptr)                      \
  X(816, kText, kNic | kIscsi | kFcoe, "_FuncQosBandwidth", nullptr)                   \
  X(817, kInteger, kNic, "_SpecialFeature", nullptr)                                   \
  X(818, kInteger, kNic, "_vNICEnabledState", nullptr)                                 \
  X(819, kText, kNic, "_VNICName", nullptr)                                            \
  X(820, kInteger, kNic, "_vNICOuterVLANId", nullptr)                                  \
  X(821, kText, kNic, "_VNICMinBandwidth", nullptr)                                    \
  X(822, kText, kNic, "_VNICMaxBandwidth", nullptr)                                    \
  X(823, kInteger, kFcoe, "_PFCThrottle", nullptr)                                     \
  X(842, kInteger, kIscsi | kFcoe, "_PhysicalPortSpeed", nullptr)                      \
  X(843, kText, kNic, "_GatewayAddress", nullptr)                                      \
  X(853, kInteger, kNic, "_SRIOVState", nullptr)                                       \
  X(855, kInteger, kNic | kIscsi | kFcoe, "_PhyLinkDownReason", nullptr)               \
  X(856, kText, kNic | kIscsi, "_FuncQosMinBandwidth", nullptr)                        \
  X(857, kText, kNic | kIscsi, "_IPV6GatewayAddr", nullptr)                            \
  X(865, kInteger, kNic, "_VEPAState", nullptr)

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
  setText(kAttrPortIdentifier, identifierText);
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
    const std::pair<const char*, const RM_IP_ADDRESS*> addresses[] = {
        {kAttrNetIPAddress, &net.ipv4Address},
        {kAttrNetSubnetMask, &net.subnetMask},
        {kAttrNetGateway, &net.gateway},
    };
    for (const auto& [label, address] : addresses) {
      std::string textForm;
      ipInfo2String(*address, textForm);
      setText(label, std::move(textForm));
    }
    setInteger(kAttrNetVLANId, net.vlanId);
    setInteger(kAttrNetVLANEnabled, net.vlanEnabled);
  }

  RM_ISCSI_INITIATOR_PROPERTIES props{};
  RM_ISCSI_INITIATOR_EXTRA extra{};
  if (LRM_iSCSI_GetInitiatorProperties(name, &props, &extra) != RM_STATUS_SUCCESS) {
    NRV_DATA_LOG(NRV_ERR, "ERROR: RM_iSCSI_GetInitiatorProperties() Failed.");
    return;
  }
  auto bounded = [](const char* p, size_t size) { return std::string(p, strnlen(p, size)); };
  setText(kAttrInitiatorName, bounded(props.initiatorName, sizeof props.initiatorName));
  setText(kAttrInitiatorAlias, bounded(props.initiatorAlias, sizeof props.initiatorAlias));
  setText(kAttrAuthMethod, authMethodText(props.auth.method));
  if (props.auth.method == RM_AUTH_NONE)
    setText(kAttrCHAPName, "Not Available");
  else if (props.auth.method == RM_AUTH_ONE_WAY_CHAP)
    setText(kAttrCHAPName, bounded(props.auth.initiatorChapName, sizeof props.auth.initiatorChapName));
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
