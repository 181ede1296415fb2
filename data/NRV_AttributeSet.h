// One attribute set of an adapter or port: the values read once, at
// construction, out of the management library's attribute blob.
//
// Contract: a set is filled by its kind's constructor (NRV_AdapterAttributes.h,
// NRV_PortAttributes.h) and read-only afterwards.  Members are found by their
// attribute number or by their "_" label; a member whose read failed, or that
// the kind does not carry, answers 0 or the empty text.  Members the module
// adds beyond the blob (identifiers, network and initiator settings) have the
// attribute number 0 and are found by label only.
#pragma once

#include <stdint.h>

#include <string>
#include <string_view>
#include <vector>

namespace cimple {

class AttributeSet {
 public:
  AttributeSet(const AttributeSet&) = delete;
  AttributeSet& operator=(const AttributeSet&) = delete;
  virtual ~AttributeSet();

  // 0 when the member is absent or unread.
  uint32_t integer(uint16_t number) const;
  uint32_t integer(std::string_view label) const;
  // "" when the member is absent or unread.
  const std::string& text(uint16_t number) const;
  const std::string& text(std::string_view label) const;
  // Whether the set carries the member (read or not); a set whose blob could
  // not be obtained carries none of the blob's members.
  bool has(std::string_view label) const;

  struct Member {
    uint16_t number;      // 0 for members from outside the blob
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
    uint16_t number;
    Type type;
    const char* label;
  };

 protected:
  AttributeSet() = default;

  // Reads every field out of `blob` (RM_GetAttributeValue), logging each
  // value or failure; a failed read leaves its member at 0 / "".
  void readFields(void* blob, Scope scope, const std::vector<Field>& fields);

  // Adds (or overwrites) a member that does not come from the blob.
  void setText(const char* label, std::string value);
  void setInteger(const char* label, uint32_t value);
  // Adds a member read from the blob.
  Member& add(uint16_t number, const char* label, bool isText);

 private:
  const Member* find(uint16_t number) const;
  const Member* find(std::string_view label) const;

  std::vector<Member> m_Members;
};

}  // namespace cimple
