#include "derivedObjects/NRVTAVO_BaseServerReferencedProfile_Provider.h"

#include <memory>

#include "agent/Catalogue_Build.h"
#include "agent/Catalogue_Profiles.h"
#include "framework/cimom.h"
#include "logging/Log.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

constexpr const char* kInteropNameSpace = "root/pg_interop";

// Every profile of the module but Profile Registration, in the order the
// references are handed out.
constexpr Profile kReferenced[] = {
    Profile::kEthernetPort,   Profile::kHostLANNetworkPort, Profile::kPCIDevice,
    Profile::kPhysicalAsset,  Profile::kSoftwareInventory,  Profile::kSoftwareUpdate,
    Profile::kIPInterface,    Profile::kRecordLog,          Profile::kDiagnostics,
    Profile::kSoftware,       Profile::kAccessPoints,       Profile::kFCoEInitiatorPorts,
    Profile::kStorageHBA,     Profile::kHostDiscoveredResources, Profile::kISCSIInitiator,
    Profile::kISCSIInitiatorPorts,
};

// A copy of the platform's first registered profile named "Base Server"
// (any case), or null.
Instance* base_server_profile() {
  NRV_LOG(NRV_DBG,
          "up-call to enumerate OMC_RegisteredBaseServerProfile/OMC_RegisteredBaseServerProfile/PG_RegisteredProfile "
          "created--calling now");
  Instance* model = PG_RegisteredProfile::create(true);
  std::unique_ptr<Instance_Cursor> cursor = cimom::enum_instances(kInteropNameSpace, model);
  destroy(model);
  if (!cursor) {
    NRV_LOG(NRV_DBG, "up-call to enumerate OMC_RegisteredBaseServerProfile/PG_RegisteredProfile failed");
    return nullptr;
  }
  NRV_LOG(NRV_DBG, "up-call to enumerate OMC_RegisteredBaseServerProfile/PG_RegisteredProfile Passed");
  Instance* found = nullptr;
  while (Instance* next = cursor->next()) {
    const auto* profile = is_subclass(&CIM_RegisteredProfile::static_meta_class, next->meta_class)
                              ? static_cast<const CIM_RegisteredProfile*>(next)
                              : nullptr;
    if (found == nullptr && profile && !profile->RegisteredName.is_null() &&
        profile->RegisteredName.value.equal_nocase("Base Server")) {
      found = next;
      found->__name_space = kInteropNameSpace;
    } else {
      unref(next);
    }
  }
  return found;
}

Instance* registered_profile(Profile which) {
  const Profile_Row& row = profile_row(which);
  auto* profile = NRVTAVO_RegisteredProfile::create(true);
  profile->__name_space = kInteropNameSpace;
  profile->InstanceID.set(format_text("NRV:%s", row.name));
  profile->Description.set(format_text("Norvane %s", row.name));
  profile->ElementName.set(format_text("Norvane Registered %s", row.name));
  profile->RegisteredOrganization.set(row.organization);
  profile->RegisteredName.set(row.name);
  profile->RegisteredVersion.set(row.version);
  profile->AdvertiseTypes.set({3});
  profile->AdvertiseTypeDescriptions.set({"SLP"});
  return profile;
}

}  // namespace

int NRVTAVO_BaseServerReferencedProfile_Provider::enum_instances(const Instance*, const Handler& handler) {
  Instance* base = base_server_profile();
  if (base == nullptr) return ENUM_INSTANCES_OK;
  for (Profile which : kReferenced) {
    auto* reference = NRVTAVO_BaseServerReferencedProfile::create(true);
    reference->Antecedent = static_cast<CIM_RegisteredProfile*>(clone(base));
    reference->Dependent = static_cast<NRVTAVO_RegisteredProfile*>(registered_profile(which));
    handler(reference, 0);
  }
  unref(base);
  return ENUM_INSTANCES_OK;
}

}  // namespace cimple
