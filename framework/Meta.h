// Static, read-only meta-data of the module's CIM classes: feature flags, CIM
// type codes and the Meta_* records the generator emits from schema/.
//
// Contract: every record here is generated into const tables that live for the
// life of the module and are never freed (reference count 0).  A Meta_Method
// begins with the same fields as a Meta_Class, so a method-call record is laid
// out and handled exactly like an instance of its method "class".
#pragma once

#include <cstddef>
#include <cstdint>

namespace cimple {

// Feature flags: bit i has the name flag_names[i].
enum : uint32_t {
  FLAG_PROPERTY = 1u << 0,
  FLAG_REFERENCE = 1u << 1,
  FLAG_METHOD = 1u << 2,
  FLAG_CLASS = 1u << 3,
  FLAG_ABSTRACT = 1u << 4,
  FLAG_AGGREGATE = 1u << 5,
  FLAG_AGGREGATION = 1u << 6,
  FLAG_ASSOCIATION = 1u << 7,
  FLAG_COMPOSITION = 1u << 8,
  FLAG_COUNTER = 1u << 9,
  FLAG_DELETE = 1u << 10,
  FLAG_DN = 1u << 11,
  FLAG_EMBEDDED_OBJECT = 1u << 12,
  FLAG_EXCEPTION = 1u << 13,
  FLAG_EXPENSIVE = 1u << 14,
  FLAG_EXPERIMENTAL = 1u << 15,
  FLAG_GAUGE = 1u << 16,
  FLAG_IFDELETED = 1u << 17,
  FLAG_IN = 1u << 18,
  FLAG_INDICATION = 1u << 19,
  FLAG_INVISIBLE = 1u << 20,
  FLAG_KEY = 1u << 21,
  FLAG_LARGE = 1u << 22,
  FLAG_OCTETSTRING = 1u << 23,
  FLAG_OUT = 1u << 24,
  FLAG_READ = 1u << 25,
  FLAG_REQUIRED = 1u << 26,
  FLAG_STATIC = 1u << 27,
  FLAG_TERMINAL = 1u << 28,
  FLAG_WEAK = 1u << 29,
  FLAG_WRITE = 1u << 30,
  FLAG_EMBEDDED_INSTANCE = 1u << 31,
};

// The names of the 32 flag bits, bit 0 first ("Property" ... "EmbeddedInstance").
extern const char* const flag_names[32];

// CIM scalar type codes.  INSTANCE (14) appears only in Value and references.
enum Type : uint16_t {
  BOOLEAN = 0,
  UINT8 = 1,
  SINT8 = 2,
  UINT16 = 3,
  SINT16 = 4,
  UINT32 = 5,
  SINT32 = 6,
  UINT64 = 7,
  SINT64 = 8,
  REAL32 = 9,
  REAL64 = 10,
  CHAR16 = 11,
  STRING = 12,
  DATETIME = 13,
  INSTANCE = 14,
};

// Lower-case type names, codes 0..13 ("boolean" ... "datetime").
extern const char* const type_name[14];
// The same plus "instance" for code 14.
extern const char* const type_name_with_instance[15];
// Byte size of a stored scalar value of each type code 0..13.
extern const uint8_t type_size[14];

struct Meta_Class;
struct Meta_Repository;

// Qualifiers are not used by this module: every qualifier array is empty.
struct Meta_Qualifier;

// A default value: for a scalar, `data` points to one value of the property's
// type (a const char* for strings and datetimes); for an array, to `count`
// such values.
struct Meta_Value {
  const void* data;
  uint32_t count;
};

// Common prefix of properties, references and methods.
struct Meta_Feature {
  uint32_t refs;
  uint32_t flags;
  const char* name;
  size_t num_meta_qualifiers;
  const Meta_Qualifier* const* meta_qualifiers;
};

struct Meta_Property {
  uint32_t refs;
  uint32_t flags;
  const char* name;
  size_t num_meta_qualifiers;
  const Meta_Qualifier* const* meta_qualifiers;
  uint16_t type;
  int16_t subscript;  // 0 scalar, -1 variable-length array
  uint32_t offset;
  const Meta_Value* value;  // default, or null
};

struct Meta_Reference {
  uint32_t refs;
  uint32_t flags;
  const char* name;
  size_t num_meta_qualifiers;
  const Meta_Qualifier* const* meta_qualifiers;
  int16_t subscript;  // 0 single reference, non-zero reference array
  const Meta_Class* meta_class;
  uint32_t offset;
};

struct Meta_Method {
  uint32_t refs;
  uint32_t flags;
  const char* name;
  size_t num_meta_qualifiers;
  const Meta_Qualifier* const* meta_qualifiers;
  const Meta_Feature* const* meta_features;  // parameters, return_value last
  size_t num_meta_features;
  uint32_t size;  // bytes of a method-call record
  uint16_t return_type;
};

struct Meta_Class {
  uint32_t refs;
  uint32_t flags;
  const char* name;
  size_t num_meta_qualifiers;
  const Meta_Qualifier* const* meta_qualifiers;
  const Meta_Feature* const* meta_features;  // inherited first, schema order
  size_t num_meta_features;
  uint32_t size;  // bytes of an instance record
  const uint8_t* locals;  // 1 where this class declares the feature itself
  const Meta_Class* super_meta_class;
  size_t num_keys;
  const Meta_Repository* meta_repository;
};

struct Meta_Repository {
  const Meta_Class* const* meta_classes;
  size_t num_meta_classes;
};

static_assert(offsetof(Meta_Method, meta_features) == offsetof(Meta_Class, meta_features));
static_assert(offsetof(Meta_Method, num_meta_features) == offsetof(Meta_Class, num_meta_features));
static_assert(offsetof(Meta_Method, size) == offsetof(Meta_Class, size));
static_assert(offsetof(Meta_Property, name) == offsetof(Meta_Feature, name));
static_assert(offsetof(Meta_Reference, name) == offsetof(Meta_Feature, name));

}  // namespace cimple
