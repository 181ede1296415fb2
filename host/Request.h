// Request: one CIM operation as the host routes it — from the nrv-cim client, from the C++ API
// or from a provider's broker up-call — and the Outcome the serving provider produced.
#ifndef NRV_HOST_REQUEST_H
#define NRV_HOST_REQUEST_H

#include <optional>
#include <string>
#include <vector>

#include "cmpidt.h"
#include "host/Datum.h"

namespace nrv::host {

// X-macro list of the operations: enumerator and the name used in messages.
#define NRV_HOST_OPERATIONS(X)                          \
  X(EnumerateInstances, "enumerateInstances")           \
  X(EnumerateInstanceNames, "enumerateInstanceNames")   \
  X(GetInstance, "getInstance")                         \
  X(CreateInstance, "createInstance")                   \
  X(ModifyInstance, "modifyInstance")                   \
  X(DeleteInstance, "deleteInstance")                   \
  X(Associators, "associators")                         \
  X(AssociatorNames, "associatorNames")                 \
  X(References, "references")                           \
  X(ReferenceNames, "referenceNames")                   \
  X(InvokeMethod, "invokeMethod")                       \
  X(ExecQuery, "execQuery")

enum class Operation {
#define NRV_HOST_OP_ENUM(name, text) name,
  NRV_HOST_OPERATIONS(NRV_HOST_OP_ENUM)
#undef NRV_HOST_OP_ENUM
};

const char* operationName(Operation op);
bool isAssociationOperation(Operation op);

using PropertyList = std::optional<std::vector<std::string>>;

struct Request {
  Operation op = Operation::EnumerateInstances;
  PathData path;                // class path or instance path
  PropertyList properties;      // nullopt: all properties
  InstanceData instance;        // create and modify
  std::optional<std::string> assocClass, resultClass, role, resultRole;
  std::string method;           // invokeMethod
  NamedData inArgs;             // invokeMethod
  std::string query, queryLanguage;
  NamedData context;            // context entries the provider sees (principal, ...)
};

struct Outcome {
  CMPIrc rc = CMPI_RC_OK;
  std::string message;
  std::vector<Datum> items;     // what the provider returned: instances, paths or data
  bool done = false;            // the provider called returnDone
  Datum returnValue;            // invokeMethod
  NamedData outArgs;            // invokeMethod

  static Outcome failure(CMPIrc rc, std::string message) {
    Outcome o;
    o.rc = rc;
    o.message = std::move(message);
    return o;
  }
  bool ok() const { return rc == CMPI_RC_OK; }
};

// "CMPI_RC_ERR_NOT_FOUND" for CMPI_RC_ERR_NOT_FOUND, "CMPI_RC_<n>" for codes outside the standard.
std::string rcName(CMPIrc rc);

}  // namespace nrv::host

#endif  // NRV_HOST_REQUEST_H
