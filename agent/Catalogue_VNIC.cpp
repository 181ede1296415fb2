#include "agent/Catalogue_VNIC.h"

#include <algorithm>
#include <cstring>
#include <map>
#include <unordered_map>
#include <unordered_set>
#include <vector>

#include "access/NRV_MethodWrapper.h"
#include "agent/Catalogue_Function.h"
#include "logging/Log.h"
#include "agent/ProviderAgent.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

constexpr int kConversionFailed = 32769;

bool is_sriov(const NRVTAVO_EthernetPort* port) { return port->Description.value == "SRIOV"; }

String identifying_entry(const Array<String>& info, size_t i) { return i < info.size() ? info[i] : String(); }

// The value paired with the description "SerialNumber + Sub-AdapterID", or empty.
std::vector<String> chip_entries(const NRVTAVO_FCPort* port) {
  std::vector<String> entries;
  const Array<String>& descriptions = port->IdentifyingDescriptions.value;
  const Array<String>& info = port->OtherIdentifyingInfo.value;
  for (size_t i = 0; i < descriptions.size() && i < info.size(); ++i)
    if (descriptions[i] == "SerialNumber + Sub-AdapterID") entries.push_back(info[i]);
  return entries;
}

// The channel mode of the adapter as text: "1" to "5", "0", or "NotSupported".
std::string mode_text(const HBA_NAME& handle) {
  std::vector<uint8_t> record;
  const RM_STATUS status = NRV_MethodWrapper::GetChannelMgmtCNAInfo(handle, record);
  if (status != 0) {
    NRV_LOG(NRV_DBG, "NRVTAVO_NICSupport::Failure in listing channel mgmt CNA Info. Rm Error: [ %d ]",
            static_cast<int>(status));
    return "NotSupported";
  }
  if (record.size() < sizeof(uint32_t)) {
    NRV_LOG(NRV_DBG, "NRVTAVO_NICSupport:: No channel info found");
    return "NotSupported";
  }
  uint32_t mode = 0;
  std::memcpy(&mode, record.data(), sizeof mode);
  return mode >= 1 && mode <= 5 ? std::to_string(mode) : "0";
}

template <class P>
void append_pairs(P* port, const std::string& mode, uint16 port_number, const std::vector<uint64>& functions,
                  const std::vector<uint64>& fc_functions) {
  Array<String> descriptions = port->IdentifyingDescriptions.value;
  Array<String> info = port->OtherIdentifyingInfo.value;
  descriptions.append("vNIC");
  info.append(String(mode));
  descriptions.append("PhysicalPortNumber");
  info.append(String(std::to_string(port_number)));
  if (mode != "0" && mode != "NotSupported") {
    const uint64 generation = port->Generation.value;
    // Place in the sorted list of every function: those of the Ethernet
    // ports below it, and those of this physical port's FC ports below it.
    const size_t k = static_cast<size_t>(std::lower_bound(functions.begin(), functions.end(), generation) -
                                         functions.begin()) +
                     static_cast<size_t>(std::count_if(fc_functions.begin(), fc_functions.end(),
                                                       [&](uint64 g) { return g < generation; }));
    descriptions.append("VirtualPortNumber");
    info.append(String(std::to_string(k + 1)));
  }
  port->IdentifyingDescriptions.set(descriptions);
  port->OtherIdentifyingInfo.set(info);
}

}  // namespace

int UpdateVNICInfo(ProviderAgent& agent) {
  NRV_LOG(NRV_DBG, "Entered UpdateVNICInfo");
  std::vector<NRVTAVO_EthernetPort*> ports;
  std::unordered_map<std::string, std::vector<NRVTAVO_EthernetPort*>> by_physical_port;
  std::vector<uint64> functions;
  const Instance_Map& ethernet = agent.m_NRVTAVO_EthernetPort_map;
  for (size_t i = 0; i < ethernet.size(); ++i) {
    auto* port = static_cast<NRVTAVO_EthernetPort*>(ethernet[i]);
    if (is_sriov(port)) continue;
    ports.push_back(port);
    by_physical_port[identifying_entry(port->OtherIdentifyingInfo.value, 1).str()].push_back(port);
    functions.push_back(port->Generation.value);
  }
  if (ports.empty()) return 0;
  std::sort(functions.begin(), functions.end());

  // FC ports by physical port number and chip entry.
  std::map<std::pair<uint16, std::string>, std::vector<NRVTAVO_FCPort*>> fc_ports;
  const Instance_Map& fc = agent.m_NRVTAVO_FCPort_map;
  for (size_t i = 0; i < fc.size(); ++i) {
    auto* port = static_cast<NRVTAVO_FCPort*>(fc[i]);
    for (const String& entry : chip_entries(port)) fc_ports[{port->PortNumber.value, entry.str()}].push_back(port);
  }

  std::unordered_set<std::string> handled;
  for (NRVTAVO_EthernetPort* current : ports) {
    const std::string& device_id = current->DeviceID.value.str();
    NRV_LOG(NRV_DBG, "EthernetPort WWPN: %s", device_id.c_str());
    const std::string physical = identifying_entry(current->OtherIdentifyingInfo.value, 1).str();
    if (!handled.insert(physical).second) {
      NRV_LOG(NRV_DBG, "vNIC Details already filled: %s", device_id.c_str());
      continue;
    }
    HBA_NAME handle{};
    if (!port_handle(device_id, handle, "NRVTAVO_NICSupport::UpdateVNICInfo::Id2HBAName failed",
                     "NRVTAVO_NICSupport::UpdateVNICInfo::str2HBAName failed"))
      return kConversionFailed;
    NRV_LOG(NRV_DBG, "EthernetPort SerialNo:PortNumber: %s", physical.c_str());
    const std::string mode = mode_text(handle);
    NRV_LOG(NRV_DBG, "Buffer: %s ", physical.c_str());
    NRV_LOG(NRV_DBG, "Physical: NIC address: %s ", device_id.c_str());

    const uint16 port_number = current->PortNumber.value;
    const auto group = fc_ports.find({port_number, identifying_entry(current->OtherIdentifyingInfo.value, 0).str()});
    std::vector<uint64> fc_functions;
    if (group != fc_ports.end())
      for (const NRVTAVO_FCPort* port : group->second) fc_functions.push_back(port->Generation.value);
    NRV_LOG(NRV_DBG, "Completed looping. ");
    NRV_LOG(NRV_DBG, "PCIFunctionNumber: %d ", static_cast<int>(functions.size() + fc_functions.size()));

    for (NRVTAVO_EthernetPort* port : by_physical_port[physical])
      append_pairs(port, mode, port_number, functions, fc_functions);
    if (group != fc_ports.end())
      for (NRVTAVO_FCPort* port : group->second) append_pairs(port, mode, port_number, functions, fc_functions);
  }
  return 0;
}

}  // namespace cimple
