// The header of every hand-written provider the module has built: each
// declares <Class>_Provider for a class of the hand-written list.  Included
// by module/Provider_For.h, which binds the classes to them.
#pragma once

#include "agent/NRVTAVO_ProviderConfigSetting_Provider.h"
#include "derivedObjects/NRVTAVO_BaseServerReferencedProfile_Provider.h"
#include "derivedObjects/Refresh_Provider.h"
