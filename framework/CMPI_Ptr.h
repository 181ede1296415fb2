// Owning handles for the CMPI objects the framework creates through the
// broker (strings, arrays, datetimes, object paths, instances, arguments,
// enumerations): each is released through its own release function as soon
// as its owner is done with it, so memory is held per object in flight.
#pragma once

#include <memory>

#include "cmpimacs.h"

namespace cimple {

template <class T>
struct CMPI_Release {
  void operator()(T* object) const {
    if (object && object->ft) object->ft->release(object);
  }
};

template <class T>
using CMPI_Ptr = std::unique_ptr<T, CMPI_Release<T>>;

// The broker, repository and name space a conversion works in.
struct Meta_Repository;
struct CMPI_Env {
  const CMPIBroker* broker;
  const Meta_Repository* repository;
  const char* name_space;
};

// A CMPI value built for the CIMOM.  Owns the encapsulated object it holds
// (string, datetime, object path, instance or array) until destroyed.
class CMPI_Out_Value {
 public:
  CMPI_Out_Value() { value.uint64 = 0; }
  CMPI_Out_Value(const CMPI_Out_Value&) = delete;
  CMPI_Out_Value& operator=(const CMPI_Out_Value&) = delete;
  CMPI_Out_Value(CMPI_Out_Value&& other) noexcept : value(other.value), type(other.type) {
    other.type = CMPI_null;
  }
  CMPI_Out_Value& operator=(CMPI_Out_Value&& other) noexcept {
    if (this != &other) {
      reset();
      value = other.value;
      type = other.type;
      other.type = CMPI_null;
    }
    return *this;
  }
  ~CMPI_Out_Value() { reset(); }

  void reset();
  // Gives the object up without releasing it: the broker made it and frees it when the
  // request ends.  For an object set into an array, which SFCB keeps by pointer.
  void hand_over() { type = CMPI_null; }

  CMPIValue value;
  CMPIType type = CMPI_null;
};

inline void CMPI_Out_Value::reset() {
  if (type & CMPI_ARRAY) {
    if (value.array) value.array->ft->release(value.array);
  } else if (type == CMPI_string) {
    if (value.string) value.string->ft->release(value.string);
  } else if (type == CMPI_dateTime) {
    if (value.dateTime) value.dateTime->ft->release(value.dateTime);
  } else if (type == CMPI_ref) {
    if (value.ref) value.ref->ft->release(value.ref);
  } else if (type == CMPI_instance) {
    if (value.inst) value.inst->ft->release(value.inst);
  }
  type = CMPI_null;
  value.uint64 = 0;
}

}  // namespace cimple
