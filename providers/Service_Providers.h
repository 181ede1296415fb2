// Every provider that is not catalogue-backed claims its class here by
// specialising Provider_For<C> in its own header, included below.
#pragma once

#include "framework/module/Provider_For.h"
#include "agent/NRVTAVO_ProviderConfigSetting_Provider.h"
