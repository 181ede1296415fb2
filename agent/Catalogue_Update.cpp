// The catalogue builders the data-fetch thread runs with m_DataMutex held:
// updateAdapterMaps after the adapter data set is rebuilt, updateSANMaps
// after SAN discovery; and the release of diagnostic jobs at the agent's end.  Each empties its maps first and then fills them; the
// builders of the host system, profiles, services, devices, ports and SAN
// instances plug in below, in their fixed order.
#include "agent/NRVTAVO_ProviderConfigSetting_Provider.h"
#include "agent/ProviderAgent.h"
#include "logging/Log.h"

namespace cimple {

void ProviderAgent::updateAdapterMaps() {
  clearAdapterMaps();
  // The host system and its chassis come first; then the provider settings.
  if (!insertProviderConfigSettings(*this)) return;
  // Record logs, profiles, services, adapters, ports and features follow here.
}

void ProviderAgent::updateSANMaps() {
  clearSANMaps();
  // SCSI targets, logical units and their paths are inserted here.
}

void ProviderAgent::releaseDiagnosticJobs() {
  // Running diagnostic jobs are stopped here; until then the ConcreteJob map
  // releases its instances when the agent goes.
}

}  // namespace cimple
