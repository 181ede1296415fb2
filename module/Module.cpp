// The module unit: every class of the generated provider lists, served by the
// provider Provider_For<C> names (catalogue-backed unless a service provider
// claims the class).
#include "framework/Module_Entry.h"
#include "module/Service_Providers.h"
#include "schema/Classes.h"
#include "schema/ProviderClasses.h"

#define NRV_PLAIN(C) NRV_PLAIN_MODULE_PROVIDER(C, Provider_For<C>::type)
#define NRV_ASSOCIATION(C) NRV_ASSOCIATION_MODULE_PROVIDER(C, Provider_For<C>::type)

NRV_FOR_EACH_PLAIN_PROVIDER_CLASS(NRV_PLAIN)
NRV_FOR_EACH_ASSOCIATION_PROVIDER_CLASS(NRV_ASSOCIATION)
