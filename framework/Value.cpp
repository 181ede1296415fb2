#include "framework/Value.h"

#include "framework/Trace_File.h"
#include "framework/Type_Visit.h"

namespace cimple {

namespace {

const char* const kUpperNames[] = {"BOOLEAN", "UINT8",  "SINT8",  "UINT16", "SINT16",   "UINT32",  "SINT32",
                                   "UINT64",  "SINT64", "REAL32", "REAL64", "CHAR16",   "STRING",  "DATETIME",
                                   "INSTANCE"};
const char* const kUpperArrayNames[] = {
    "BOOLEAN_ARRAY", "UINT8_ARRAY",  "SINT8_ARRAY",  "UINT16_ARRAY", "SINT16_ARRAY",   "UINT32_ARRAY",
    "SINT32_ARRAY",  "UINT64_ARRAY", "SINT64_ARRAY", "REAL32_ARRAY", "REAL64_ARRAY",   "CHAR16_ARRAY",
    "STRING_ARRAY",  "DATETIME_ARRAY", "INSTANCE_ARRAY"};
const char* const kLowerArrayNames[] = {
    "boolean_array", "uint8_array",  "sint8_array",  "uint16_array", "sint16_array",   "uint32_array",
    "sint32_array",  "uint64_array", "sint64_array", "real32_array", "real64_array",   "char16_array",
    "string_array",  "datetime_array", "instance_array"};

const char* class_name(const Instance* instance) { return instance->meta_class->name; }

}  // namespace

void Value::set_instance(Instance* instance) {
  if (instance == nullptr) {
    *this = null_of(INSTANCE);
    return;
  }
  data_ = Instance_Ref(instance);
  type_ = INSTANCE;
}

const char* Value::type_name(int type, bool upper) {
  if (type == NONE) return upper ? "NONE" : "none";
  if (type >= 0 && type <= INSTANCE) return upper ? kUpperNames[type] : type_name_with_instance[type];
  if (type >= ARRAY && type <= INSTANCE_ARRAY) return (upper ? kUpperArrayNames : kLowerArrayNames)[type - ARRAY];
  return upper ? "UNKNOWN" : "unknown";
}

int Value::feature_type(const Meta_Feature* feature) {
  if (feature == nullptr) return NONE;
  if (feature->flags & FLAG_PROPERTY) {
    auto* mp = reinterpret_cast<const Meta_Property*>(feature);
    if (mp->type > DATETIME) return NONE;
    return cimple::is_array(mp) ? ARRAY + mp->type : mp->type;
  }
  if (feature->flags & FLAG_REFERENCE)
    return is_reference_array(reinterpret_cast<const Meta_Reference*>(feature)) ? INSTANCE_ARRAY : INSTANCE;
  return NONE;
}

int Value::get_feature(const Instance* instance, const Meta_Feature* feature) {
  const int type = feature_type(feature);
  if (instance == nullptr || type == NONE) return -1;
  *this = null_of(type);
  if (feature->flags & FLAG_REFERENCE) {
    auto* mr = reinterpret_cast<const Meta_Reference*>(feature);
    if (is_reference_array(mr))
      set(*static_cast<const Array<Instance*>*>(slot(instance, mr->offset)));
    else if (Instance* target = reference_of(instance, mr))
      set_instance(target);
    return 0;
  }
  auto* mp = reinterpret_cast<const Meta_Property*>(feature);
  if (*null_flag(instance, mp)) return 0;
  visit_type(mp->type, [&](auto tag) {
    using T = typename decltype(tag)::type;
    if (cimple::is_array(mp))
      set(*static_cast<const Array<T>*>(slot(instance, mp->offset)));
    else
      set(*static_cast<const T*>(slot(instance, mp->offset)));
  });
  return 0;
}

int Value::set_feature(Instance* instance, const Meta_Feature* feature) const {
  if (instance == nullptr) {
    CIMPLE_WARN("null instance argument");
    return -1;
  }
  if (feature == nullptr) return -1;
  if (feature_type(feature) != type_) {
    CIMPLE_WARN("type mismatch: %s.%s", class_name(instance), feature->name);
    return -1;
  }
  if (feature->flags & FLAG_REFERENCE) {
    auto* mr = reinterpret_cast<const Meta_Reference*>(feature);
    if (is_reference_array(mr)) {
      auto* array = static_cast<Array<Instance*>*>(slot(instance, mr->offset));
      const Array<Instance*>* value = get<Array<Instance*>>();
      *array = value ? *value : Array<Instance*>();
      return 0;
    }
    Instance* target = this->instance();
    // An embedded object of no declared class holds an instance of any class.
    const bool any_class = mr->meta_class == &Instance_meta_class;
    if (target && !any_class && !is_subclass(mr->meta_class, target->meta_class)) {
      CIMPLE_WARN("failed to assign instance of %s to %s.%s", class_name(target), class_name(instance), mr->name);
      return -1;
    }
    ref(target);
    unref(reference_slot(instance, mr));
    reference_slot(instance, mr) = target;
    return 0;
  }
  auto* mp = reinterpret_cast<const Meta_Property*>(feature);
  if (is_null()) {
    *null_flag(instance, mp) = 1;
    return 0;
  }
  visit_type(mp->type, [&](auto tag) {
    using T = typename decltype(tag)::type;
    if (cimple::is_array(mp))
      *static_cast<Array<T>*>(slot(instance, mp->offset)) = *get<Array<T>>();
    else
      *static_cast<T*>(slot(instance, mp->offset)) = *get<T>();
  });
  *null_flag(instance, mp) = 0;
  return 0;
}

}  // namespace cimple
