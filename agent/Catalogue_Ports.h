// The logical ports of the catalogue: an Ethernet port per NIC and iSCSI
// function (with the LAN endpoint of a NIC function and the VLAN endpoint of a
// virtual NIC port), and per FCoE function its FC port, the port's statistics
// and its SCSI initiator endpoint; each tied to its physical port, port
// controller, driver and the host.
//
// Contract: m_DataMutex held; the function's physical port made
// (ensure_physical_port).  Null answers have been logged.  create_fc_port
// throws std::runtime_error when the statistics or their association are
// refused, which ends the build.
#pragma once

#include "agent/Catalogue_Build.h"
#include "agent/Catalogue_Function.h"

namespace cimple {

// `iscsi` names an iSCSI function.
Instance* create_ethernet_port(Catalogue_Build& build, const Function_View& function, Physical_Port_Entry& physical,
                               bool iscsi);
// The LAN endpoint (and, for a virtual NIC port, the VLAN endpoint) of a NIC
// function's Ethernet port; answers the LAN endpoint.
Instance* create_lan_endpoint(Catalogue_Build& build, const Function_View& function, Instance* ethernet_port);
Instance* create_fc_port(Catalogue_Build& build, const Function_View& function, Physical_Port_Entry& physical);

}  // namespace cimple
