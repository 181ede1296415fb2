#include "framework/CMPI_Data.h"

#include <strings.h>

#include <cerrno>
#include <climits>
#include <cstdlib>

#include "framework/Converter.h"
#include "framework/Trace_File.h"
#include "framework/Type_Visit.h"

namespace cimple {

namespace {

// The CMPI type of each scalar Value type (0..14).
const CMPIType kCmpiType[15] = {CMPI_boolean, CMPI_uint8,  CMPI_sint8,  CMPI_uint16, CMPI_sint16,
                                CMPI_uint32,  CMPI_sint32, CMPI_uint64, CMPI_sint64, CMPI_real32,
                                CMPI_real64,  CMPI_char16, CMPI_string, CMPI_dateTime, CMPI_ref};

CMPIType cmpi_type_of(int type) {
  if (type < 0) return CMPI_null;
  const int element = type & ~Value::ARRAY;
  if (element > Value::INSTANCE) return CMPI_null;
  return static_cast<CMPIType>(kCmpiType[element] | ((type & Value::ARRAY) ? CMPI_ARRAY : 0));
}

// The Value type a CMPI type stands for, for messages.
int value_type_of(CMPIType type) {
  const int array = (type & CMPI_ARRAY) ? Value::ARRAY : 0;
  const CMPIType element = static_cast<CMPIType>(type & ~CMPI_ARRAY);
  if (element == CMPI_chars) return Value::STRING | array;
  if (element == CMPI_instance) return Value::INSTANCE | array;
  for (int code = 0; code <= Value::INSTANCE; ++code)
    if (kCmpiType[code] == element) return code | array;
  return -2;  // "unknown"
}

// Calls f(Tag<T>{}) for the element C++ type of scalar Value type `code`.
template <class F>
decltype(auto) visit_code(int code, F&& f) {
  if (code == Value::INSTANCE) return f(Tag<Instance*>{});
  return visit_type(static_cast<uint16_t>(code), std::forward<F>(f));
}

template <class T>
T from_union(const CMPIValue& v) {
  if constexpr (std::is_same_v<T, boolean>) return v.boolean != 0;
  else if constexpr (std::is_same_v<T, uint8>) return v.uint8;
  else if constexpr (std::is_same_v<T, sint8>) return v.sint8;
  else if constexpr (std::is_same_v<T, uint16>) return v.uint16;
  else if constexpr (std::is_same_v<T, sint16>) return v.sint16;
  else if constexpr (std::is_same_v<T, uint32>) return v.uint32;
  else if constexpr (std::is_same_v<T, sint32>) return v.sint32;
  else if constexpr (std::is_same_v<T, uint64>) return v.uint64;
  else if constexpr (std::is_same_v<T, sint64>) return v.sint64;
  else if constexpr (std::is_same_v<T, real32>) return v.real32;
  else if constexpr (std::is_same_v<T, real64>) return v.real64;
  else return char16{v.char16};
}

template <class T>
constexpr int scalar_code() {
  if constexpr (std::is_same_v<T, boolean>) return Value::BOOLEAN;
  else if constexpr (std::is_same_v<T, uint8>) return Value::UINT8;
  else if constexpr (std::is_same_v<T, sint8>) return Value::SINT8;
  else if constexpr (std::is_same_v<T, uint16>) return Value::UINT16;
  else if constexpr (std::is_same_v<T, sint16>) return Value::SINT16;
  else if constexpr (std::is_same_v<T, uint32>) return Value::UINT32;
  else if constexpr (std::is_same_v<T, sint32>) return Value::SINT32;
  else if constexpr (std::is_same_v<T, uint64>) return Value::UINT64;
  else if constexpr (std::is_same_v<T, sint64>) return Value::SINT64;
  else if constexpr (std::is_same_v<T, real32>) return Value::REAL32;
  else if constexpr (std::is_same_v<T, real64>) return Value::REAL64;
  else return Value::CHAR16;
}

template <class T>
void to_union(CMPIValue& v, const T& x) {
  if constexpr (std::is_same_v<T, boolean>) v.boolean = x ? 1 : 0;
  else if constexpr (std::is_same_v<T, uint8>) v.uint8 = x;
  else if constexpr (std::is_same_v<T, sint8>) v.sint8 = x;
  else if constexpr (std::is_same_v<T, uint16>) v.uint16 = x;
  else if constexpr (std::is_same_v<T, sint16>) v.sint16 = x;
  else if constexpr (std::is_same_v<T, uint32>) v.uint32 = x;
  else if constexpr (std::is_same_v<T, sint32>) v.sint32 = x;
  else if constexpr (std::is_same_v<T, uint64>) v.uint64 = x;
  else if constexpr (std::is_same_v<T, sint64>) v.sint64 = x;
  else if constexpr (std::is_same_v<T, real32>) v.real32 = x;
  else if constexpr (std::is_same_v<T, real64>) v.real64 = x;
  else v.char16 = x.code;
}

const Meta_Class* declared_class(const Meta_Feature* feature) {
  if (feature && (feature->flags & FLAG_REFERENCE)) return reinterpret_cast<const Meta_Reference*>(feature)->meta_class;
  return nullptr;
}

// The class an object path names, looked up in the repository; the
// declared class when the repository does not know it.
const Meta_Class* class_of_path(const CMPI_Env& env, const CMPIObjectPath* path, const Meta_Feature* feature) {
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPIString* name = CMGetClassName(path, &rc);
  const char* chars = (rc.rc == CMPI_RC_OK && name) ? CMGetCharsPtr(name, nullptr) : nullptr;
  const Meta_Class* mc = (chars && env.repository) ? find_meta_class(env.repository, chars) : nullptr;
  return mc ? mc : declared_class(feature);
}

}  // namespace

int cmpi_text(const CMPIData& data, String& out) {
  if (data.type == CMPI_chars) {
    if (data.value.chars == nullptr) {
      CIMPLE_WARN("ignored null CMPI string");
      return -1;
    }
    out = String(data.value.chars);
    return 0;
  }
  if (data.value.string == nullptr) {
    CIMPLE_WARN("ignored null CMPI string");
    return -1;
  }
  const char* chars = CMGetCharsPtr(data.value.string, nullptr);
  if (chars == nullptr) {
    CIMPLE_WARN("CMGetCharsPtr() failed");
    return -1;
  }
  out = String(chars);
  return 0;
}

namespace {

int datetime_from_cmpi(const CMPIData& data, Datetime& out) {
  if (data.value.dateTime == nullptr) {
    CIMPLE_WARN("conversion error");
    return -1;
  }
  // Owned by the broker (possibly part of the datetime): not released here.
  CMPIString* text = CMGetStringFormat(data.value.dateTime, nullptr);
  const char* chars = text ? CMGetCharsPtr(text, nullptr) : nullptr;
  if (chars == nullptr) {
    CIMPLE_WARN("CMGetStringFormat() failed");
    return -1;
  }
  if (!out.set(chars)) {
    CIMPLE_WARN("conversion error");
    return -1;
  }
  return 0;
}

int instance_from_cmpi(const CMPI_Env& env, const CMPIData& data, const Meta_Feature* feature, Instance*& out) {
  out = nullptr;
  CMPIrc rc = CMPI_RC_ERR_FAILED;
  if (data.type == CMPI_ref && data.value.ref) {
    const Meta_Class* mc = class_of_path(env, data.value.ref, feature);
    if (mc) rc = make_cimple_reference(env, mc, data.value.ref, out);
  } else if (data.type == CMPI_instance && data.value.inst) {
    // The instance's own path belongs to the broker: not released here.
    const CMPIObjectPath* path = CMGetObjectPath(data.value.inst, nullptr);
    const Meta_Class* mc = path ? class_of_path(env, path, feature) : declared_class(feature);
    if (mc) rc = make_cimple_instance(env, mc, path, data.value.inst, out);
  }
  if (rc != CMPI_RC_OK || out == nullptr) {
    CIMPLE_WARN("failed to create CIMPLE instance");
    return -1;
  }
  return 0;
}

bool type_accepted(int code, CMPIType actual) {
  if (actual == kCmpiType[code]) return true;
  return (code == Value::STRING && actual == CMPI_chars) || (code == Value::INSTANCE && actual == CMPI_instance);
}

// One scalar (or array element) of scalar type `code` into an element value.
template <class T>
int element_from_cmpi(const CMPI_Env& env, const CMPIData& data, const Meta_Feature* feature, T& out) {
  if constexpr (std::is_same_v<T, String>) return cmpi_text(data, out);
  else if constexpr (std::is_same_v<T, Datetime>) return datetime_from_cmpi(data, out);
  else if constexpr (std::is_same_v<T, Instance*>) return instance_from_cmpi(env, data, feature, out);
  else {
    out = from_union<T>(data.value);
    return 0;
  }
}

int array_from_cmpi(const CMPI_Env& env, const char* name, const CMPIData& data, int code,
                    const Meta_Feature* feature, Value& value) {
  const CMPIArray* array = data.value.array;
  if (array == nullptr) {
    CIMPLE_WARN("conversion error");
    return -1;
  }
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  const CMPICount size = CMGetArraySize(array, &rc);
  if (rc.rc != CMPI_RC_OK) {
    CIMPLE_WARN("conversion error");
    return -1;
  }
  return visit_code(code, [&](auto tag) -> int {
    using T = typename decltype(tag)::type;
    Array<T> elements;
    for (CMPICount i = 0; i < size; ++i) {
      CMPIStatus element_rc{CMPI_RC_OK, nullptr};
      CMPIData element = CMGetArrayElementAt(array, i, &element_rc);
      if (element_rc.rc != CMPI_RC_OK) {
        CIMPLE_WARN("bounds error");
        return -1;
      }
      const bool null_pointer = (element.type & CMPI_ENC) && element.value.inst == nullptr;
      if ((element.state & CMPI_nullValue) || null_pointer) {
        CIMPLE_WARN(code == Value::INSTANCE ? "encountered null instance element" : "encountered null array element");
        continue;
      }
      if (!type_accepted(code, element.type)) {
        CIMPLE_WARN("array element type mismatch");
        return -1;
      }
      T item{};
      if (element_from_cmpi(env, element, feature, item) != 0) {
        CIMPLE_WARN("cmpi_to_cimple_value() failed");
        return -1;
      }
      elements.append(item);
      if constexpr (std::is_same_v<T, Instance*>) unref(item);
    }
    value.set(elements);
    return 0;
  });
}

}  // namespace

int cmpi_to_value(const CMPI_Env& env, const char* name, const CMPIData& data, int type,
                  const Meta_Feature* feature, Value& value) {
  if (type == Value::NONE) {
    CIMPLE_WARN("missing type");
    return -1;
  }
  const CMPIType expected = cmpi_type_of(type);
  if (expected == CMPI_null) {
    CIMPLE_WARN("unknown type");
    return -1;
  }
  if (data.state & CMPI_nullValue) {
    value = Value::null_of(type);
    return 0;
  }
  const int code = type & ~Value::ARRAY;
  const bool array = (type & Value::ARRAY) != 0;
  const bool array_given = (data.type & CMPI_ARRAY) != 0;
  if (array != array_given || (!array && !type_accepted(code, data.type)) ||
      (array && !type_accepted(code, static_cast<CMPIType>(data.type & ~CMPI_ARRAY)))) {
    CIMPLE_WARN("type mismatch on %s: %s/%s", name, Value::type_name(type, false),
                Value::type_name(value_type_of(data.type), false));
    return -1;
  }
  if (array) return array_from_cmpi(env, name, data, code, feature, value);
  return visit_code(code, [&](auto tag) -> int {
    using T = typename decltype(tag)::type;
    T item{};
    if (element_from_cmpi(env, data, feature, item) != 0) return -1;
    if constexpr (std::is_same_v<T, Instance*>) {
      value.set_instance(item);
      unref(item);
    } else {
      value.set(item);
    }
    return 0;
  });
}

namespace {

// An instance as the object path that names it, or as a whole CMPI
// instance when it is embedded.
int instance_to_cmpi(const CMPI_Env& env, const Instance* item, bool embedded, CMPI_Out_Value& out) {
  if (item == nullptr) return -1;
  const char* ns = item->__name_space.empty() ? env.name_space : item->__name_space.c_str();
  CMPI_Ptr<CMPIObjectPath> path;
  if (make_cmpi_object_path(env.broker, item, ns, path) != CMPI_RC_OK) return -1;
  if (!embedded) {
    out.value.ref = path.release();
    out.type = CMPI_ref;
    return 0;
  }
  CMPI_Ptr<CMPIInstance> instance;
  if (make_cmpi_instance(env.broker, item, ns, path.get(), nullptr, instance) != CMPI_RC_OK) return -1;
  out.value.inst = instance.release();
  out.type = CMPI_instance;
  return 0;
}

template <class T>
int element_to_cmpi(const CMPI_Env& env, const T& item, bool embedded, CMPI_Out_Value& out) {
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  if constexpr (std::is_same_v<T, String>) {
    out.value.string = CMNewString(env.broker, item.c_str(), &rc);
    out.type = CMPI_string;
    return out.value.string ? 0 : -1;
  } else if constexpr (std::is_same_v<T, Datetime>) {
    out.value.dateTime = CMNewDateTimeFromChars(env.broker, item.ascii().c_str(), &rc);
    out.type = CMPI_dateTime;
    return out.value.dateTime ? 0 : -1;
  } else if constexpr (std::is_same_v<T, Instance*>) {
    return instance_to_cmpi(env, item, embedded, out);
  } else {
    to_union(out.value, item);
    out.type = kCmpiType[scalar_code<T>()];
    return 0;
  }
}

}  // namespace

int value_to_cmpi(const CMPI_Env& env, const Value& value, CMPI_Out_Value& out, uint32_t flags) {
  out.reset();
  if (value.is_null() || value.type() == Value::NONE) {
    CIMPLE_WARN("unexpected type");
    return -1;
  }
  const int code = value.element_type();
  if (code < 0 || code > Value::INSTANCE) {
    CIMPLE_WARN("unexpected type");
    return -1;
  }
  const bool embedded = (flags & (FLAG_EMBEDDED_INSTANCE | FLAG_EMBEDDED_OBJECT)) != 0;
  const CMPIType element_type = code == Value::INSTANCE && embedded ? CMPIType(CMPI_instance) : kCmpiType[code];
  return visit_code(code, [&](auto tag) -> int {
    using T = typename decltype(tag)::type;
    if (!value.is_array()) {
      if constexpr (std::is_same_v<T, Instance*>) {
        return element_to_cmpi<Instance*>(env, value.instance(), embedded, out);
      } else {
        return element_to_cmpi(env, *value.get<T>(), embedded, out);
      }
    }
    const Array<T>& elements = *value.get<Array<T>>();
    CMPIStatus rc{CMPI_RC_OK, nullptr};
    CMPIArray* array = CMNewArray(env.broker, static_cast<CMPICount>(elements.size()), element_type, &rc);
    if (array == nullptr) {
      CIMPLE_WARN("conversion error");
      return -1;
    }
    out.value.array = array;
    out.type = static_cast<CMPIType>(element_type | CMPI_ARRAY);
    for (size_t i = 0; i < elements.size(); ++i) {
      if constexpr (std::is_same_v<T, Instance*>) {
        if (elements[i] == nullptr) continue;  // stays a null element
      }
      if constexpr (std::is_same_v<T, String>) {
        // As CMPI_chars (the value pointer is the C string, as CIMOMs read it) the CIMOM
        // makes the element itself: no CMPIString to create, hand over and track.
        const auto* chars = reinterpret_cast<const CMPIValue*>(elements[i].c_str());
        if (CMSetArrayElementAt(array, static_cast<CMPICount>(i), chars, CMPI_chars).rc != CMPI_RC_OK)
          CIMPLE_WARN("CMSetArrayElementAt() failed");
        continue;
      }
      CMPI_Out_Value element;
      if (element_to_cmpi(env, elements[i], embedded, element) != 0) {
        CIMPLE_WARN("element conversion failed");
        continue;
      }
      CMPIStatus set_rc = CMSetArrayElementAt(array, static_cast<CMPICount>(i), &element.value, element.type);
      if (set_rc.rc != CMPI_RC_OK) CIMPLE_WARN("CMSetArrayElementAt() failed");
      else element.hand_over();  // the array may hold the element itself, not a copy
    }
    return 0;
  });
}

bool castable_from_string(int type) { return type >= Value::BOOLEAN && type <= Value::SINT32; }

// Clients that know only strings send numeric and boolean parameters as
// text; read them as the parameter's own CMPI type.  The whole text must be
// a number that fits the type: a silent 0 for "abc" would reach the hardware.
int cast_cmpi_string_to_scalar(const char* text, int type, CMPIData& data) {
  if (text == nullptr || !castable_from_string(type)) return -1;
  data.state = CMPI_goodValue;
  if (type == Value::BOOLEAN) {
    if (strncasecmp(text, "true", 4) == 0) data.value.boolean = 1;
    else if (strncasecmp(text, "false", 5) == 0) data.value.boolean = 0;
    else return -1;
    data.type = CMPI_boolean;
    return 0;
  }
  static const long kMin[] = {0, 0, SCHAR_MIN, 0, SHRT_MIN, 0, INT_MIN};
  static const long kMax[] = {1, UCHAR_MAX, SCHAR_MAX, USHRT_MAX, SHRT_MAX, static_cast<long>(UINT_MAX), INT_MAX};
  errno = 0;
  char* end = nullptr;
  long number = std::strtol(text, &end, 10);
  while (end && *end == ' ') ++end;
  if (end == text || (end && *end != '\0') || errno == ERANGE || number < kMin[type] || number > kMax[type])
    return -1;
  data.type = kCmpiType[type];
  switch (type) {
    case Value::UINT8: data.value.uint8 = static_cast<CMPIUint8>(number); break;
    case Value::SINT8: data.value.sint8 = static_cast<CMPISint8>(number); break;
    case Value::UINT16: data.value.uint16 = static_cast<CMPIUint16>(number); break;
    case Value::SINT16: data.value.sint16 = static_cast<CMPISint16>(number); break;
    case Value::UINT32: data.value.uint32 = static_cast<CMPIUint32>(number); break;
    default: data.value.sint32 = static_cast<CMPISint32>(number); break;
  }
  return 0;
}

}  // namespace cimple
