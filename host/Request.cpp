// Request: operation and return-code names.
#include "host/Request.h"

namespace nrv::host {

namespace {

#define NRV_HOST_RC_LIST(X)                                                              \
  X(CMPI_RC_OK) X(CMPI_RC_ERR_FAILED) X(CMPI_RC_ERR_ACCESS_DENIED)                        \
  X(CMPI_RC_ERR_INVALID_NAMESPACE) X(CMPI_RC_ERR_INVALID_PARAMETER)                       \
  X(CMPI_RC_ERR_INVALID_CLASS) X(CMPI_RC_ERR_NOT_FOUND) X(CMPI_RC_ERR_NOT_SUPPORTED)      \
  X(CMPI_RC_ERR_CLASS_HAS_CHILDREN) X(CMPI_RC_ERR_CLASS_HAS_INSTANCES)                    \
  X(CMPI_RC_ERR_INVALID_SUPERCLASS) X(CMPI_RC_ERR_ALREADY_EXISTS)                         \
  X(CMPI_RC_ERR_NO_SUCH_PROPERTY) X(CMPI_RC_ERR_TYPE_MISMATCH)                            \
  X(CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED) X(CMPI_RC_ERR_INVALID_QUERY)                 \
  X(CMPI_RC_ERR_METHOD_NOT_AVAILABLE) X(CMPI_RC_ERR_METHOD_NOT_FOUND)                     \
  X(CMPI_RC_NO_MORE_ELEMENTS) X(CMPI_RC_ERR_SERVER_LIMITS_EXCEEDED)                       \
  X(CMPI_RC_ERR_QUERY_FEATURE_NOT_SUPPORTED) X(CMPI_RC_DO_NOT_UNLOAD)                     \
  X(CMPI_RC_NEVER_UNLOAD) X(CMPI_RC_ERR_INVALID_HANDLE) X(CMPI_RC_ERR_INVALID_DATA_TYPE)  \
  X(CMPI_RC_ERR_NOT_IN_CODEPAGE) X(CMPI_RC_ERROR_SYSTEM) X(CMPI_RC_ERROR)

}  // namespace

const char* operationName(Operation op) {
  switch (op) {
#define NRV_HOST_OP_NAME(name, text) \
  case Operation::name:              \
    return text;
    NRV_HOST_OPERATIONS(NRV_HOST_OP_NAME)
#undef NRV_HOST_OP_NAME
  }
  return "unknown";
}

bool isAssociationOperation(Operation op) {
  return op == Operation::Associators || op == Operation::AssociatorNames ||
         op == Operation::References || op == Operation::ReferenceNames;
}

std::string rcName(CMPIrc rc) {
  switch (rc) {
#define NRV_HOST_RC_NAME(code) \
  case code:                   \
    return #code;
    NRV_HOST_RC_LIST(NRV_HOST_RC_NAME)
#undef NRV_HOST_RC_NAME
  }
  return "CMPI_RC_" + std::to_string(static_cast<int>(rc));
}

}  // namespace nrv::host
