// Port attribute sets: what the management library's port attribute blob
// (and, for iSCSI, the network and initiator records) says about one port.
//
// Contract: each constructor reads once for the adapter identifier given and
// never fails: a record that cannot be read leaves its members at 0 / "".
// Every kind carries "_WWPN", the port identifier text (16 upper-case hex
// digits) that names the port; FCoE and iSCSI sets add "_NodeWWN",
// "_PortWWN" (eight hex pairs), "_FabricName" and "_nFlags"; the NIC set
// "_SpecialFeature"; the iSCSI set the network settings ("_IPAddress",
// "_SubnetMask", "_Gateway", "_VLANId", "_VLANEnabled") and the initiator
// ("_InitiatorName", "_InitiatorAlias", "_AuthMethod", "_CHAPName").
#pragma once

#include "access/RM_Types.h"
#include "data/NRV_AttributeSet.h"

namespace cimple {

// Labels of the members added beyond the blob, for readers of the sets.
inline constexpr const char* kAttrPortIdentifier = "_WWPN";
inline constexpr const char* kAttrNodeWWN = "_NodeWWN";
inline constexpr const char* kAttrPortWWN = "_PortWWN";
inline constexpr const char* kAttrFabricName = "_FabricName";
inline constexpr const char* kAttrFabricFlags = "_nFlags";
inline constexpr const char* kAttrSpecialFeature = "_SpecialFeature";
inline constexpr const char* kAttrIPAddress = "_IPAddress";
inline constexpr const char* kAttrSubnetMask = "_SubnetMask";
inline constexpr const char* kAttrGateway = "_Gateway";
inline constexpr const char* kAttrVLANId = "_VLANId";
inline constexpr const char* kAttrVLANEnabled = "_VLANEnabled";
inline constexpr const char* kAttrInitiatorName = "_InitiatorName";
inline constexpr const char* kAttrInitiatorAlias = "_InitiatorAlias";
inline constexpr const char* kAttrAuthMethod = "_AuthMethod";
inline constexpr const char* kAttrCHAPName = "_CHAPName";
inline constexpr const char* kAttrDriverType = "_DriverType";

class PortAttributes : public AttributeSet {
 public:
  // The port identifier text ("_WWPN").
  const std::string& getPortIdentifier() const { return text(kAttrPortIdentifier); }

 protected:
  explicit PortAttributes(const std::string& identifierText);
};

class FCPortAttributes : public PortAttributes {
 public:
  explicit FCPortAttributes(const std::string& identifierText);
};

// `info` is the adapter information record, for its special-feature word.
class NICPortAttributes : public PortAttributes {
 public:
  NICPortAttributes(const std::string& identifierText, const RM_LOCAL_HBA_INFO_V4& info);
};

class iSCSIPortAttributes : public PortAttributes {
 public:
  explicit iSCSIPortAttributes(const std::string& identifierText);
};

class FCoEPortAttributes : public PortAttributes {
 public:
  explicit FCoEPortAttributes(const std::string& identifierText);
};

}  // namespace cimple
