// The PCI device behind each function, filled from the function's PCI
// configuration header as the management library reads it, with its vital
// product data, its port, the host and the PCI Device profile.
//
// Contract: m_DataMutex held.  Null (and "CreatePCIDeviceInstance failed")
// when the handle or the register read fails or the map refuses the device;
// the function's port is kept either way.
#pragma once

#include "agent/Catalogue_Build.h"
#include "agent/Catalogue_Function.h"

namespace cimple {

enum class PCI_Kind : uint8_t { kNic, kIscsi, kFcoe };

// `port` is the function's Ethernet port (NIC, iSCSI) or FC port (FCoE).
Instance* create_pci_device(Catalogue_Build& build, const Function_View& function, Instance* port, PCI_Kind kind);

}  // namespace cimple
