// The contract between a provider and the dispatch layer: operation codes,
// result codes, the enumeration handler, the registration record and the
// provider procedure through which every request reaches a provider.
#pragma once

#include "framework/Instance.h"

namespace cimple {

// Result codes: 0 is success for every operation.
enum Result_Code : int {
  OK = 0,
  LOAD_OK = 0,
  LOAD_FAILED = 30,
  UNLOAD_OK = 0,
  GET_INSTANCE_OK = 0,
  GET_INSTANCE_NOT_FOUND = 60,
  GET_INSTANCE_UNSUPPORTED = 61,
  GET_INSTANCE_INVALID_PARAMETER = 62,
  GET_INSTANCE_ACCESS_DENIED = 63,
  GET_INSTANCE_FAILED = 64,
  ENUM_INSTANCES_OK = 0,
  ENUM_INSTANCES_FAILED = 70,
  ENUM_INSTANCES_ACCESS_DENIED = 71,
  CREATE_INSTANCE_OK = 0,
  CREATE_INSTANCE_DUPLICATE = 80,
  CREATE_INSTANCE_UNSUPPORTED = 81,
  CREATE_INSTANCE_INVALID_PARAMETER = 82,
  CREATE_INSTANCE_ACCESS_DENIED = 83,
  CREATE_INSTANCE_FAILED = 84,
  DELETE_INSTANCE_OK = 0,
  DELETE_INSTANCE_NOT_FOUND = 90,
  DELETE_INSTANCE_UNSUPPORTED = 91,
  DELETE_INSTANCE_ACCESS_DENIED = 92,
  DELETE_INSTANCE_FAILED = 93,
  MODIFY_INSTANCE_OK = 0,
  MODIFY_INSTANCE_NOT_FOUND = 100,
  MODIFY_INSTANCE_UNSUPPORTED = 101,
  MODIFY_INSTANCE_INVALID_PARAMETER = 102,
  MODIFY_INSTANCE_ACCESS_DENIED = 103,
  MODIFY_INSTANCE_FAILED = 104,
  ENUM_ASSOCIATOR_NAMES_OK = 0,
  ENUM_ASSOCIATOR_NAMES_FAILED = 110,
  ENUM_ASSOCIATOR_NAMES_UNSUPPORTED = 111,
  ENUM_ASSOCIATOR_NAMES_ACCESS_DENIED = 112,
  ENUM_REFERENCES_OK = 0,
  ENUM_REFERENCES_FAILED = 120,
  ENUM_REFERENCES_UNSUPPORTED = 121,
  ENUM_REFERENCES_ACCESS_DENIED = 122,
  INVOKE_METHOD_OK = 0,
  INVOKE_METHOD_FAILED = 130,
  INVOKE_METHOD_UNSUPPORTED = 131,
  INVOKE_METHOD_ACCESS_DENIED = 132,
  ENABLE_INDICATIONS_OK = 0,
  ENABLE_INDICATIONS_FAILED = 140,
  DISABLE_INDICATIONS_OK = 0,
  DISABLE_INDICATIONS_FAILED = 150,
  ENUM_ASSOCIATORS_OK = 0,
  ENUM_ASSOCIATORS_FAILED = 170,
  ENUM_ASSOCIATORS_UNSUPPORTED = 171,
  ENUM_ASSOCIATORS_ACCESS_DENIED = 172,
};

// Operation codes of the provider procedure.
enum Operation : int {
  OPERATION_GET_META_CLASS = 0,
  OPERATION_CREATE_PROVIDER = 1,
  OPERATION_DESTROY_PROVIDER = 2,
  OPERATION_LOAD = 3,
  OPERATION_UNLOAD = 4,
  OPERATION_GET_INSTANCE = 5,
  OPERATION_ENUM_INSTANCES = 6,
  OPERATION_CREATE_INSTANCE = 7,
  OPERATION_DELETE_INSTANCE = 8,
  OPERATION_MODIFY_INSTANCE = 9,
  OPERATION_INVOKE_METHOD = 10,
  OPERATION_ENABLE_INDICATIONS = 11,
  OPERATION_DISABLE_INDICATIONS = 12,
  OPERATION_GET_REPOSITORY = 13,
  OPERATION_ENUM_ASSOCIATOR_NAMES = 14,
  OPERATION_ENUM_REFERENCES = 15,
  OPERATION_ENUM_ASSOCIATORS = 16,
};

// Receives enumeration results: each instance with status 0, the handler
// owning one reference to it from then on; answers true to go on.  The
// instance may be shared with a catalogue: a handler that changes it asks
// for `writable` first.  The closing call passes a null instance and the
// operation's result.
using Handler_Proc = bool (*)(Instance* instance, int status, void* data);

struct Handler {
  Handler_Proc proc;
  void* data;
  bool operator()(Instance* instance, int status = 0) const { return proc(instance, status, data); }
};

struct Provider_Registration;

// One procedure per provider; arguments after the operation code as the
// operation table says, unused ones null.
using Provider_Proc = int (*)(const Provider_Registration* registration, int operation, void* arg0, void* arg1,
                              void* arg2, void* arg3, void* arg4, void* arg5, void* arg6, void* arg7);

struct Provider_Registration {
  const char* module_name;
  const char* provider_name;
  Provider_Proc proc;
  const Meta_Class* meta_class;
  const Provider_Registration* next;
};

inline constexpr const char* kModuleName = "norvane_tavo_provider_Module";

}  // namespace cimple

extern "C" {
// The module's description of itself: the head of the registration list.
const cimple::Provider_Registration* cimple_module();
}
