// One attribute set of an adapter or port: the values read once, at
// construction, out of the management library's attribute blob.
//
// Contract: a set is filled by its kind's constructor (NRV_AdapterAttributes.h,
// NRV_PortAttributes.h) and read-only afterwards.  Members are found by key
// only: the attribute number for members read from a blob (RM_HA_* and RM_PA_*
// of access/RM_Attributes.h), NRV_ATTR_* below for the members the module adds
// (identifiers, network and initiator settings).  Labels name members in the
// log only; they differ between kinds for the same number.  A member whose
// read failed, or that the kind does not carry, answers 0 or the empty text.
#pragma once

#include <stdint.h>

#include <string>
#include <vector>

#include "access/RM_Attributes.h"

// Members the module adds beyond the blobs: (key, label).
#define NRV_MODULE_ATTRIBUTES(X)                                                 \
  X(NRV_ATTR_PORT_IDENTIFIER, "_WWPN")   /* the port identifier text */          \
  X(NRV_ATTR_FABRIC_FLAGS, "_nFlags")    /* beside RM_PA_FABRIC, the fabric name */ \
  X(NRV_ATTR_DRIVER_TYPE, "_DriverType") /* RM_GetDriverType, FCoE adapters */    \
  X(NRV_ATTR_NET_IP_ADDRESS, "_NetIPAddress")                                    \
  X(NRV_ATTR_NET_SUBNET_MASK, "_NetSubnetMask")                                  \
  X(NRV_ATTR_NET_GATEWAY, "_NetGateway")                                         \
  X(NRV_ATTR_NET_VLAN_ID, "_NetVLANId")                                          \
  X(NRV_ATTR_NET_VLAN_ENABLED, "_NetVLANEnabled")                                \
  X(NRV_ATTR_INITIATOR_NAME, "_InitiatorName")                                   \
  X(NRV_ATTR_INITIATOR_ALIAS, "_InitiatorAlias")                                 \
  X(NRV_ATTR_AUTH_METHOD, "_AuthMethod")                                         \
  X(NRV_ATTR_CHAP_NAME, "_CHAPName")

// Keyed past every attribute number of the library.
enum NRV_ATTRIBUTE : uint16_t {
  NRV_ATTR_BASE = 0xF000,
#define NRV_ATTR_KEY_(key, label) key,
  NRV_MODULE_ATTRIBUTES(NRV_ATTR_KEY_)
#undef NRV_ATTR_KEY_
};
static_assert(+NRV_ATTR_BASE > +RM_HA_FIRMWARE_ON_FLASH && +NRV_ATTR_BASE > +RM_PA_PHY_DAC_CABLE_LENGTH);

namespace cimple {

class AttributeSet {
 public:
  AttributeSet(const AttributeSet&) = delete;
  AttributeSet& operator=(const AttributeSet&) = delete;
  virtual ~AttributeSet();

  // 0 when the member is absent or unread.
  uint32_t integer(uint16_t key) const;
  // "" when the member is absent or unread.
  const std::string& text(uint16_t key) const;
  // Whether the set carries the member (read or not); a set whose blob could
  // not be obtained carries none of the blob's members.
  bool has(uint16_t key) const;

  // A number read into two members (the FCoE port's 775) is found as the
  // first; both hold the same value.
  struct Member {
    uint16_t key;         // attribute number, or NRV_ATTR_*
    const char* label;    // static text, "_Model"
    bool isText;
    uint32_t value;       // integer members
    std::string textValue;  // text members
  };
  const std::vector<Member>& members() const { return m_Members; }

  // How a member is read out of a blob, and which failure text it logs.
  enum class Scope : uint8_t { kAdapter, kPort };
  enum class Type : uint8_t {
    kInteger,      // 32-bit
    kServiceType,  // 32-bit, also logged as "PA_PORT_SERVICE_TYPE"
    kText,         // at most 255 bytes
    kMac,          // 6 bytes, written as lower-case pairs joined by ":"
    kWwn,          // 8 bytes, written as 16 upper-case hex digits
    kFabric,       // RM_FABRIC_RECORD: "_FabricName" and "_nFlags"
  };
  struct Field {
    uint16_t number;  // RM_HA_* or RM_PA_*
    Type type;
    const char* label;
  };

 protected:
  AttributeSet() = default;

  // Reads every field out of `blob` (RM_GetAttributeValue), logging each
  // value or failure; a failed read leaves its member at 0 / "".
  void readFields(void* blob, Scope scope, const std::vector<Field>& fields);

  // Adds (or overwrites) a member that does not come from the blob.
  void setText(NRV_ATTRIBUTE key, std::string value);
  void setInteger(NRV_ATTRIBUTE key, uint32_t value);
  // Adds a member, or answers the one of that key and label.
  Member& add(uint16_t key, const char* label, bool isText);

 private:
  const Member* find(uint16_t key) const;

  std::vector<Member> m_Members;
};

}  // namespace cimple
