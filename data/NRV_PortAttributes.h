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
inline constexpr const char* kAttrNetIPAddress = "_NetIPAddress";
inline constexpr const char* kAttrNetSubnetMask = "_NetSubnetMask";
inline constexpr const char* kAttrNetGateway = "_NetGateway";
inline constexpr const char* kAttrNetVLANId = "_NetVLANId";
inline constexpr const char* kAttrNetVLANEnabled = "_NetVLANEnabled";
inline constexpr const char* kAttrInitiatorName = "_InitiatorName";
inline constexpr const char* kAttrInitiatorAlias = "_InitiatorAlias";
inline constexpr const char* kAttrAuthMethod = "_AuthMethod";
inline constexpr const char* kAttrCHAPName = "_CHAPName";

class PortAttributes : public AttributeSet {
 public:
  // The member lists a set reads (FC sets read the FCoE lists).
  enum class Kind { kNic, kIscsi, kFcoe };

  // The port identifier text ("_WWPN").
  const std::string& getPortIdentifier() const { return text(kAttrPortIdentifier); }

 protected:
  PortAttributes() = default;

  // Reads the port records of the port named by `identifierText` into the
  // members of `kind` (FC ports read the FCoE members); `info` only for NIC.
  void fill(Kind kind, const std::string& identifierText, const RM_LOCAL_HBA_INFO_V4* info);

 private:
  void readIscsiRecords(const HBA_NAME& name);
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
