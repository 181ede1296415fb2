// The registered profiles of the module (in "root/pg_interop"), made once per
// build and found again by name, and their conformance to the host system.
//
// Contract: m_DataMutex held.  A profile lives in the RegisteredProfile map
// until the next rebuild; the answers point into that map.
#pragma once

#include <cstdint>

#include "agent/Catalogue_Build.h"

namespace cimple {

enum class Profile : uint8_t {
  kProfileRegistration,
  kEthernetPort,
  kHostLANNetworkPort,
  kPCIDevice,
  kPhysicalAsset,
  kSoftwareInventory,
  kSoftware,
  kSoftwareUpdate,
  kHostDiscoveredResources,
  kAccessPoints,
  kRecordLog,
  kFCoEInitiatorPorts,
  kStorageHBA,
  kIPInterface,
  kDiagnostics,
  kISCSIInitiator,
  kISCSIInitiatorPorts,
};

struct Profile_Row {
  const char* name;
  uint16_t organization;  // 2 DMTF, 11 SNIA
  const char* version;
};
const Profile_Row& profile_row(Profile profile);

// The profile of that name in the map, else a new one; null when the map
// refuses it ("Insert Failed : m_NRVTAVO_RegisteredProfile_map").
Instance* createRegisteredProfile(ProviderAgent& agent, const char* name, uint16_t organization, const char* version);
Instance* createRegisteredProfile(ProviderAgent& agent, Profile profile);
// The profile if the map holds it, else null (nothing is made).
Instance* find_profile(ProviderAgent& agent, Profile profile);

// The profile, then its conformance to the host system when the module made
// the host itself (the platform's host speaks for itself otherwise).
Instance* register_host_profile(Catalogue_Build& build, Profile profile);

}  // namespace cimple
