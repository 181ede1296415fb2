// nrv-inventory: the adapter inventory as the module's own discovery sees it
// (the libraries opened at run time, the adapter data set and the SAN behind
// the FCoE ports), printed for a person.  Used by the demo.
#include <cinttypes>
#include <cstdio>
#include <memory>

#include "access/NRV_MethodWrapper.h"
#include "access/NRV_Runtime_Loader.h"
#include "data/NRV_Adapter.h"
#include "data/NRV_Data.h"
#include "data/NRV_Port.h"
#include "data/NRV_PortAttributes.h"
#include "data/NRV_AdapterAttributes.h"
#include "data/NRV_Target.h"

using namespace cimple;

namespace {

const char* kind_name(uint32_t type) {
  static const char* const names[] = {"?", "FC", "NIC", "iSCSI", "FCoE"};
  return type < 5 ? names[type] : "?";
}

void print_targets(const Port& port) {
  for (const auto& target : port.getTargets()) {
    std::printf("      LUN %016" PRIx64 "  type 0x%02x  %-8s %-16s %-4s  target %s  %s\n", target->getFcpLun(),
                target->getDeviceType(), target->getVendor().c_str(), target->getProduct().c_str(),
                target->getRevision().c_str(), target->getPortName().c_str(), target->getOSDeviceName().c_str());
  }
}

void print_adapter(const Adapter& adapter) {
  const AdapterAttributes* attributes = adapter.getAttributes();
  std::printf("%-5s %s  id %s", kind_name(adapter.getAdapterType()), adapter.getAdapterName().c_str(),
              adapter.getIdentifierText().c_str());
  if (attributes)
    std::printf("  serial %s  firmware %s", attributes->text(RM_HA_SERIAL_NUMBER).c_str(),
                attributes->text(RM_HA_FIRMWARE_VERSION).c_str());
  std::printf("\n");
  for (const auto& port : adapter.getPorts()) {
    const PortAttributes* p = port->getAttributes();
    std::printf("    port %u  %s", port->getPortIndex(), port->getPortName().c_str());
    if (!port->getSecondaryName().empty()) std::printf("  (%s)", port->getSecondaryName().c_str());
    if (p) std::printf("  state %u  speed %u", p->integer(RM_PA_PHYSICAL_PORT_STATE), p->integer(RM_PA_PORT_SPEED));
    std::printf("  %zu LUN(s)\n", port->getNumberOfTargets());
    print_targets(*port);
  }
}

}  // namespace

int main() {
  if (NRV_Runtime_Loader::loadLibraries() != 0) {
    std::fprintf(stderr, "nrv-inventory: no adapter management library could be opened\n");
    return 1;
  }
  int status = 0;
  try {
    NRV_MethodWrapper wrapper;  // initialises the management library once
    Data data;
    data.buildAdapterData();
    data.buildSANData();
    std::printf("%u adapter function(s)\n", data.getAdapterCount());
    for (const auto& adapter : data.getAdapters()) print_adapter(*adapter);
  } catch (const std::exception& e) {
    std::fprintf(stderr, "nrv-inventory: %s\n", e.what());
    status = 1;
  }
  NRV_Runtime_Loader::unloadLibraries();
  return status;
}
