// The catalogue builders the data-fetch thread runs with m_DataMutex held:
// updateAdapterMaps after the adapter data set is rebuilt, the SAN steps
// after it; and the release of diagnostic jobs at the agent's end.
// Each empties its maps first and then fills them in its fixed order.
#include <exception>

#include "agent/Catalogue_Discovery.h"
#include "agent/Catalogue_Features.h"
#include "agent/Catalogue_Host.h"
#include "agent/Catalogue_Profiles.h"
#include "agent/Catalogue_RecordLogs.h"
#include "agent/Catalogue_Services.h"
#include "agent/Catalogue_Software.h"
#include "agent/Catalogue_VNIC.h"
#include "agent/San_Catalogue.h"
#include "data/NRV_SanScan.h"
#include "agent/NRVTAVO_ProviderConfigSetting_Provider.h"
#include "agent/ProviderAgent.h"
#include "data/NRV_Data.h"

namespace cimple {

namespace {

// What a build that ends early answers; the maps made so far stay.
constexpr int kBuildEnded = 32769;

constexpr Profile kHostProfiles[] = {Profile::kProfileRegistration, Profile::kEthernetPort,
                                     Profile::kHostLANNetworkPort,  Profile::kPCIDevice,
                                     Profile::kPhysicalAsset,       Profile::kSoftwareInventory,
                                     Profile::kSoftware};

// Steps 8 to 10: what the NIC functions need before their discovery.
bool nic_software(Catalogue_Build& build) {
  ProviderAgent& agent = build.agent;
  const bool nic = agent.m_pData && agent.m_pData->hasNicAdapter();
  if (nic) {
    NRV_LOG(NRV_DBG, "Ethernet Port Profile");
    if (!StartSoftwareInstallationService(build)) {
      NRV_LOG(NRV_CRIT, "StartSoftwareInstallationService failed");
      return false;
    }
  }
  if (!create_provider_identity(build)) return false;
  if (!agent.m_pData) return true;
  for (const auto& adapter : agent.m_pData->getAdapters()) {
    if (adapter->getAdapterType() != kNICAdapterType) {
      NRV_LOG(NRV_DBG, "Skippping Non NIC Adapter: [%s]", adapter->getAdapterName().c_str());
      continue;
    }
    for (const auto& port : adapter->getPorts()) {
      if (!create_driver_identity(build, Function_View(*adapter, *port, 0), Driver_Kind::kNic)) {
        NRV_LOG(NRV_CRIT, "CreateDriverIdentity failed");
        return false;
      }
    }
  }
  return true;
}

// Step 17: the features that read the finished ports, and the vNIC identities.
void port_features(Catalogue_Build& build) {
  NRV_LOG(NRV_DBG, "Create the Diagnostic classes");
  run_feature(build, Feature::kDiagnostics);
  NRV_LOG(NRV_DBG, "Updating FRU information to Softwareidentity Class");
  if (feature_update_fru_to_software(build.agent) != 0) NRV_LOG(NRV_DBG, "FRU information not updated");
  NRV_LOG(NRV_DBG, "Creating CreateNICSrIovClasses ");
  run_feature(build, Feature::kSrIov);
  NRV_LOG(NRV_DBG, "Updating MC parameters ");
  run_feature(build, Feature::kChannelManagement);
  NRV_LOG(NRV_DBG, "Updating VNIC Information in the Ports ");
  try {
    if (UpdateVNICInfo(build.agent) != 0) NRV_LOG(NRV_DBG, "vNIC Info not updated");
  } catch (...) {
    NRV_LOG(NRV_ERR, "UpdateVNICInfo Failed");
  }
}

int build_adapter_catalogue(Catalogue_Build& build) {
  ProviderAgent& agent = build.agent;
  if (!build_host_system(build)) {
    NRV_LOG(NRV_CRIT, "Could not create the Computer System Instance");
    return kBuildEnded;
  }
  const bool platform_chassis = chassis_up_call(build);
  for (Profile profile : kHostProfiles) register_host_profile(build, profile);
  if (!insertProviderConfigSettings(agent)) return kBuildEnded;
  if (!platform_chassis && !build_own_chassis(build)) return kBuildEnded;
  register_host_profile(build, Profile::kSoftwareUpdate);
  if (!nic_software(build)) return kBuildEnded;
  register_host_profile(build, Profile::kHostDiscoveredResources);
  register_host_profile(build, Profile::kAccessPoints);

  const std::vector<Nic_Function> nics = nic_discovery(build);
  run_feature(build, Feature::kPhy);
  nic_profile_classes(build, nics);
  if (!create_record_logs(build)) return kBuildEnded;
  if (!fcoe_discovery(build)) return kBuildEnded;
  port_features(build);

  NRV_LOG(NRV_DBG, "PERF: updateAdapterMaps: cleanExit");
  iscsi_functions(build);
  if (run_feature(build, Feature::kIscsiCatalogue) == Feature_Result::kFailed) return kBuildEnded;
  return 0;
}

}  // namespace

int ProviderAgent::updateAdapterMaps() {
  NRV_LOG(NRV_DBG, " updateAdapterMaps: Entry");
  clearAdapterMaps();
  Catalogue_Build build(*this);
  return build_adapter_catalogue(build);
}

void ProviderAgent::buildSANData() {
  m_SANRebuild = std::make_unique<San_Rebuild>();
  {
    std::lock_guard<std::recursive_mutex> data(m_DataMutex);
    if (!m_pData) return;
    m_SANRebuild->scan = San_Scan::plan(*m_pData);
  }
  m_SANRebuild->scan.run();
}

void ProviderAgent::updateSANMaps() {
  if (!m_SANRebuild) return;
  std::unique_ptr<San_Anchors> anchors;
  {
    std::lock_guard<std::recursive_mutex> data(m_DataMutex);
    anchors = collect_san_anchors(*this, m_SANRebuild->scan);
  }
  build_san_catalogue(*this, *anchors, m_SANRebuild->scan, m_SANRebuild->maps);
  m_SANRebuild->built = true;
}

void ProviderAgent::publishSANMaps() {
  // Without a finished build the SAN maps are emptied, never left stale.
  if (!m_SANRebuild) {
    clearSANMaps();
    return;
  }
  if (m_pData) m_SANRebuild->scan.publish(*m_pData);
  if (!m_SANRebuild->built) {
    clearSANMaps();
    return;
  }
  publish_san_maps(*this, m_SANRebuild->maps);
}

void ProviderAgent::releaseDiagnosticJobs() {
  // Running diagnostic jobs are stopped here; until then the ConcreteJob map
  // releases its instances when the agent goes.
}

}  // namespace cimple
