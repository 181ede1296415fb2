// UpdateVNICInfo: adds the channel (virtual NIC) identity of every NIC
// function to the identifying information of its Ethernet port and of the FC
// ports on the same physical port: the adapter's channel mode, the physical
// port number and, in a channel mode, the function's place among the PCI
// functions.
//
// Contract: m_DataMutex held; runs after the ports are built.  Answers 0, or
// 32769 when a port's name cannot be converted (ports not yet reached keep
// their identities).  Linear in the number of ports: ports are grouped by
// physical port once, and a function's place is found by binary search.
#pragma once

namespace cimple {

class ProviderAgent;

int UpdateVNICInfo(ProviderAgent& agent);

}  // namespace cimple
