// The per-function phases of updateAdapterMaps: the NIC discovery (cards,
// chips, physical ports, Ethernet ports, LAN endpoints, PCI devices), the NIC
// profile classes (IP endpoints and the NIC features), the FCoE discovery (FC
// ports, statistics, initiator endpoints and the FCoE features) and the Part
// of the iSCSI functions the adapter catalogue owns (their Ethernet ports and
// PCI devices).
//
// Contract: m_DataMutex held, inside updateAdapterMaps, with the steps before
// each phase done.  The NIC and iSCSI phases log and contain their failures;
// fcoe_discovery answers false when the build must end (its message logged).
#pragma once

#include <vector>

#include "agent/Catalogue_Build.h"
#include "agent/Catalogue_Function.h"

namespace cimple {

// A NIC function's Ethernet port and LAN endpoint, for the phases after its discovery.
struct Nic_Function {
  Function_View view;
  Instance* ethernet_port;
  Instance* lan_endpoint;
};

std::vector<Nic_Function> nic_discovery(Catalogue_Build& build);
void nic_profile_classes(Catalogue_Build& build, const std::vector<Nic_Function>& functions);
bool fcoe_discovery(Catalogue_Build& build);
void iscsi_functions(Catalogue_Build& build);

}  // namespace cimple
