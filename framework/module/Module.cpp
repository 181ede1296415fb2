// The module unit: one registration, one static adapter record and the
// exported CMPI factories (with their class-name aliases) per provider,
// stamped out from the generated class lists.
#include "framework/CMPI_Static_Data.h"
#include "framework/Provider_Proc.h"
#include "providers/Service_Providers.h"
#include "schema/Classes.h"
#include "schema/ProviderClasses.h"

namespace cimple {
namespace {

const Provider_Registration* registration_head = nullptr;

// Puts a registration in front of the list during static initialisation.
struct Registrar {
  explicit Registrar(Provider_Registration* registration) {
    registration->next = registration_head;
    registration_head = registration;
  }
};

// The factories' common body: the adapter fills *mi, or leaves it null.
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

}  // namespace
}  // namespace cimple

extern "C" const cimple::Provider_Registration* cimple_module() { return cimple::registration_head; }

#define NRV_REGISTER_PROVIDER(C)                                                                            \
  namespace cimple {                                                                                         \
  using C##_Provider = Provider_For<C>::type;                                                                \
  namespace {                                                                                                \
  CMPI_Static_Data C##_static_data;                                                                          \
  Provider_Registration C##_registration = {kModuleName, #C "_Provider", provider_proc<C##_Provider>,       \
                                            &C::static_meta_class, nullptr};                                 \
  const Registrar C##_registrar(&C##_registration);                                                          \
  }                                                                                                          \
  }

#define NRV_FACTORY(C, KIND, LETTER)                                                                          \
  extern "C" CMPI##KIND##MI* C##_Provider_Create_##KIND##MI(const CMPIBroker* broker, const CMPIContext* context, \
                                                           CMPIStatus* status) {                             \
    return static_cast<CMPI##KIND##MI*>(cimple::create_mi(&cimple::C##_static_data, &cimple::C##_registration,  \
                                                          broker, context, LETTER, status));                 \
  }                                                                                                          \
  extern "C" CMPI##KIND##MI* C##_Create_##KIND##MI(const CMPIBroker* broker, const CMPIContext* context,       \
                                                  CMPIStatus* status) {                                      \
    return C##_Provider_Create_##KIND##MI(broker, context, status);                                          \
  }

#define NRV_PLAIN_PROVIDER(C) \
  NRV_REGISTER_PROVIDER(C)    \
  NRV_FACTORY(C, Instance, 'I') \
  NRV_FACTORY(C, Method, 'M')

#define NRV_ASSOCIATION_PROVIDER(C) \
  NRV_PLAIN_PROVIDER(C)             \
  NRV_FACTORY(C, Association, 'A')

NRV_FOR_EACH_PLAIN_PROVIDER_CLASS(NRV_PLAIN_PROVIDER)
NRV_FOR_EACH_ASSOCIATION_PROVIDER_CLASS(NRV_ASSOCIATION_PROVIDER)

