// The host system and chassis every catalogue instance hangs from: taken
// from the platform's own instrumentation by an up-call into "root/kvlhost"
// when it answers, else made by the module (named after the host).
//
// Contract: m_DataMutex held, on the data-fetch thread (whose thread context
// carries the broker for the up-calls; without one the up-calls find nothing).
// The instances land in m_CIM_ComputerSystem_map / m_CIM_Chassis_map and in
// build.host / build.chassis.  A false answer ends the build.
#pragma once

#include "agent/Catalogue_Build.h"

namespace cimple {

// Step 2: the up-call, else the module's own computer system (which sets
// m_bOwnComputerSystem, m_HostName and m_HostIPAddress).
bool build_host_system(Catalogue_Build& build);
// Step 3: the platform's chassis; false when the up-call found none.
bool chassis_up_call(Catalogue_Build& build);
// Step 6: the module's own chassis "NRV TAVO:Chassis".
bool build_own_chassis(Catalogue_Build& build);

// The host name and dotted IPv4 address as the module names its own host
// ("unknown" for what cannot be found).
struct Host_Identity {
  std::string name;
  std::string address;
};
Host_Identity resolve_host_identity();

}  // namespace cimple
