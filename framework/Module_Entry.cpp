#include "framework/Module_Entry.h"

namespace cimple {

namespace {
// Constant-initialised, so registrations from any unit may link in first.
const Provider_Registration* registration_head = nullptr;
}  // namespace

void register_provider(Provider_Registration* registration) {
  registration->next = registration_head;
  registration_head = registration;
}

void* create_mi(CMPI_Static_Data* record, const Provider_Registration* registration, const CMPIBroker* broker,
                const CMPIContext* context, char kind, CMPIStatus* status) {
  void* mi = nullptr;
  cimple_cmpi_adapter(67, record, registration, broker, context, registration->provider_name, kind, &mi);
  if (status) {
    status->rc = mi ? CMPI_RC_OK : CMPI_RC_ERR_FAILED;
    status->msg = nullptr;
  }
  return mi;
}

}  // namespace cimple

extern "C" const cimple::Provider_Registration* cimple_module() { return cimple::registration_head; }
