#include "agent/Catalogue_Discovery.h"

#include <exception>

#include "agent/Catalogue_Cards.h"
#include "agent/Catalogue_Features.h"
#include "agent/Catalogue_IP.h"
#include "agent/Catalogue_PCI.h"
#include "agent/Catalogue_Ports.h"
#include "agent/Catalogue_Profiles.h"
#include "agent/Catalogue_Services.h"
#include "agent/Catalogue_Software.h"
#include "agent/ProviderAgent.h"
#include "data/NRV_Data.h"

namespace cimple {

namespace {

// Calls f(view) for every port of every adapter of `type`; others are
// skipped with `skipped` (a format taking the adapter name), when given.
template <class F>
void for_each_function(ProviderAgent& agent, uint32_t type, const char* skipped, F&& f) {
  const auto& adapters = agent.m_pData->getAdapters();
  for (size_t i = 0; i < adapters.size(); ++i) {
    const Adapter& adapter = *adapters[i];
    if (adapter.getAdapterType() != type) {
      if (skipped) NRV_LOG(NRV_DBG, skipped, adapter.getAdapterName().c_str());
      continue;
    }
    for (const auto& port : adapter.getPorts()) f(Function_View(adapter, *port, i));
  }
}

// The card, chip and physical port of a function; null when one is missing.
Physical_Port_Entry* physical_side(Catalogue_Build& build, const Function_View& fn, bool storage, bool strict) {
  Card_Entry* card = ensure_card(build, fn);
  if (card == nullptr) return nullptr;
  Chip_Entry* chip = ensure_chip(build, fn, *card);
  if (chip == nullptr) return nullptr;
  return ensure_physical_port(build, fn, *card, *chip, storage, strict);
}

}  // namespace

std::vector<Nic_Function> nic_discovery(Catalogue_Build& build) {
  std::vector<Nic_Function> functions;
  if (!build.agent.m_pData || !build.agent.m_pData->hasNicAdapter()) {
    NRV_LOG(NRV_DBG, "No NIC card found");
    return functions;
  }
  try {
    for_each_function(build.agent, kNICAdapterType, nullptr, [&](const Function_View& fn) {
      NRV_LOG(NRV_DBG, "Creating classes for Adapter# %zu # --- NIC port# %u #", fn.index, fn.port.getPortIndex());
      Physical_Port_Entry* physical = physical_side(build, fn, false, false);
      if (physical == nullptr) return;
      Instance* port = create_ethernet_port(build, fn, *physical, false);
      if (port == nullptr) return;
      Instance* lan = create_lan_endpoint(build, fn, port);
      create_pci_device(build, fn, port, PCI_Kind::kNic);
      functions.push_back({fn, port, lan});
    });
  } catch (...) {
    NRV_LOG(NRV_ERR, "Unknown exception in  NIC card discovery");
  }
  return functions;
}

void nic_profile_classes(Catalogue_Build& build, const std::vector<Nic_Function>& functions) {
  NRV_LOG(NRV_DBG, "Creating classes for NIC Profile");
  if (!create_ip_configuration_service(build)) {
    NRV_LOG(NRV_ERR, "Failed to create NRVTAVO_IPConfigurationService instance!!!");
    NRV_LOG(NRV_DBG, "No IP Config found");
  }
  for (const Nic_Function& nic : functions)
    if (!create_ip_endpoint(build, nic.view, nic.ethernet_port, nic.lan_endpoint))
      NRV_LOG(NRV_ERR, "CreateIPInterfaceInstances failed");
  run_feature(build, Feature::kNicSettingService);
  run_feature(build, Feature::kNicDriverLog);
  for (const Nic_Function& nic : functions) run_feature(build, Feature::kNicCee, &nic.view);
  run_feature(build, Feature::kDownPorts);
  if (feature_dump_service(build.agent) == 0)
    NRV_LOG(NRV_DBG, "Dump service classes created");
  else
    NRV_LOG(NRV_DBG, "Dump service feature is either Not Supported/Failed to Create the feature");
}

bool fcoe_discovery(Catalogue_Build& build) {
  ProviderAgent& agent = build.agent;
  if (!agent.m_pData) {
    NRV_LOG(NRV_CRIT, "Could not locate the data pointer for FCoE - Serious issue");
    return false;
  }
  try {
    createRegisteredProfile(agent, Profile::kFCoEInitiatorPorts);
    createRegisteredProfile(agent, Profile::kStorageHBA);
    if (!agent.m_pData->hasFcoeAdapter()) {
      NRV_LOG(NRV_DBG, "No FCoE Card found");
      return true;
    }
    NRV_LOG(NRV_DBG, "TAVO FCoE Adapter present");
    if (!create_wwn_service(build)) {
      NRV_LOG(NRV_CRIT, "Failed to create WWN Services class");
      return false;
    }
    create_weblaunch_access_point(build);
    create_driver_parameter_service(build);
    for_each_function(agent, kFCoEAdapterType, "Skippping Adapter [%s] since it is not an FCoE Adapter",
                      [&](const Function_View& fn) {
                        if (build.fcoe_driver == nullptr && !create_driver_identity(build, fn, Driver_Kind::kFcoe))
                          NRV_LOG(NRV_ERR, "CreateDriverIdentity failed");
                      });
    bool global_parameters = false;
    for_each_function(agent, kFCoEAdapterType, nullptr, [&](const Function_View& fn) {
      NRV_LOG(NRV_DBG, "Creating classes for adapter %zu and port %u.", fn.index, fn.port.getPortIndex());
      Physical_Port_Entry* physical = physical_side(build, fn, true, true);
      if (physical == nullptr) return;
      Instance* fc = create_fc_port(build, fn, *physical);
      if (fc == nullptr) return;
      run_feature(build, Feature::kFcPfcThrottle, &fn);
      if (!global_parameters) {
        feature_driver_parameters(agent, fn.name(), true);
        global_parameters = true;
      }
      feature_driver_parameters(agent, fn.name(), false);
      run_feature(build, Feature::kFcFip, &fn);
      run_feature(build, Feature::kFcCee, &fn);
      create_pci_device(build, fn, fc, PCI_Kind::kFcoe);
    });
    run_feature(build, Feature::kFcDriverLog);
    if (feature_port_virtualization(agent) != 0)
      NRV_LOG(NRV_DBG, "Port virtualization classes not created");
  } catch (...) {
    NRV_LOG(NRV_CRIT, " Exception in FCoE Card discovery");
    return false;
  }
  return true;
}

void iscsi_functions(Catalogue_Build& build) {
  if (!build.agent.m_pData || !build.agent.m_pData->hasIscsiAdapter()) {
    NRV_LOG(NRV_DBG, "No iSCSI Card found");
    return;
  }
  try {
    for_each_function(build.agent, kiSCSIAdapterType, "Skippping Non iSCSI Adapter [%s]", [&](const Function_View& fn) {
      NRV_LOG(NRV_DBG, "Creating classes for adapter %zu and port %u.", fn.index, fn.port.getPortIndex());
      Physical_Port_Entry* physical = physical_side(build, fn, false, false);
      if (physical == nullptr) return;
      Instance* port = create_ethernet_port(build, fn, *physical, true);
      if (port == nullptr) {
        NRV_LOG(NRV_ERR, "iSCSI port creation failed");
        return;
      }
      create_pci_device(build, fn, port, PCI_Kind::kIscsi);
    });
  } catch (...) {
    NRV_LOG(NRV_ERR, "Exception in discovering iSCSI Card");
  }
}

}  // namespace cimple
