// Adapter attribute sets: what the management library's HBA attribute blob
// says about one PCI function, one set per adapter kind.
//
// Contract: each constructor reads the blob once (RM_GetHBAAttributes through
// its forwarder) for the adapter identifier given and never fails: a blob that
// cannot be read leaves every member at 0 / "" and the number of ports at 0;
// otherwise the set reports one port.  Nothing is kept of the blob itself.
#pragma once

#include "access/RM_Types.h"
#include "data/NRV_AttributeSet.h"

namespace cimple {

class AdapterAttributes : public AttributeSet {
 public:
  // The member lists a set reads (FC sets read the FCoE lists).
  enum class Kind { kNic, kIscsi, kFcoe };

  // 1 once the blob was read, else 0: the number of ports the adapter builds.
  uint32_t getNumberOfPorts() const { return m_NumberOfPorts; }

 protected:
  AdapterAttributes() = default;

  // Reads the HBA attribute blob of the adapter named by `identifierText`
  // into the members of `kind` (FC adapters read the FCoE members).
  void fill(Kind kind, const std::string& identifierText);

 private:
  uint32_t m_NumberOfPorts = 0;
};

// `identifierText` is the adapter identifier as 16 upper-case hex digits.
class FCAdapterAttributes : public AdapterAttributes {
 public:
  explicit FCAdapterAttributes(const std::string& identifierText);
};

class NICAdapterAttributes : public AdapterAttributes {
 public:
  explicit NICAdapterAttributes(const std::string& identifierText);
};

class iSCSIAdapterAttributes : public AdapterAttributes {
 public:
  explicit iSCSIAdapterAttributes(const std::string& identifierText);
};

// Also carries NRV_ATTR_DRIVER_TYPE (RM_GetDriverType) and the IEEE address
// as six lower-case pairs joined by ":".
class FCoEAdapterAttributes : public AdapterAttributes {
 public:
  explicit FCoEAdapterAttributes(const std::string& identifierText);
};

}  // namespace cimple
