// Conversions between the object model and the CIMOM's CMPI objects: object
// paths to key instances and back, CMPI instances to instances and back,
// input arguments to method-call records, and method-call records to output
// arguments and a return value; plus applying a CMPI property list.
//
// Contract: each answers CMPI_RC_OK or the CMPI return code of its failure.
// Returned instances are new references the caller owns; returned CMPI
// objects are owned by the CMPI_Ptr the caller passes.  One bad entry never
// fails a conversion: it is logged to the trace file and skipped.
#pragma once

#include "framework/CMPI_Containers.h"

namespace cimple {

// A key instance of `mc` from the keys of `path`; its name space is the
// path's.  Every non-key property is null.
CMPIrc make_cimple_reference(const CMPI_Env& env, const Meta_Class* mc, const CMPIObjectPath* path,
                             Instance*& instance);
// An instance of `mc` from every property of `cmpi_instance`; name space
// from `path` (or from the CMPI instance's own path when `path` is null).
CMPIrc make_cimple_instance(const CMPI_Env& env, const Meta_Class* mc, const CMPIObjectPath* path,
                            const CMPIInstance* cmpi_instance, Instance*& instance);
// A method-call record of `mm` from the "In" parameters in `in`.
CMPIrc make_cimple_method(const CMPI_Env& env, const Meta_Method* mm, const CMPIObjectPath* path,
                          const CMPIArgs* in, Instance*& record);
// Adds the "Out" parameters of `record` to `out`; `has_return_value` and
// `return_value` carry the "return_value" entry (for returnData).
CMPIrc make_method_outputs(const CMPI_Env& env, const Instance* record, const CMPIArgs* out,
                           bool& has_return_value, CMPI_Out_Value& return_value);

// An object path of `instance` in `name_space` with its keys.
CMPIrc make_cmpi_object_path(const CMPIBroker* broker, const Instance* instance, const char* name_space,
                             CMPI_Ptr<CMPIObjectPath>& path);
// A CMPI instance of `instance` on `path` (made here when null), with
// `properties` (null: all) as its property filter.
CMPIrc make_cmpi_instance(const CMPIBroker* broker, const Instance* instance, const char* name_space,
                          const CMPIObjectPath* path, const char* const* properties,
                          CMPI_Ptr<CMPIInstance>& cmpi_instance);

// Marks the wanted properties of `instance` non-null and the others null
// (keys stay when `keep_keys`); with no list every property is wanted.
// -1 when a name in the list is a method.
int apply_property_list(Instance* instance, const char* const* properties, bool keep_keys);

}  // namespace cimple
