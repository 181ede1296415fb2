// The virtual FC ports behind each FC (FCoE) port of the catalogue: per port
// with virtual ports one NRVTAVO_ResourcePool hosted by the host system, and
// per virtual port an NRVTAVO_VirtualFCPort hosted by its physical port and
// allocated from the pool.
//
// Contract: the catalogue's holder keeps it locked for the call; the FC ports
// and the host system are read from it.  The port-virtualization maps are
// this builder's: it empties them before it fills them.  Instances inserted
// before a failure stay.
#pragma once

#include <stdint.h>

#include "access/NRV_Catalogue.h"

namespace cimple {

class NRV_PortVirtualization {
 public:
  // Statuses beyond the library's.
  static constexpr uint32_t kNoPhysicalPort = 33068;
  static constexpr uint32_t kListingFailed = 40001;
  static constexpr uint32_t kCreateFailed = 32774;

  explicit NRV_PortVirtualization(NRV_Catalogue& catalogue);
  ~NRV_PortVirtualization();
  NRV_PortVirtualization(const NRV_PortVirtualization&) = delete;
  NRV_PortVirtualization& operator=(const NRV_PortVirtualization&) = delete;

  // 0; kNoPhysicalPort without FC ports; kListingFailed when the virtual
  // ports (or one's attributes) of some port could not be listed (the other
  // ports are still served); kNrvFailure when a port name does not convert or
  // an insert is refused, kCreateFailed when an association has no host
  // system to refer to (both end the call).
  uint32_t CreatePortVirtualizationClasses();

  // Empties the resource-pool, element-allocated-from-pool, hosted-resource-
  // pool, virtual-FC-port, virtual-machine system-device and hosted-
  // dependency maps.
  void ClearPortVirtualizationMaps();

 private:
  uint32_t createForPort(const Instance& fcPort);

  NRV_Catalogue& m_Catalogue;
};

}  // namespace cimple
