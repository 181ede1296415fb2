// Port attribute sets: what the management library's port attribute blob
// (and, for iSCSI, the network and initiator records) says about one port.
//
// Contract: each constructor reads once for the adapter identifier given and
// never fails: a record that cannot be read leaves its members at 0 / "".
// Every kind carries NRV_ATTR_PORT_IDENTIFIER, the port identifier text (16
// upper-case hex digits) that names the port; FCoE and iSCSI sets add the
// node and port names (RM_PA_PORT_NODE_WWN, RM_PA_PORT_PORT_WWN: 16 hex
// digits), the fabric name (RM_PA_FABRIC) and NRV_ATTR_FABRIC_FLAGS; the NIC
// set RM_PA_SPECIAL_FEATURE; the iSCSI set the network settings
// (NRV_ATTR_NET_*) and the initiator (NRV_ATTR_INITIATOR_NAME, _ALIAS,
// NRV_ATTR_AUTH_METHOD, NRV_ATTR_CHAP_NAME).
#pragma once

#include "access/RM_Types.h"
#include "data/NRV_AttributeSet.h"

namespace cimple {

class PortAttributes : public AttributeSet {
 public:
  // The member lists a set reads (FC sets read the FCoE lists).
  enum class Kind { kNic, kIscsi, kFcoe };

  // The port identifier text.
  const std::string& getPortIdentifier() const { return text(NRV_ATTR_PORT_IDENTIFIER); }

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
