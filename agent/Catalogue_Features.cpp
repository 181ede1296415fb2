#include "agent/Catalogue_Features.h"

#include <exception>
#include <iterator>

#include "access/NRV_Dump.h"
#include "agent/Agent_Catalogue.h"
#include "data/NRV_DriverParameters.h"
#include "data/NRV_PortVirtualization.h"
#include "data/NRV_Transceiver.h"
#include "data/NRV_VitalProductData.h"
#include "data/NRV_Vpd.h"
#include "schema/Classes.h"

namespace cimple {

// The builders of data/ and access/ see the agent's maps through a catalogue
// view made for the one call; the caller already holds the data lock.
Instance* feature_transceiver(ProviderAgent& agent, const std::string& device_id) {
  Agent_Catalogue catalogue(agent);
  return GetSffData(catalogue, device_id.c_str());
}

int feature_create_vpd(ProviderAgent& agent, const std::string& device_id) {
  Agent_Catalogue catalogue(agent);
  return CreateVPD(catalogue, device_id.c_str()) == 0 ? 0 : 1;
}

void feature_update_fru_to_card(ProviderAgent& agent, Instance* card, const std::string& asic_id,
                                const std::string& device_id, size_t index) {
  if (card == nullptr) return;
  Agent_Catalogue catalogue(agent);
  // The caller may still own the card (not yet inserted): nothing may throw past it.
  try {
    NRV_Vpd(catalogue).UpdateFRUToCard(*static_cast<NRVTAVO_Card*>(card), asic_id, device_id,
                                       static_cast<uint32_t>(index));
  } catch (const std::exception& e) {
    NRV_LOG(NRV_ERR, "Unable to get the FRU VPD for Card : %s (%s)", device_id.c_str(), e.what());
  }
}

int feature_update_fru_to_software(ProviderAgent& agent) {
  Agent_Catalogue catalogue(agent);
  NRV_Vpd(catalogue).UpdateFRUToSoftwareInstance();
  return 0;
}

void feature_driver_parameters(ProviderAgent& agent, const std::string& port_name, bool global) {
  Agent_Catalogue catalogue(agent);
  FCoEGetDriverParam(catalogue, port_name, global);
}

int feature_port_virtualization(ProviderAgent& agent) {
  Agent_Catalogue catalogue(agent);
  return NRV_PortVirtualization(catalogue).CreatePortVirtualizationClasses() == 0 ? 0 : 1;
}

int feature_dump_service(ProviderAgent& agent) {
  Agent_Catalogue catalogue(agent);
  NRV_Dump(catalogue).CreateDumpServiceClasses();
  return agent.m_NRVTAVO_DumpService_map.empty() ? 1 : 0;
}

namespace {

struct Feature_Row {
  Feature feature;
  Feature_Builder builder;  // null until the feature registers its builder
  const char* success;
  const char* failure;
};

// In the order of the Feature enumeration.
Feature_Row kFeatures[] = {
    {Feature::kPhy, nullptr, "10GBaseT feature created",
     "10GBaseT feature is either Not Supported/Failed to Create the feature"},
    {Feature::kNicSettingService, nullptr, "NIC Setting Service classes created",
     "NIC Setting Service feature is either Not Supported/Failed to Create the feature"},
    {Feature::kNicDriverLog, nullptr, "NIC driver log classes created",
     "NIC driver log feature is either Not Supported/Failed to Create the feature"},
    {Feature::kNicCee, nullptr, "CEE classes created for NIC port",
     "CEE feature for NIC port is either Not Supported/Failed to Create the feature"},
    {Feature::kDownPorts, nullptr, "Down Ethernet port classes created",
     "Down Ethernet port feature is either Not Supported/Failed to Create the feature"},
    {Feature::kFcPfcThrottle, nullptr, "PFC throttle classes created",
     "PFC throttle feature is either Not Supported/Failed to Create the feature"},
    {Feature::kFcDriverLog, nullptr, "FC driver log classes created",
     "FC driver log feature is either Not Supported/Failed to Create the feature"},
    {Feature::kFcFip, nullptr, "FIP classes created",
     "FIP feature is either Not Supported/Failed to Create the feature"},
    {Feature::kFcCee, nullptr, "CEE classes created for FCoE port",
     "CEE feature for FCoE port is either Not Supported/Failed to Create the feature"},
    {Feature::kDiagnostics, nullptr, "Diagnostic classes created", "Dignostic Test creation failed"},
    {Feature::kSrIov, nullptr, "SR-IOV classes created", "CreateNICSrIovClasses failed"},
    {Feature::kChannelManagement, nullptr, "MC parameters updated", "Updating MC parameters failed"},
    {Feature::kIscsiCatalogue, nullptr, "iSCSI discovery succesful", "iSCSI discovery failed"},
};
static_assert(std::size(kFeatures) == static_cast<size_t>(Feature::kIscsiCatalogue) + 1);

}  // namespace

void set_feature_builder(Feature feature, Feature_Builder builder) {
  kFeatures[static_cast<size_t>(feature)].builder = builder;
}

Feature_Builder feature_builder(Feature feature) { return kFeatures[static_cast<size_t>(feature)].builder; }

Feature_Result run_feature(Catalogue_Build& build, Feature feature, const Function_View* function) {
  const Feature_Row& row = kFeatures[static_cast<size_t>(feature)];
  if (row.builder == nullptr) {
    NRV_LOG(NRV_DBG, "%s", row.failure);
    return Feature_Result::kNotBuilt;
  }
  int status = 1;
  try {
    status = row.builder(build, function);
  } catch (const std::exception& e) {
    NRV_LOG(NRV_ERR, "%s: %s", row.failure, e.what());
    return Feature_Result::kFailed;
  }
  NRV_LOG(NRV_DBG, "%s", status == 0 ? row.success : row.failure);
  return status == 0 ? Feature_Result::kMade : Feature_Result::kFailed;
}

}  // namespace cimple
