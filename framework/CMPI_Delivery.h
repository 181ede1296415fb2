// How the CMPI adapter hands provider results to the CIMOM: the enumeration
// handlers that turn each delivered instance into an object path or a CMPI
// instance (or fetch it from the CIMOM).
//
// Contract: a handler owns a reference to each instance it receives (and
// changes a shared one only through `writable`) and releases every CMPI
// object it creates right after returning it, so an enumeration holds one
// object at a time.  A conversion failure stops further delivery and is kept
// in `error`; it does not change the operation's return code.
#pragma once

#include <memory>
#include <string>

#include "framework/Converter.h"
#include "framework/Provider_Handle.h"

namespace cimple {

struct CMPI_Delivery {
  const CMPIBroker* broker;
  const CMPIContext* context;
  const CMPIResult* result;
  const char* name_space;               // the request's
  const char* const* properties;        // null: all
  bool own_name_space = false;          // prefer the instance's own name space
  bool apply_list = false;              // apply the list (keys too) before converting
  CMPIrc error = CMPI_RC_OK;

  const char* name_space_for(const Instance* instance) const {
    return own_name_space && !instance->__name_space.empty() ? instance->__name_space.c_str() : name_space;
  }
};

// Handler procedures (Handler_Proc); `data` is a CMPI_Delivery.
bool deliver_object_path(Instance* instance, int status, void* data);
bool deliver_instance(Instance* instance, int status, void* data);
// Fetches each delivered object from the CIMOM (getInstance with the list)
// and returns what it gets; a failed fetch stops the walk.
bool deliver_fetched_instance(Instance* instance, int status, void* data);

// What a getInstance of `path` (class `mc`) in `name_space` answers through
// `handle`: the model made from the path's keys with the property list
// applied, the provider's (or the fallback's) answer in `result`, and, when
// that is GET_INSTANCE_OK, the instance as the CIMOM gets it in `out`.  A
// conversion failure is answered as its own code.
CMPIrc read_instance(const CMPI_Env& env, Provider_Handle& handle, const Meta_Class* mc, const CMPIObjectPath* path,
                     const char* const* properties, int& result, CMPI_Ptr<CMPIInstance>& out);

// The name space of an object path ("" when it has none).
std::string name_space_of(const CMPIObjectPath* path);

}  // namespace cimple
