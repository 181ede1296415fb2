// NRVTAVO_ProviderConfigSetting: the three cache settings published as CIM
// setting data.  The provider enumerates them from the catalogue like every
// catalogue-backed provider and lets a client change `current`, which takes
// effect in the agent at once and reaches the configuration file when the
// agent ends.  insertProviderConfigSettings builds the three instances.
#pragma once

#include "agent/Catalogue_Reader.h"
#include "framework/Provider_Proc.h"
#include "schema/NRVTAVO_ProviderConfigSetting.h"

namespace cimple {

class ProviderAgent;

// Inserts the three instances, in their fixed order, from the agent's
// configuration.  m_DataMutex held.  False (after "Insert Failed : ..." at
// NRV_CRIT) when the map refuses one; the refused instance is destroyed.
bool insertProviderConfigSettings(ProviderAgent& agent);

class NRVTAVO_ProviderConfigSetting_Provider : public Provider_Base {
 public:
  int load() { return agent_load(); }
  int unload() { return agent_unload("NRVTAVO_ProviderConfigSetting"); }
  int enum_instances(const Instance*, const Handler& handler) {
    return enumerate_catalogue("NRVTAVO_ProviderConfigSetting", &agent_map<NRVTAVO_ProviderConfigSetting>,
                               Catalogue::Adapter, handler);
  }
  // Changes the setting whose instance has the keys of `instance`, when the
  // model lists `current`: 0, MODIFY_INSTANCE_INVALID_PARAMETER for a missing
  // argument or an out-of-range value, MODIFY_INSTANCE_FAILED when there is
  // no such instance.
  int modify_instance(const Instance* model, const Instance* instance);
};

}  // namespace cimple
