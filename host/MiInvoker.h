// MiInvoker: carries one Request into the module's MIs the way a CIMOM does — builds the
// CMPI context, result, object path, instance and args, calls the MI function and collects
// what the MI returned into an Outcome.
//
// Contract: every CMPI object made for the call lives in an arena that ends with the call, so
// nothing the MI made during the call outlives it (clones and prepared contexts excepted).
#ifndef NRV_HOST_MIINVOKER_H
#define NRV_HOST_MIINVOKER_H

#include "cmpift.h"
#include "host/Dispatch.h"
#include "host/ProviderTable.h"
#include "host/Request.h"

namespace nrv::host {

// The request goes to the providers Dispatch names: an enumeration to each with the path's
// class replaced by the provider's class, an association request to each association
// provider with its own class as the association class; their answers are merged.
Outcome invokeMi(ProviderTable& table, const Dispatch& dispatch, const CMPIBroker* broker,
                 const Request& request);

}  // namespace nrv::host

#endif  // NRV_HOST_MIINVOKER_H
