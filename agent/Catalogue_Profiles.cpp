#include "agent/Catalogue_Profiles.h"

#include <iterator>

#include "agent/Association_Builder.h"
#include "agent/ProviderAgent.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

constexpr const char* kInteropNameSpace = "root/pg_interop";

// In the order of the Profile enumeration.
constexpr Profile_Row kProfiles[] = {
    {"Profile Registration", 2, "1.0.0"},
    {"Ethernet Port", 2, "1.0.0"},
    {"Host LAN Network Port", 2, "1.0.0"},
    {"PCI Device", 2, "1.0.0"},
    {"Physical Asset", 2, "1.0.2"},
    {"Software Inventory", 2, "1.0.0"},
    {"Software", 11, "1.2.0"},
    {"Software Update", 2, "1.0.0"},
    {"Host Discovered Resources", 11, "1.2.0"},
    {"Access Points", 11, "1.3.0"},
    {"Record Log", 2, "1.0.1"},
    {"FCoE Initiator Ports", 11, "1.0.0"},
    {"Storage HBA", 11, "1.4.0"},
    {"IP Interface", 2, "1.0.1"},
    {"Diagnostics", 2, "2.0"},
    {"iSCSI Initiator", 11, "1.2.0"},
    {"iSCSI Initiator Ports", 11, "1.5.0"},
};
static_assert(std::size(kProfiles) == static_cast<size_t>(Profile::kISCSIInitiatorPorts) + 1);

Instance* lookup_profile(ProviderAgent& agent, const char* name) {
  NRVTAVO_RegisteredProfile* keys = NRVTAVO_RegisteredProfile::create(true);
  keys->InstanceID.set(format_text("NRV:%s", name));
  Instance* found = agent.m_NRVTAVO_RegisteredProfile_map.lookup(keys);
  destroy(keys);
  return found;
}

}  // namespace

const Profile_Row& profile_row(Profile profile) { return kProfiles[static_cast<size_t>(profile)]; }

Instance* createRegisteredProfile(ProviderAgent& agent, const char* name, uint16_t organization, const char* version) {
  NRV_LOG(NRV_DBG, "Generating NRVTAVO_RegisteredProfile (%s)", name);
  if (Instance* existing = lookup_profile(agent, name)) {
    NRV_LOG(NRV_DBG, "Got NRVTAVO_RegisteredProfile in the map (%s)", name);
    return existing;
  }
  NRVTAVO_RegisteredProfile* profile = NRVTAVO_RegisteredProfile::create(true);
  profile->__name_space = kInteropNameSpace;
  profile->InstanceID.set(format_text("NRV:%s", name));
  profile->Description.set(format_text("Norvane %s", name));
  profile->ElementName.set(format_text("Norvane Registered %s", name));
  profile->RegisteredName.set(name);
  profile->RegisteredOrganization.set(organization);
  profile->RegisteredVersion.set(version);
  profile->AdvertiseTypes.set({3});
  profile->AdvertiseTypeDescriptions.set({"SLP"});
  Instance* inserted = insert_instance(agent, profile, "Insert Failed : m_NRVTAVO_RegisteredProfile_map");
  if (inserted) NRV_LOG(NRV_DBG, "Created NRVTAVO_RegisteredProfile in the map (%s)", name);
  return inserted;
}

Instance* createRegisteredProfile(ProviderAgent& agent, Profile profile) {
  const Profile_Row& row = profile_row(profile);
  return createRegisteredProfile(agent, row.name, row.organization, row.version);
}

Instance* find_profile(ProviderAgent& agent, Profile profile) { return lookup_profile(agent, profile_row(profile).name); }

Instance* register_host_profile(Catalogue_Build& build, Profile profile) {
  Instance* registered = createRegisteredProfile(build.agent, profile);
  if (!build.agent.m_bOwnComputerSystem) {
    NRV_LOG(NRV_DBG, "This is Kelvar/VMWare comp Sys - do nothing");
    return registered;
  }
  associate<NRVTAVO_ComputerSystemConformsToProfile>(build, profile_row(profile).name, registered, build.host);
  return registered;
}

}  // namespace cimple
