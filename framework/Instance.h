// cimple::Instance: the flat, reference-counted record of one CIM instance,
// laid out by its Meta_Class, and the operations every part of the module
// uses on it (create, clone, ref/unref, key_eq, null flags, copy, look-ups).
//
// Ownership: whoever holds a reference owns it; the last unref destroys the
// record and releases everything it holds, including referenced instances.
// Meta-data is static and outlives every instance.  A method-call record is an
// Instance whose meta_class is really a Meta_Method (same leading fields);
// only create/clone/unref/print and the slot helpers may be used on it.
#pragma once

#include <atomic>
#include <cstdint>
#include <memory>
#include <string>

#include "framework/Array.h"
#include "framework/Datetime.h"
#include "framework/Meta.h"
#include "framework/String.h"

namespace cimple {

using boolean = bool;
using uint8 = uint8_t;
using sint8 = int8_t;
using uint16 = uint16_t;
using sint16 = int16_t;
using uint32 = uint32_t;
using sint32 = int32_t;
using uint64 = uint64_t;
using sint64 = int64_t;
using real32 = float;
using real64 = double;

struct char16 {
  uint16_t code;
  friend bool operator==(char16 a, char16 b) { return a.code == b.code; }
};

inline constexpr uint32_t kInstanceMagic = 0xF00DFACE;

// One property slot: the value, then its null flag (1 = null).
template <class T>
struct Property {
  T value;
  uint8_t null;

  void set(const T& v) {
    value = v;
    null = 0;
  }
  void set_null() { null = 1; }
  bool is_null() const { return null != 0; }
};

// The instance header; features follow at the offsets their meta-data gives.
struct Instance {
  uint32_t magic;
  uint32_t refs;  // changed only atomically, through ref()/unref()
  const Meta_Class* meta_class;
  String __name_space;
};
static_assert(sizeof(Instance) == 24, "the instance header is 24 bytes");

// The root meta-class "Instance": no features, the size of the bare header.
extern const Meta_Class Instance_meta_class;

// --- life cycle ---------------------------------------------------------------

// A new instance of `mc` with reference count 1 (see the header comment of
// the .cpp for what with_defaults does).  Never null.
Instance* create(const Meta_Class* mc, bool with_defaults = false);
// A method-call record of `mm`, every parameter present with a zero value.
Instance* create(const Meta_Method* mm);
// A deep copy with reference count 1; referenced instances are cloned too.
Instance* clone(const Instance* instance);
// Start loading an instance's own memory, or the text of its scalar strings,
// into the cache: a loop over a large catalogue, whose instances lie far
// apart, asks for those a few steps ahead of the one it works on.
// `bytes` is how much of the instance to load (its class's size, say).
void prefetch_instance(const Instance* instance, size_t bytes);
void prefetch_strings(const Instance* instance);
void ref(const Instance* instance);
void unref(Instance* instance);  // accepts null
// Releases one reference and destroys at zero; the usual way to drop an
// instance you own.
inline void destroy(Instance* instance) { unref(instance); }

// Holds one reference to an instance.
struct Instance_Unref {
  void operator()(Instance* instance) const { unref(instance); }
};
using Instance_Ptr = std::unique_ptr<Instance, Instance_Unref>;

// The instance to change in place: the held one when this is its only
// reference, else a clone that `owned` now holds instead, leaving the shared
// original to its other readers.
Instance* writable(Instance_Ptr& owned);

// --- comparison and editing ---------------------------------------------------

// True when every key feature of `a` equals the same-named key feature of `b`.
bool key_eq(const Instance* a, const Instance* b);
// Sets the null flag of key and/or non-key properties to `value` (0 or 1).
void set_null_flags(Instance* instance, bool include_keys, bool include_non_keys, uint8_t value);
// Gives every null single reference a new, empty instance of its class.
void create_refs(Instance* instance);
// Copies values and null flags from `src` to `dest` (same meta-class only):
// all features, or the keys only; with a model, only properties non-null in it.
void copy(Instance* dest, const Instance* src, bool keys_only = false, const Instance* model = nullptr);

// --- meta-data look-ups ---------------------------------------------------------

enum Feature_Kind : uint32_t { KIND_PROPERTY = 1, KIND_REFERENCE = 2, KIND_METHOD = 4, KIND_ANY = 7 };

// Case-insensitive look-up of a feature among those whose flags meet `kinds`.
const Meta_Feature* find_feature(const Meta_Class* mc, const char* name, uint32_t kinds = KIND_ANY);
const Meta_Property* find_property(const Meta_Class* mc, const char* name);
const Meta_Reference* find_reference(const Meta_Class* mc, const char* name);
const Meta_Method* find_method(const Meta_Class* mc, const char* name);
// True when `ancestor` is `mc` or one of its super-classes.
bool is_subclass(const Meta_Class* ancestor, const Meta_Class* mc);
// Case-insensitive look-up of a class by name; null when absent.
const Meta_Class* find_meta_class(const Meta_Repository* repository, const char* name);

// --- slots ----------------------------------------------------------------------

inline void* slot(Instance* instance, uint32_t offset) { return reinterpret_cast<char*>(instance) + offset; }
inline const void* slot(const Instance* instance, uint32_t offset) {
  return reinterpret_cast<const char*>(instance) + offset;
}
// The null flag of a property: after the value (scalars) or the Array handle.
uint8_t* null_flag(Instance* instance, const Meta_Property* mp);
const uint8_t* null_flag(const Instance* instance, const Meta_Property* mp);
inline Instance*& reference_slot(Instance* instance, const Meta_Reference* mr) {
  return *static_cast<Instance**>(slot(instance, mr->offset));
}
inline Instance* reference_of(const Instance* instance, const Meta_Reference* mr) {
  return *static_cast<Instance* const*>(slot(instance, mr->offset));
}
inline bool is_reference_array(const Meta_Reference* mr) { return mr->subscript != 0; }
// An embedded instance or object: held in a reference slot, but a value of
// its owner that crosses CMPI as an instance, never an association's end.
inline bool is_embedded(const Meta_Feature* feature) {
  return (feature->flags & (FLAG_EMBEDDED_INSTANCE | FLAG_EMBEDDED_OBJECT)) != 0;
}
inline bool is_array(const Meta_Property* mp) { return mp->subscript != 0; }
// The string a scalar string property holds; null for every other feature.
const String* scalar_string(const Instance* instance, const Meta_Feature* feature);

// --- text -----------------------------------------------------------------------

// The model path "Class.Key=value,..." of an instance; false (and `out`
// untouched) when the class has no keys or a key is null, an array or a null
// reference.
bool instance_to_model_path(const Instance* instance, std::string& out);

// Diagnostic dumps to standard output.
void print(const Instance* instance);
void print(const Meta_Class* mc);
void print(const Meta_Method* mm);

}  // namespace cimple
