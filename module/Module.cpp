// The module unit: every class of the generated provider lists, served by the
// provider Provider_For<C> names (the catalogue template, or the class's own
// hand-written provider).
#include "framework/Module_Entry.h"
#include "module/Provider_For.h"
#include "schema/Classes.h"
#include "schema/ProviderClasses.h"

#define NRV_PLAIN(C) NRV_PLAIN_MODULE_PROVIDER(C, Provider_For<C>::type)
#define NRV_ASSOCIATION(C) NRV_ASSOCIATION_MODULE_PROVIDER(C, Provider_For<C>::type)

NRV_FOR_EACH_PLAIN_PROVIDER_CLASS(NRV_PLAIN)
NRV_FOR_EACH_ASSOCIATION_PROVIDER_CLASS(NRV_ASSOCIATION)
