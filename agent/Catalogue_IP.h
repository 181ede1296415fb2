// The IP side of a NIC port: its IPv4 protocol endpoint and the IP interface
// classes around it (capabilities, assignment setting data, the default
// gateway, the IP configuration service and the IP Interface profile).
//
// Contract: m_DataMutex held; build.ip_service made (may be null, then the
// service association is skipped).  A port without an IPv4 address gets no
// endpoint.  Answers false ("CreateIPInterfaceInstances failed" logged by the
// caller) when an instance of the interface could not be made.
#pragma once

#include "agent/Catalogue_Build.h"
#include "agent/Catalogue_Function.h"

namespace cimple {

bool create_ip_endpoint(Catalogue_Build& build, const Function_View& function, Instance* ethernet_port,
                        Instance* lan_endpoint);

}  // namespace cimple
