#include "data/NRV_SanScan.h"

#include <exception>

#include "data/NRV_Data.h"
#include "data/NRV_DataLog.h"

namespace cimple {

San_Scan San_Scan::plan(const Data& data) {
  San_Scan scan;
  const auto& adapters = data.getAdapters();
  for (size_t i = 0; i < adapters.size(); ++i) {
    const Adapter& adapter = *adapters[i];
    for (const auto& port : adapter.getPorts()) {
      if (adapter.getAdapterType() == kiSCSIAdapterType) {
        San_Iscsi_Port iscsi;
        iscsi.adapter = i;
        iscsi.port_index = port->getPortIndex();
        iscsi.initiator_name = port->getSecondaryName();
        iscsi.found.port_name = port->getPortName();
        scan.iscsi_ports.push_back(std::move(iscsi));
      } else if (port->scansTargets() && adapter.getAdapterType() != kNICAdapterType) {
        scan.fc_ports.push_back({i, port.get(), port->getPortIndex(), port->getPortName(), adapter.getAdapterName(),
                                 adapter.getHbaApiName(), {}});
      }
    }
  }
  return scan;
}

void San_Scan::run() {
  NRV_DATA_LOG(NRV_DBG, "buildSANData");
  for (San_Fc_Port& fc : fc_ports) {
    NRV_DATA_LOG(NRV_DBG, "Target Scan from adapter: %s", fc.adapter_name.c_str());
    try {
      fc.targets = Port::scanTargets(fc.hba_api_name);
    } catch (const std::exception&) {
      NRV_DATA_LOG(NRV_ERR, "Issue with Target Rescan - moving to the next Port");
    }
  }
  for (San_Iscsi_Port& iscsi : iscsi_ports) {
    const std::string name = iscsi.found.port_name;
    GetiSCSITargets(name, 0, iscsi.found);
  }
}

void San_Scan::publish(Data& data) {
  for (San_Fc_Port& fc : fc_ports) {
    Adapter* adapter = data.getAdapter(fc.adapter);
    if (adapter == nullptr) continue;
    for (const auto& port : adapter->getPorts())
      if (port.get() == fc.port) port->replaceTargets(std::move(fc.targets));
  }
}

size_t San_Scan::logical_units() const {
  size_t n = 0;
  for (const San_Fc_Port& fc : fc_ports) n += fc.targets.size();
  for (const San_Iscsi_Port& iscsi : iscsi_ports)
    for (const Iscsi_Target& t : iscsi.found.targets) n += t.luns.size();
  return n;
}

}  // namespace cimple
