#include "data/NRV_AttributeSet.h"

#include <stdio.h>
#include <string.h>

#include <string_view>

#include "access/RM_Api.h"
#include "data/NRV_DataLog.h"

namespace cimple {

namespace {

const std::string kEmpty;

// Up to 255 bytes of a text value, cut at its first NUL.
std::string boundedText(const void* value, uint16_t length) {
  const size_t limit = length < 255 ? length : 255;
  const char* p = static_cast<const char*>(value);
  return std::string(p, strnlen(p, limit));
}

std::string hexBytes(const uint8_t* bytes, size_t count, const char* pairFormat,
                     const char* separator) {
  std::string out;
  char pair[4];
  for (size_t i = 0; i < count; ++i) {
    if (i > 0) out += separator;
    snprintf(pair, sizeof pair, pairFormat, bytes[i]);
    out += pair;
  }
  return out;
}

const char* moduleLabel(NRV_ATTRIBUTE key) {
  switch (key) {
#define NRV_ATTR_LABEL_(k, label) \
  case k:                         \
    return label;
    NRV_MODULE_ATTRIBUTES(NRV_ATTR_LABEL_)
#undef NRV_ATTR_LABEL_
    default:
      return "";
  }
}

}  // namespace

AttributeSet::~AttributeSet() = default;

const AttributeSet::Member* AttributeSet::find(uint16_t key) const {
  for (const Member& m : m_Members)
    if (m.key == key) return &m;
  return nullptr;
}

uint32_t AttributeSet::integer(uint16_t key) const {
  const Member* m = find(key);
  return m != nullptr && !m->isText ? m->value : 0;
}

const std::string& AttributeSet::text(uint16_t key) const {
  const Member* m = find(key);
  return m != nullptr && m->isText ? m->textValue : kEmpty;
}

bool AttributeSet::has(uint16_t key) const { return find(key) != nullptr; }

AttributeSet::Member& AttributeSet::add(uint16_t key, const char* label, bool isText) {
  // A member read twice (the iSCSI set reads 528 twice) stays one member.
  for (Member& m : m_Members)
    if (m.key == key && std::string_view(m.label) == label) return m;
  m_Members.push_back(Member{key, label, isText, 0, {}});
  return m_Members.back();
}

void AttributeSet::setText(NRV_ATTRIBUTE key, std::string value) {
  Member& m = add(key, moduleLabel(key), true);
  m.isText = true;
  m.textValue = std::move(value);
}

void AttributeSet::setInteger(NRV_ATTRIBUTE key, uint32_t value) {
  Member& m = add(key, moduleLabel(key), false);
  m.isText = false;
  m.value = value;
}

void AttributeSet::readFields(void* blob, Scope scope, const std::vector<Field>& fields) {
  for (const Field& f : fields) {
    HBA_UINT16 length = 0;
    HBA_UINT32 status = RM_STATUS_ERROR;
    const void* value = RM_GetAttributeValue(blob, f.number, &length, &status);
    const bool found = value != nullptr && status == RM_STATUS_SUCCESS;
    const int st = static_cast<int>(status);
    switch (f.type) {
      case Type::kInteger:
      case Type::kServiceType: {
        Member& m = add(f.number, f.label, false);
        if (!found) {
          if (scope == Scope::kPort)
            NRV_DATA_LOG(NRV_DBG, "ERROR: RM_GetPortAttributes HA_%s call failed (%d)", f.label, st);
          else
            NRV_DATA_LOG(NRV_DBG, "ERROR: RM_GetHBAAttributeValue HA_%s call failed (%d)", f.label, st);
          break;
        }
        uint32_t v = 0;
        memcpy(&v, value, length < sizeof v ? length : sizeof v);
        m.value = v;
        NRV_DATA_LOG(NRV_DBG, "%s: [ %d ]", f.label, static_cast<int>(v));
        if (f.type == Type::kServiceType)
          NRV_DATA_LOG(NRV_DBG, "PA_PORT_SERVICE_TYPE: [ %d ]", static_cast<int>(v));
        break;
      }
      case Type::kText:
      case Type::kMac: {
        Member& m = add(f.number, f.label, true);
        if (!found || (f.type == Type::kMac && length < 6)) {
          NRV_DATA_LOG(NRV_DBG, "ERROR: %s: RM_GetHBAAttributes call failed (%d)", f.label, st);
          break;
        }
        m.textValue = f.type == Type::kMac
                          ? hexBytes(static_cast<const uint8_t*>(value), 6, "%02x", ":")
                          : boundedText(value, length);
        NRV_DATA_LOG(NRV_DBG, "%s : [ %s ]", f.label, m.textValue.c_str());
        break;
      }
      case Type::kWwn: {
        Member& m = add(f.number, f.label, true);
        if (!found || length < 8) {
          NRV_DATA_LOG(NRV_DBG, "ERROR: RM_GetAttributeValue call failed (%d)", st);
          break;
        }
        m.textValue = hexBytes(static_cast<const uint8_t*>(value), 8, "%02X", "");
        NRV_DATA_LOG(NRV_DBG, "%s : [ %s ]", f.label, m.textValue.c_str());
        break;
      }
      case Type::kFabric: {
        // Both members exist (empty) even when the record cannot be read.
        add(f.number, f.label, true);
        add(NRV_ATTR_FABRIC_FLAGS, moduleLabel(NRV_ATTR_FABRIC_FLAGS), true);
        if (!found || length < sizeof(RM_FABRIC_RECORD)) {
          NRV_DATA_LOG(NRV_DBG, "ERROR: RM_GetAttributeValue call failed (%d)", st);
          break;
        }
        RM_FABRIC_RECORD fabric;
        memcpy(&fabric, value, sizeof fabric);
        char word[9];
        snprintf(word, sizeof word, "%08x", fabric.flags);
        Member& name = add(f.number, f.label, true);
        name.textValue = hexBytes(fabric.fabricName, 8, "%02x", ":");
        NRV_DATA_LOG(NRV_DBG, "_FabricName: [ %s ]", name.textValue.c_str());
        Member& flags = add(NRV_ATTR_FABRIC_FLAGS, moduleLabel(NRV_ATTR_FABRIC_FLAGS), true);
        flags.textValue = word;
        NRV_DATA_LOG(NRV_DBG, "_nFlags: [ %s ]", flags.textValue.c_str());
        break;
      }
    }
  }
}

}  // namespace cimple
