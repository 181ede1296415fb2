// What every provider module built from the framework exports: the
// registration list behind cimple_module, and the CMPI factories that bind a
// provider to the CMPI adapter.  NRV_MODULE_PROVIDER stamps out one provider's
// registration, static adapter record and factories (with class-name aliases).
#pragma once

#include "framework/CMPI_Static_Data.h"
#include "framework/Provider_Proc.h"

namespace cimple {

// Puts a registration in front of the module's list.  Called only during
// static initialisation, before any entry point can run.
void register_provider(Provider_Registration* registration);

// The factories' common body: the adapter hands out the MI object of `kind`
// ('I', 'M' or 'A'), or null; *status (when given) says which.
void* create_mi(CMPI_Static_Data* record, const Provider_Registration* registration, const CMPIBroker* broker,
                const CMPIContext* context, char kind, CMPIStatus* status);

struct Registrar {
  explicit Registrar(Provider_Registration* registration) { register_provider(registration); }
};

}  // namespace cimple

// Registration and static adapter record of class C served by provider P.
#define NRV_REGISTER_PROVIDER(C, P)                                                                        \
  namespace cimple {                                                                                        \
  using C##_Provider = P;                                                                                   \
  namespace {                                                                                               \
  CMPI_Static_Data C##_static_data;                                                                         \
  Provider_Registration C##_registration = {kModuleName, #C "_Provider", provider_proc<C##_Provider>,      \
                                            &C::static_meta_class, nullptr};                                \
  const Registrar C##_registrar(&C##_registration);                                                         \
  }                                                                                                         \
  }

#define NRV_FACTORY(C, KIND, LETTER)                                                                        \
  extern "C" CMPI##KIND##MI* C##_Provider_Create_##KIND##MI(const CMPIBroker* broker,                       \
                                                           const CMPIContext* context, CMPIStatus* status) { \
    return static_cast<CMPI##KIND##MI*>(cimple::create_mi(&cimple::C##_static_data,                          \
                                                          &cimple::C##_registration, broker, context, LETTER, \
                                                          status));                                         \
  }                                                                                                         \
  extern "C" CMPI##KIND##MI* C##_Create_##KIND##MI(const CMPIBroker* broker, const CMPIContext* context,     \
                                                  CMPIStatus* status) {                                     \
    return C##_Provider_Create_##KIND##MI(broker, context, status);                                         \
  }

// A provider with instance and method factories.
#define NRV_PLAIN_MODULE_PROVIDER(C, P) \
  NRV_REGISTER_PROVIDER(C, P)           \
  NRV_FACTORY(C, Instance, 'I')         \
  NRV_FACTORY(C, Method, 'M')

// An association provider: instance, method and association factories.
#define NRV_ASSOCIATION_MODULE_PROVIDER(C, P) \
  NRV_PLAIN_MODULE_PROVIDER(C, P)             \
  NRV_FACTORY(C, Association, 'A')
