#include "framework/CMPI_Containers.h"

#include <cstring>

#include "framework/Trace_File.h"

namespace cimple {

// --- containers -----------------------------------------------------------------

int CMPI_Container::take_name(CMPIString* name, const CMPIStatus& rc, std::string& out) {
  if (rc.rc != CMPI_RC_OK || name == nullptr) return -1;
  const char* chars = CMGetCharsPtr(name, nullptr);
  if (chars == nullptr) return -1;
  out = chars;
  return 0;
}

namespace {

// A scalar string value as CMPI_chars, whose value pointer is the C string
// itself (as CIMOMs read it): setting a property or key then makes no
// CMPIString to be created and released around it.  Null for other values.
const char* scalar_chars(const Value& value) {
  if (value.is_array()) return nullptr;
  const String* s = value.get<String>();
  return s ? s->c_str() : nullptr;
}

size_t count_or_zero(CMPICount count, const CMPIStatus& rc) { return rc.rc == CMPI_RC_OK ? count : 0; }

bool is_empty_instance_array(const Value& value) {
  const Array<Instance*>* elements = value.get<Array<Instance*>>();
  return elements != nullptr && elements->size() == 0;
}

}  // namespace

size_t CMPIObjectPath_Container::get_size() {
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  return count_or_zero(CMGetKeyCount(path_, &rc), rc);
}

int CMPIObjectPath_Container::get_name(size_t pos, std::string& name) {
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPIString* key = nullptr;
  CMGetKeyAt(path_, static_cast<CMPICount>(pos), &key, &rc);
  return take_name(key, rc, name);
}

int CMPIObjectPath_Container::get_value(size_t pos, int type, const Meta_Feature* feature, Value& value) {
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPIString* key = nullptr;
  CMPIData data = CMGetKeyAt(path_, static_cast<CMPICount>(pos), &key, &rc);
  if (rc.rc != CMPI_RC_OK) {
    CIMPLE_WARN("bounds error");
    return -1;
  }
  return cmpi_to_value(env_, feature ? feature->name : "", data, type, feature, value);
}

int CMPIObjectPath_Container::set_chars(const char* name, const char* chars, uint32_t) {
  if (CMAddKey(path_, name, reinterpret_cast<const CMPIValue*>(chars), CMPI_chars).rc == CMPI_RC_OK) return 0;
  CIMPLE_WARN("CMAddKey() failed");
  return -1;
}

int CMPIObjectPath_Container::set_value(const char* name, const Value& value, uint32_t flags) {
  if (const char* chars = scalar_chars(value)) return set_chars(name, chars, flags);
  CMPI_Out_Value out;
  if (value_to_cmpi(env_, value, out, flags) != 0) {
    CIMPLE_WARN("_to_cmpi_data() failed: feature=%s", name);
    return -1;
  }
  if (CMAddKey(path_, name, &out.value, out.type).rc != CMPI_RC_OK) {
    CIMPLE_WARN("CMAddKey() failed");
    return -1;
  }
  return 0;
}

size_t CMPIInstance_Container::get_size() {
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  return count_or_zero(CMGetPropertyCount(instance_, &rc), rc);
}

int CMPIInstance_Container::get_name(size_t pos, std::string& name) {
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPIString* property = nullptr;
  CMGetPropertyAt(instance_, static_cast<CMPICount>(pos), &property, &rc);
  return take_name(property, rc, name);
}

int CMPIInstance_Container::get_value(size_t pos, int type, const Meta_Feature* feature, Value& value) {
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPIString* property = nullptr;
  CMPIData data = CMGetPropertyAt(instance_, static_cast<CMPICount>(pos), &property, &rc);
  if (rc.rc != CMPI_RC_OK) {
    CIMPLE_WARN("bounds error");
    return -1;
  }
  return cmpi_to_value(env_, feature ? feature->name : "", data, type, feature, value);
}

int CMPIInstance_Container::set_chars(const char* name, const char* chars, uint32_t) {
  if (CMSetProperty(instance_, name, reinterpret_cast<const CMPIValue*>(chars), CMPI_chars).rc == CMPI_RC_OK)
    return 0;
  CIMPLE_WARN("CMSetProperty() failed: %s", name);
  return -1;
}

int CMPIInstance_Container::set_value(const char* name, const Value& value, uint32_t flags) {
  // An empty embedded array is how an instance says "none" (its slot has no
  // null flag), so the property stays unset, that is null.  SFCB refuses
  // every array value of an EmbeddedObject property with
  // CMPI_RC_ERR_TYPE_MISMATCH, and the explicit null it accepts goes out in a
  // form Debian's wbemcli cannot parse; an unset property goes out empty.
  if ((flags & (FLAG_EMBEDDED_INSTANCE | FLAG_EMBEDDED_OBJECT)) && is_empty_instance_array(value)) return 0;
  if (const char* chars = scalar_chars(value)) return set_chars(name, chars, flags);
  CMPI_Out_Value out;
  if (value_to_cmpi(env_, value, out, flags) != 0) {
    CIMPLE_WARN("_to_cmpi_data() failed: feature=%s", name);
    return -1;
  }
  if (CMSetProperty(instance_, name, &out.value, out.type).rc != CMPI_RC_OK) {
    CIMPLE_WARN("CMSetProperty() failed: %s", name);
    return -1;
  }
  return 0;
}

size_t CMPIArgs_Container::get_size() {
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  return count_or_zero(CMGetArgCount(args_, &rc), rc);
}

int CMPIArgs_Container::get_name(size_t pos, std::string& name) {
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPIString* arg = nullptr;
  CMGetArgAt(args_, static_cast<CMPICount>(pos), &arg, &rc);
  return take_name(arg, rc, name);
}


int CMPIArgs_Container::get_value(size_t pos, int type, const Meta_Feature* feature, Value& value) {
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPIString* arg = nullptr;
  CMPIData data = CMGetArgAt(args_, static_cast<CMPICount>(pos), &arg, &rc);
  if (rc.rc != CMPI_RC_OK) {
    CIMPLE_WARN("bounds error");
    return -1;
  }
  const char* name = feature ? feature->name : "";
  const bool text = (data.type == CMPI_string || data.type == CMPI_chars) && !(data.state & CMPI_nullValue);
  if (text && type != Value::STRING) {
    if (!castable_from_string(type)) {
      CIMPLE_WARN("Default case - unsupported type");
      CIMPLE_WARN("cast_cmpi_string_to_scalar(): Not supported");
      return -1;
    }
    String chars;
    if (cmpi_text(data, chars) != 0) return -1;
    CIMPLE_WARN("converting string to registered parameter type");
    if (cast_cmpi_string_to_scalar(chars.c_str(), type, data) != 0) {
      CIMPLE_WARN("conversion error");
      return -1;
    }
  }
  return cmpi_to_value(env_, name, data, type, feature, value);
}

int CMPIArgs_Container::set_value(const char* name, const Value& value, uint32_t flags) {
  CMPI_Out_Value out;
  if (value_to_cmpi(env_, value, out, flags) != 0) {
    CIMPLE_WARN("_to_cmpi_data() failed: feature=%s", name);
    return -1;
  }
  if (CMAddArg(args_, name, &out.value, out.type).rc != CMPI_RC_OK) {
    CIMPLE_WARN("CMAddArg() failed");
    return -1;
  }
  if (std::strcmp(name, "return_value") == 0) {
    return_value_ = std::move(out);
    has_return_value_ = true;
  }
  return 0;
}

}  // namespace cimple
