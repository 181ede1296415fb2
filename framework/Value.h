// cimple::Value: one typed value of any CIM type (scalar or array, including
// instances and instance arrays), or a typed null, used wherever a value
// travels between an instance slot and something that is not an instance
// (the CMPI conversions).
//
// Ownership: a Value holding an instance holds one reference on it; arrays,
// strings and datetimes are shared copy-on-write handles.
#pragma once

#include <cstdint>
#include <utility>
#include <variant>

#include "framework/Instance.h"

namespace cimple {

// A counted reference to an instance (null allowed).
class Instance_Ref {
 public:
  Instance_Ref() = default;
  explicit Instance_Ref(Instance* instance) : instance_(instance) { ref(instance_); }
  Instance_Ref(const Instance_Ref& other) : instance_(other.instance_) { ref(instance_); }
  Instance_Ref& operator=(const Instance_Ref& other) {
    ref(other.instance_);
    unref(instance_);
    instance_ = other.instance_;
    return *this;
  }
  ~Instance_Ref() { unref(instance_); }
  Instance* get() const { return instance_; }

 private:
  Instance* instance_ = nullptr;
};

class Value {
 public:
  enum Type : int {
    NONE = -1,
    BOOLEAN = 0, UINT8, SINT8, UINT16, SINT16, UINT32, SINT32, UINT64, SINT64,
    REAL32, REAL64, CHAR16, STRING, DATETIME, INSTANCE,
    ARRAY = 128,
    BOOLEAN_ARRAY = 128, UINT8_ARRAY, SINT8_ARRAY, UINT16_ARRAY, SINT16_ARRAY, UINT32_ARRAY, SINT32_ARRAY,
    UINT64_ARRAY, SINT64_ARRAY, REAL32_ARRAY, REAL64_ARRAY, CHAR16_ARRAY, STRING_ARRAY, DATETIME_ARRAY,
    INSTANCE_ARRAY,
  };

  Value() = default;

  // A null value of `type`.
  static Value null_of(int type) {
    Value v;
    v.type_ = type;
    return v;
  }

  // T is one of the scalar C++ types of the object model, Array<T> of
  // them, or Array<Instance*>; instances go through set_instance().
  template <class T>
  void set(const T& value);
  void set_instance(Instance* instance);  // takes a new reference; null makes a null INSTANCE

  // The held value when the type matches and the value is not null.
  template <class T>
  const T* get() const {
    return std::get_if<T>(&data_);
  }
  Instance* instance() const {
    const Instance_Ref* r = std::get_if<Instance_Ref>(&data_);
    return r ? r->get() : nullptr;
  }

  int type() const { return type_; }
  bool is_null() const { return data_.index() == 0; }
  bool is_array() const { return type_ >= 0 && (type_ & ARRAY) != 0; }
  int element_type() const { return type_ < 0 ? NONE : (type_ & ~ARRAY); }

  // "NONE", "BOOLEAN" ... "INSTANCE_ARRAY" (upper) or "none", "boolean" ...
  // "instance_array" (lower); "UNKNOWN"/"unknown" outside the table.
  static const char* type_name(int type, bool upper = true);
  // The Value type of a property or reference; NONE for a method.
  static int feature_type(const Meta_Feature* feature);

  // Reads a feature of `instance` into this value (null when the slot is).
  int get_feature(const Instance* instance, const Meta_Feature* feature);
  // Stores this value in a feature of `instance`; checks the type and, for
  // references, the class of the instance.  0 or -1 (logged).
  int set_feature(Instance* instance, const Meta_Feature* feature) const;

 private:
  using Data = std::variant<std::monostate, boolean, uint8, sint8, uint16, sint16, uint32, sint32, uint64, sint64,
                            real32, real64, char16, String, Datetime, Instance_Ref, Array<boolean>, Array<uint8>,
                            Array<sint8>, Array<uint16>, Array<sint16>, Array<uint32>, Array<sint32>,
                            Array<uint64>, Array<sint64>, Array<real32>, Array<real64>, Array<char16>,
                            Array<String>, Array<Datetime>, Array<Instance*>>;

  int type_ = NONE;
  Data data_;
};

template <class T>
void Value::set(const T& value) {
  data_.template emplace<T>(value);
  // Variant alternatives 1..15 are the scalar codes 0..14, 16..30 the arrays.
  const int index = static_cast<int>(data_.index());
  type_ = index <= 15 ? index - 1 : ARRAY + (index - 16);
}

}  // namespace cimple
