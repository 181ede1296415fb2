#include "agent/Catalogue_Services.h"

#include <dlfcn.h>

#include "access/NRV_Common.h"
#include "logging/NRV_SystemPaths.h"
#include "agent/Association_Builder.h"
#include "agent/Catalogue_Profiles.h"
#include "agent/ProviderAgent.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

// The values every service of the module shares.
template <class S>
S* make_service(const Catalogue_Build& build, const char* name, const char* description, const char* status) {
  S* s = S::create(true);
  const Host_Keys host = host_keys(build);
  s->SystemCreationClassName.set(host.creation_class_name);
  s->SystemName.set(host.name);
  s->CreationClassName.set(name);
  s->Name.set(name);
  s->Description.set(description);
  s->ElementName.set(description);
  s->StartMode.set("Automatic");
  s->Started.set(true);
  s->EnabledState.set(2);
  s->RequestedState.set(2);
  s->EnabledDefault.set(2);
  s->OperationalStatus.set({2});
  s->StatusDescriptions.set({"ok"});
  s->HealthState.set(5);
  if (status) s->Status.set(status);
  return s;
}

struct Transfer_Library {
  const char* message;
  const char* path;
  bool system_file;  // a fixed path, relocated like every system file
};

constexpr Transfer_Library kTransferLibraries[] = {
    {"Searching for /lib Curl on the machine", "/lib/libcurl.so.4", true},
    {"Searching for /usr/lib/ Curl on the machine", "/usr/lib/libcurl.so.4", true},
    {"Checking with libcurl.so system location for libcurl", "libcurl.so", false},
    {"Checking with curl.dll windows system location for libcurl", "curl.dll", false},
};

NRVTAVO_SoftwareInstallationServiceCapabilities* make_install_capabilities() {
  auto* caps = NRVTAVO_SoftwareInstallationServiceCapabilities::create(true);
  caps->InstanceID.set("NRV:TAVOSoftwareInstallationServiceCapabilities");
  caps->Description.set("Norvane TAVO Software Installation Service Capabilities");
  caps->ElementName.set("Norvane TAVO Software Installation Service Capabilities");
  caps->SupportedURISchemes.set({3});
  caps->SupportedTargetTypes.set({"TAVO"});
  caps->SupportedAsynchronousActions.set({2});
  caps->SupportedSynchronousActions.set({4, 5});
  caps->SupportedExtendedResourceTypes.set({2});
  caps->CanAddToCollection.set(false);
  caps->SupportedInstallOptions.set({2, 3, 4, 5, 6, 7, 11});
  caps->OtherSupportedExtendedResourceTypeDescriptions.set({"Norvane firmware files"});
  caps->SupportedExtendedResourceTypesMajorVersions.set({0});
  caps->SupportedExtendedResourceTypesMinorVersions.set({0});
  caps->SupportedExtendedResourceTypesRevisionNumbers.set({0});
  caps->SupportedExtendedResourceTypesBuildNumbers.set({0});
  return caps;
}

}  // namespace

Host_Keys host_keys(const Catalogue_Build& build) {
  // A platform host is of a class derived from CIM_ComputerSystem, laid out
  // with CIM_ComputerSystem's features first.
  const auto* host = static_cast<const CIM_ComputerSystem*>(build.host);
  return {host->CreationClassName.value, host->Name.value};
}

void UpdateCURLCapabilities(Instance* capabilities) {
  NRV_LOG(NRV_DBG, "Inside UpdateCURLCapabilities");
  auto* caps = static_cast<NRVTAVO_SoftwareInstallationServiceCapabilities*>(capabilities);
  if (IsReadOnlyFS()) return;
  void* library = nullptr;
  for (const Transfer_Library& candidate : kTransferLibraries) {
    NRV_LOG(NRV_DBG, "%s", candidate.message);
    const std::string path = candidate.system_file ? system_path(candidate.path) : candidate.path;
    library = dlopen(path.c_str(), RTLD_NOW | RTLD_GLOBAL);
    if (library) break;
  }
  if (library == nullptr) {
    NRV_LOG(NRV_INFO, "libcurl is not present. only file type URIScheme will be supported");
    return;
  }
  Array<uint16> schemes = caps->SupportedURISchemes.value;
  for (uint16 scheme : {4, 5, 6, 8}) schemes.append(scheme);
  caps->SupportedURISchemes.set(schemes);
  if (dlclose(library) != 0) NRV_LOG(NRV_ERR, "ERROR: UNABLE TO CLOSE DYNAMIC LIB");
}

bool StartSoftwareInstallationService(Catalogue_Build& build) {
  NRV_LOG(NRV_DBG, "Starting the SoftwareInstallationService");
  ProviderAgent& agent = build.agent;
  auto* service = insert_instance(
      agent,
      make_service<NRVTAVO_SoftwareInstallationService>(build, "NRVTAVO_SoftwareInstallationService",
                                                        "Norvane TAVO Software Installation Service", nullptr),
      "Insert Failed : m_NRVTAVO_SoftwareInstallationService_map");
  if (service == nullptr) return false;
  build.install_service = service;
  auto* caps = make_install_capabilities();
  UpdateCURLCapabilities(caps);
  caps = insert_instance(agent, caps, "Insert Failed : m_NRVTAVO_SoftwareInstallationServiceCapabilities_map");
  if (caps == nullptr) return false;
  associate<NRVTAVO_HostedInstallationService>(build, "Hosted Installation Service", build.host, service);
  associate<NRVTAVO_InstallServiceAffectsSystem>(build, "Install Service Affects System", build.host, service);
  associate<NRVTAVO_InstallServiceConformsToProfile>(build, "Computer System, Update Profile",
                                                     find_profile(agent, Profile::kSoftwareUpdate), service);
  associate<NRVTAVO_ElementCapabilities>(build, "Element Capabilities, Norvane TAVO Firmware Installation Service",
                                         service, caps);
  return true;
}

bool create_wwn_service(Catalogue_Build& build) {
  NRV_LOG(NRV_DBG, "Starting the WWN Management Service");
  auto* service = make_service<NRVTAVO_FCWWNService>(build, "NRVTAVO_FCWWNService",
                                                     "Norvane FCOE FC WWN Management Service", "Ok");
  service->TimeOfLastStateChange.set(Datetime::interval(0));
  build.wwn_service = insert_instance(build.agent, service, "Insert Failed : m_NRVTAVO_FCWWNService_map");
  if (build.wwn_service == nullptr) return false;
  associate<NRVTAVO_HostedFCWWNService>(build, "Hosted Service, Norvane TAVO FC WWN Management Service", build.host,
                                        build.wwn_service);
  associate<NRVTAVO_FCWWNServiceAffectsSystem>(
      build, format_text("TAVO FC WWN Management Service Affects System: %s", build.agent.m_HostName.c_str()),
      build.host, build.wwn_service);
  return true;
}

// A service hosted by the host system, for the services that log their
// own creation failures.
template <class S, class Hosted>
static Instance* hosted_service(Catalogue_Build& build, const char* name, const char* description, const char* status) {
  Instance* service = insert_instance(build.agent, make_service<S>(build, name, description, status));
  if (service == nullptr) {
    NRV_LOG(NRV_ERR, "Failed to create %s", S::static_meta_class.name);
    return nullptr;
  }
  if (associate<Hosted>(build, std::string("Hosted ") + description, build.host, service) == nullptr)
    NRV_LOG(NRV_ERR, "Failed to create %s", Hosted::static_meta_class.name);
  return service;
}

bool create_ip_configuration_service(Catalogue_Build& build) {
  Instance_Map& map = build.agent.m_NRVTAVO_IPConfigurationService_map;
  for (size_t i = 0; i < map.size(); ++i) {
    if (static_cast<NRVTAVO_IPConfigurationService*>(map[i])->Name.value == "NRVTAVO_IPConfigurationService") {
      NRV_LOG(NRV_DBG, "Got NRVTAVO_IPConfigurationService in the map");
      build.ip_service = map[i];
      return true;
    }
  }
  build.ip_service = hosted_service<NRVTAVO_IPConfigurationService, NRVTAVO_HostedIPConfigurationService>(
      build, "NRVTAVO_IPConfigurationService", "Norvane IP Configuration Service", "ok");
  return build.ip_service != nullptr;
}

bool create_driver_parameter_service(Catalogue_Build& build) {
  build.driver_parameter_service =
      hosted_service<NRVTAVO_DriverParameterService, NRVTAVO_HostedDriverParameterService>(
          build, "NRVTAVO_DriverParameterService", "Norvane FCoE TAVO Set Driver Parameters Service", "OK");
  return build.driver_parameter_service != nullptr;
}

void create_weblaunch_access_point(Catalogue_Build& build) {
  const std::string address = build.agent.m_ConfigFile.readWebLaunchAddress();
  if (address.empty()) return;
  auto* sap = NRVTAVO_RemoteServiceAccessPoint::create(true);
  const Host_Keys host = host_keys(build);
  sap->SystemCreationClassName.set(host.creation_class_name);
  sap->SystemName.set(host.name);
  sap->CreationClassName.set("NRVTAVO_RemoteServiceAccessPoint");
  sap->Name.set("Portmind");
  sap->ElementName.set("Portmind WebLaunch URL");
  sap->Description.set("NRV FCoE HBA:Portmind Management Interface");
  sap->AccessInfo.set(address);
  sap->InfoFormat.set(200);  // URL
  sap->EnabledState.set(2);
  sap->OperationalStatus.set({2});
  Instance* inserted = insert_instance(build.agent, sap);
  if (inserted == nullptr) return;
  associate<NRVTAVO_RemoteHostedAccessPoint>(build, "Remote Hosted Service Access Point", build.host, inserted);
  for (const auto& [serial, card] : build.cards)
    associate<NRVTAVO_SAPAvailableForElement>(build, "Portmind WebLaunch URL:" + serial, inserted, card.card);
}

}  // namespace cimple
