// Provider_For<C>::type: which provider class serves CIM class C, bound from
// the generated provider lists.  Catalogue-backed classes, and hand-written
// classes whose provider is not built yet, get Catalogue_Provider<C>; every
// other hand-written class gets C_Provider, which must be declared by a
// header of module/Service_Providers.h, or the build stops here.
#pragma once

#include <type_traits>

#include "derivedObjects/Catalogue_Provider.h"
#include "schema/ProviderClasses.h"

namespace cimple {

// No definition: a class in none of the lists has no provider.
template <class C>
struct Provider_For;

template <class T, class = void>
inline constexpr bool is_complete_v = false;
template <class T>
inline constexpr bool is_complete_v<T, std::void_t<decltype(sizeof(T))>> = true;

}  // namespace cimple

#define NRV_CATALOGUE_PROVIDER_FOR(C) \
  template <>                           \
  struct Provider_For<C> {              \
    using type = Catalogue_Provider<C>; \
  };

#define NRV_DECLARE_OWN_PROVIDER(C) class C##_Provider;

// Binds C to C_Provider; after the provider headers, since it checks that the
// provider exists.
#define NRV_OWN_PROVIDER_FOR(C)                                                                        \
  static_assert(is_complete_v<C##_Provider>, #C " has no provider of its own: write " #C "_Provider " \
                                                "and include its header in module/Service_Providers.h, " \
                                                "or list " #C " under [not yet built] in "             \
                                                "schema/provider_lists.txt");                          \
  template <>                                                                                          \
  struct Provider_For<C> {                                                                             \
    using type = C##_Provider;                                                                         \
  };

namespace cimple {
NRV_FOR_EACH_ADAPTER_CATALOGUE_CLASS(NRV_CATALOGUE_PROVIDER_FOR)
NRV_FOR_EACH_SAN_CATALOGUE_CLASS(NRV_CATALOGUE_PROVIDER_FOR)
NRV_FOR_EACH_NOT_YET_BUILT_CLASS(NRV_CATALOGUE_PROVIDER_FOR)
NRV_FOR_EACH_OWN_PROVIDER_CLASS(NRV_DECLARE_OWN_PROVIDER)
}  // namespace cimple

#include "module/Service_Providers.h"

namespace cimple {
NRV_FOR_EACH_OWN_PROVIDER_CLASS(NRV_OWN_PROVIDER_FOR)
}  // namespace cimple
