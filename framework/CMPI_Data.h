// Single values between CMPI data and cimple::Value: the scalar, string,
// datetime, reference, embedded instance and array conversions every CMPI
// container shares, and the reading of text sent for numeric or boolean
// method parameters.
//
// Contract: never throws into the CIMOM; a failure is logged to the trace
// file and answered -1.  Values built for the CIMOM are owned by the
// CMPI_Out_Value given; CMPI data read is only borrowed.
#pragma once

#include "framework/CMPI_Ptr.h"
#include "framework/Value.h"

namespace cimple {

// CMPI data -> Value of `type` (a Value type).  `name` names the entry in
// messages; `feature` (may be null) gives the class of references.
int cmpi_to_value(const CMPI_Env& env, const char* name, const CMPIData& data, int type,
                  const Meta_Feature* feature, Value& value);
// Value -> CMPI value owned by `out`.  Instances become object paths, or
// CMPI instances when `flags` (the feature's) mark them embedded, in their
// own name space, or `env.name_space` when they have none.
int value_to_cmpi(const CMPI_Env& env, const Value& value, CMPI_Out_Value& out, uint32_t flags = 0);

// The text of a CMPI string or chars datum.
int cmpi_text(const CMPIData& data, String& out);
// True for the parameter types text may stand for: boolean and the 8, 16
// and 32-bit integers.
bool castable_from_string(int type);
// Rewrites `data` as the CMPI value of `type` read from `text`: booleans
// from a leading "true"/"false" (any case), integers as whole decimal
// numbers within the type's range.  -1 when the text does not fit.
int cast_cmpi_string_to_scalar(const char* text, int type, CMPIData& data);

}  // namespace cimple
