// The module's services in the catalogue, each hosted by the host system:
// software installation (with its capabilities and the transfer-library
// probe), FC WWN management, IP configuration and FCoE driver parameters, and
// the WebLaunch access point of the management application.
//
// Contract: m_DataMutex held; build.host set.  Each answers false (after its
// failure message) when its service could not be made; the service lands in
// its map and in `build`.
#pragma once

#include "agent/Catalogue_Build.h"

namespace cimple {

bool StartSoftwareInstallationService(Catalogue_Build& build);
// Appends the URI schemes 4, 5, 6 and 8 to the capabilities when a transfer
// library can be opened (and the root file system is writable).
void UpdateCURLCapabilities(Instance* capabilities);
bool create_wwn_service(Catalogue_Build& build);
// Reuses the host's one IP configuration service when the map holds it.
bool create_ip_configuration_service(Catalogue_Build& build);
bool create_driver_parameter_service(Catalogue_Build& build);
// Publishes the WebLaunch address, when there is one, and offers it to every card.
void create_weblaunch_access_point(Catalogue_Build& build);

// SystemCreationClassName and SystemName of the host system.
struct Host_Keys {
  String creation_class_name;
  String name;
};
Host_Keys host_keys(const Catalogue_Build& build);

}  // namespace cimple
