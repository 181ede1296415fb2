#include "agent/Catalogue_Software.h"

#include <iterator>

#include "access/NRV_MethodWrapper.h"
#include "access/RM_Api.h"
#include "agent/Association_Builder.h"
#include "agent/Catalogue_Profiles.h"
#include "agent/ProviderAgent.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

bool contains(const std::string& text, const char* word) { return text.find(word) != std::string::npos; }

// Installed on the host and conforming to the Software Inventory profile.
void install(Catalogue_Build& build, Instance* identity, const char* label) {
  associate<NRVTAVO_InstalledSoftwareIdentity>(build, label, build.host, identity);
  associate<NRVTAVO_SoftwareConformsToProfile>(build, label, find_profile(build.agent, Profile::kSoftwareInventory),
                                               identity);
}

RM_STATUS dfc_version(std::string& v) { return NRV_MethodWrapper::GetLibraryVersion(104, v); }
RM_STATUS rmapi_version(std::string& v) { return NRV_MethodWrapper::GetLibraryVersion(102, v); }

struct Version_Row {
  RM_STATUS (*read)(std::string& version);
  Property<String> NRVTAVO_SoftwareIdentity::*property;
  const char* failure;
};
const Version_Row kVersions[] = {
    {&NRV_MethodWrapper::GetTIROLibVersion, &NRVTAVO_SoftwareIdentity::LibTIROVersion,
     "Failed to get GetTIROLibVersion: returned with error - %d"},
    {&dfc_version, &NRVTAVO_SoftwareIdentity::LibDFCVersion, "Failed to get LibDFCVersion: returned with error - %d"},
    {&rmapi_version, &NRVTAVO_SoftwareIdentity::LibRMAPIVersion,
     "Failed to get LibRMAPIVersion: returned with error - %d"},
};

struct Driver_Row {
  const char* instance_format;     // driver name, version
  const char* description_format;  // driver name, version
  const char* name;
  const char* classification;
  const char* type_label;  // null: the identity carries no driver type
};
// In the order of Driver_Kind.
constexpr Driver_Row kDrivers[] = {
    {"NRV CNA: Driver %s v%s", "Driver:%s v%s", "Norvane CNA Driver", "CNA Driver", "NORVANE:NVNIC_DRIVER_TYPE"},
    {"NRV FCoE: Driver %s v%s", "Driver:%s v%s", "Norvane FCoE Driver", "FCoE Driver", "NORVANE:NVFC_DRIVER_TYPE"},
    {"NRV CNA: Driver %s v%s", "%s v%s", "CNA iSCSI Driver", "CNA iSCSI Driver", nullptr},
};

Instance*& driver_slot(Catalogue_Build& build, Driver_Kind kind) {
  return kind == Driver_Kind::kFcoe ? build.fcoe_driver : build.nic_driver;
}

}  // namespace

void setTargetOSTypes(Instance* instance) {
  NRV_LOG(NRV_DBG, "Entering setTargetOSTypes()");
  auto* identity = static_cast<NRVTAVO_SoftwareIdentity*>(instance);
  std::string os;
  if (const RM_STATUS status = NRV_MethodWrapper::getTargetOS_info(os); status != 0) {
    NRV_LOG(NRV_ERR, "getTargetOS_info failed with %d", static_cast<int>(status));
    return;
  }
  Array<uint16> types;
  bool other = false;
  auto unknown = [&](const char* message) {
    if (message) NRV_LOG(NRV_DBG, "%s", message);
    types.append(1);
    other = true;
  };
  if (contains(os, "Linux")) {
    NRV_LOG(NRV_DBG, "Entering Linux Section");
    types.append(36);
    if (contains(os, "RH") && contains(os, "x86_64")) types.append(80);
    else if (contains(os, "RH")) types.append(79);
    else if (contains(os, "SL") && contains(os, "x86_64")) types.append(85);
    else if (contains(os, "SL")) types.append(84);
    else unknown("Unknown flavour of Linux");
  } else if (contains(os, "VMware")) {
    types.append(104);
  } else if (contains(os, "Windows")) {
    const bool y2008 = contains(os, "2008"), x64 = contains(os, "x64"), r2 = contains(os, "R2");
    if (y2008 && x64 && !r2) types.append(77);
    else if (y2008 && !x64 && !r2) types.append(76);
    else if (y2008 && r2) types.append(103);
    else unknown("Unknown flavour of Windows");
  } else {
    unknown("Unsupported platforms");
  }
  identity->TargetOSTypes.set(types);
  if (other) {
    Array<String> systems = identity->TargetOperatingSystems.is_null() ? Array<String>()
                                                                       : identity->TargetOperatingSystems.value;
    systems.append(String(os));
    identity->TargetOperatingSystems.set(systems);
  }
}

bool create_provider_identity(Catalogue_Build& build) {
  const std::string version =
      format_text("%d.%d.%d-%d", kNrvVersion[0], kNrvVersion[1], kNrvVersion[2], kNrvVersion[3]);
  const std::string name = "Norvane CMPI TAVO Provider v" + version;
  auto* identity = NRVTAVO_SoftwareIdentity::create(true);
  identity->InstanceID.set(name);
  identity->Name.set(name);
  identity->ElementName.set(name);
  identity->Description.set("Norvane CMPI TAVO Provider");
  identity->VersionString.set(version);
  identity->Manufacturer.set("Norvane Corporation");
  identity->Classifications.set({1});
  identity->ClassificationDescriptions.set({"CMPI TAVO CIM Provider"});
  identity->IdentityInfoType.set({"SoftwareID", "SoftwareStatus"});
  identity->IdentityInfoValue.set({"CMPI TAVO CIM Provider", "2"});
  setTargetOSTypes(identity);
  for (const Version_Row& row : kVersions) {
    std::string text;
    if (const RM_STATUS status = row.read(text); status != 0)
      NRV_LOG(NRV_ERR, row.failure, static_cast<int>(status));
    else
      (identity->*row.property).set(text);
  }
  build.provider_identity = insert_instance(build.agent, identity);
  if (build.provider_identity == nullptr) {
    NRV_LOG(NRV_CRIT, "NRVTAVO_SoftwareIdentity creation failed");
    return false;
  }
  associate<NRVTAVO_InstalledSoftwareIdentity>(build, "Software Identity (CMPI TAVO Provider v" + version + ")",
                                               build.host, build.provider_identity);
  associate<NRVTAVO_SoftwareConformsToProfile>(build, "CMPI TAVO Provider, Software",
                                               find_profile(build.agent, Profile::kSoftware),
                                               build.provider_identity);
  return true;
}

Instance* create_driver_identity(Catalogue_Build& build, const Function_View& fn, Driver_Kind kind) {
  const Driver_Row& row = kDrivers[static_cast<size_t>(kind)];
  const std::string& driver = fn.a.text(RM_HA_DRIVER_NAME);
  const std::string& version = fn.a.text(RM_HA_DRIVER_VERSION);
  auto* identity = NRVTAVO_SoftwareIdentity::create(true);
  identity->InstanceID.set(format_text(row.instance_format, driver.c_str(), version.c_str()));
  // Every function of a driver shares its identity.
  if (Instance* existing = build.agent.m_NRVTAVO_SoftwareIdentity_map.lookup(identity)) {
    destroy(identity);
    if (kind != Driver_Kind::kIscsi) driver_slot(build, kind) = existing;
    return existing;
  }
  if (kind == Driver_Kind::kFcoe)
    NRV_LOG(NRV_DBG, "FCoE DriverName: %s, driverVersion: %s, driverManufacturer: %s", driver.c_str(),
            version.c_str(), fn.manufacturer().c_str());
  identity->ElementName.set(format_text("%s v%s", driver.c_str(), version.c_str()));
  identity->Description.set(format_text(row.description_format, driver.c_str(), version.c_str()));
  identity->Name.set(row.name);
  identity->Manufacturer.set(fn.manufacturer());
  identity->VersionString.set(version);
  identity->Classifications.set({2});
  identity->ClassificationDescriptions.set({row.classification});
  if (row.type_label) {
    HBA_UINT32 type = fn.a.integer(NRV_ATTR_DRIVER_TYPE);
    if (kind == Driver_Kind::kNic) {
      type = 0;
      if (RM_GetDriverType(fn.adapter.getIdentifier(), &type) != 0) type = 0;
    }
    identity->IdentityInfoType.set(
        {"NORVANE:DRIVER_NAME", "NORVANE:DRIVER_VERSION", row.type_label, "SoftwareID", "SoftwareStatus"});
    identity->IdentityInfoValue.set({String(driver), String(version), String(std::to_string(type)),
                                     identity->InstanceID.value, "2"});
  }
  Instance* inserted = insert_instance(build.agent, identity, "Insert Failed : m_NRVTAVO_SoftwareIdentity_map");
  if (inserted == nullptr) return nullptr;
  if (kind != Driver_Kind::kIscsi) driver_slot(build, kind) = inserted;
  install(build, inserted, "Driver, Software Inventory");
  return inserted;
}

Instance* create_firmware_identity(Catalogue_Build& build, const Function_View& fn, Instance* chip) {
  const std::string& operational = fn.a.text(RM_HA_OPERATIONAL_FIRMWARE_VERSION);
  const std::string& flash = fn.a.text(RM_HA_FIRMWARE_ON_FLASH);
  const std::string tag = fn.chip_tag();
  auto* identity = NRVTAVO_SoftwareIdentity::create(true);
  identity->InstanceID.set(format_text("NRV CNA:OperationalFirmware:v%s %s UpdatedFirmware:v%s", operational.c_str(),
                                       tag.c_str(), flash.empty() ? operational.c_str() : flash.c_str()));
  identity->Name.set(format_text("CNA Firmware v%s %s", operational.c_str(), tag.c_str()));
  identity->ElementName.set(format_text("%s %s Adapter %s %s", fn.manufacturer().c_str(), fn.model().c_str(),
                                        fn.serial().c_str(), operational.c_str()));
  identity->Description.set("Norvane CNA Firmware");
  identity->Manufacturer.set("Norvane");
  identity->VersionString.set(operational);
  identity->Classifications.set({10});
  identity->ClassificationDescriptions.set({"Firmware"});
  identity->IdentityInfoType.set({"SoftwareID", "SoftwareStatus", "SerialNumber + Sub-AdapterID", "BootCodeVersion"});
  identity->IdentityInfoValue.set(
      {identity->Name.value, "2", String(tag), String(fn.a.text(RM_HA_BOOT_IMAGE_VERSION))});
  Instance* inserted = insert_instance(build.agent, identity, "Insert Failed : m_NRVTAVO_SoftwareIdentity_map");
  if (inserted == nullptr) {
    NRV_LOG(NRV_ERR, "CreateFirmwareIdentityInstance failed");
    return nullptr;
  }
  associate<NRVTAVO_FirmwareElementSoftwareIdentity>(build, "Firmware " + tag, inserted, chip);
  install(build, inserted, "Firmware , Software Inventory");
  return inserted;
}

Instance* create_flash_image(Catalogue_Build& build, const Function_View& fn) {
  auto* image = NRVTAVO_FlashImageSoftwareIdentity::create(true);
  image->InstanceID.set(format_text("NRV CNA Flash Contents:%s", fn.serial().c_str()));
  image->ElementName.set(image->InstanceID.value);
  image->Manufacturer.set(fn.manufacturer());
  image->VersionString.set(fn.a.text(RM_HA_FIRMWARE_ON_FLASH));
  image->IdentityInfoType.set({"NORVANE:SERIAL_NUMBER", "NORVANE:IPL_FILENAME"});
  image->IdentityInfoValue.set({String(fn.serial()), String(fn.a.text(RM_HA_IPL_FILENAME))});
  return insert_instance(build.agent, image);
}

}  // namespace cimple
