// Every provider that is not catalogue-backed claims its class here by
// specialising Provider_For<C>.
#pragma once

#include "agent/NRVTAVO_ProviderConfigSetting_Provider.h"
#include "derivedObjects/NRVTAVO_BaseServerReferencedProfile_Provider.h"
#include "derivedObjects/Refresh_Provider.h"
#include "module/Provider_For.h"

namespace cimple {

template <>
struct Provider_For<NRVTAVO_ProviderConfigSetting> {
  using type = NRVTAVO_ProviderConfigSetting_Provider;
};

template <>
struct Provider_For<NRVTAVO_BaseServerReferencedProfile> {
  using type = NRVTAVO_BaseServerReferencedProfile_Provider;
};

#define NRV_REFRESH_PROVIDER_FOR(C, R) \
  template <>                          \
  struct Provider_For<C> {             \
    using type = C##_Provider;         \
  };
NRV_REFRESH_PROVIDERS(NRV_REFRESH_PROVIDER_FOR)
#undef NRV_REFRESH_PROVIDER_FOR

}  // namespace cimple
