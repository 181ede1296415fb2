// Every provider that is not catalogue-backed claims its class here by
// specialising Provider_For<C>.
#pragma once

#include "agent/NRVTAVO_ProviderConfigSetting_Provider.h"
#include "module/Provider_For.h"

namespace cimple {

template <>
struct Provider_For<NRVTAVO_ProviderConfigSetting> {
  using type = NRVTAVO_ProviderConfigSetting_Provider;
};

}  // namespace cimple
