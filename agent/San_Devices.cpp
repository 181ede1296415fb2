#include "agent/San_Devices.h"

#include "agent/Catalogue_Services.h"
#include "logging/Log.h"

namespace cimple {

namespace {

struct Unit_Row;
using Unit_Builder = Instance* (*)(San_Build&, const Logical_Unit&, const Unit_Row&, Path_Kind, const Instance*,
                                   const Instance*);

// One device class: its label ("Storage Volume: %s", with the device
// identifier), its word in the path messages and its builder.
struct Unit_Row {
  const char* label;
  const char* word;
  Unit_Builder build;
};

bool has_serial(const Logical_Unit& u) { return !u.serial.empty() && u.serial != "Unknown"; }

std::string inquiry_text(const Logical_Unit& u) {
  if (has_serial(u))
    return format_text("%.8s %.16s Revision %.4s Serial Number %.40s", u.vendor.c_str(), u.product.c_str(),
                       u.revision.c_str(), u.serial.c_str());
  return format_text("%.8s %.16s Revision %.4s", u.vendor.c_str(), u.product.c_str(), u.revision.c_str());
}

bool fits(const Meta_Reference* mr, const Instance* end) {
  return mr != nullptr && end != nullptr && (mr->meta_class == nullptr || is_subclass(mr->meta_class, end->meta_class));
}

// The three-reference path of one logical unit.
template <class P>
Instance* build_path(San_Build& b, const Unit_Row& row, const std::string& label, const Instance* initiator,
                     const Instance* target, const Instance* unit, const Logical_Unit& u) {
  const Meta_Class* mc = &P::static_meta_class;
  NRV_LOG(NRV_DBG, "creating %s - %s", mc->name, row.word);
  const Meta_Reference* refs[] = {find_reference(mc, "Initiator"), find_reference(mc, "Target"),
                                  find_reference(mc, "LogicalUnit")};
  const Instance* ends[] = {initiator, target, unit};
  for (size_t i = 0; i < 3; ++i)
    if (!fits(refs[i], ends[i])) {
      NRV_LOG(NRV_CRIT, "Could not create the instance of the Association class");
      return nullptr;
    }
  P* path = P::create(true);
  for (size_t i = 0; i < 3; ++i) {
    Instance* end = b.catalogue.endpoint(ends[i]);
    ref(end);
    reference_slot(path, refs[i]) = end;
  }
  path->OSDeviceName.set(u.os_device);
  path->LogicalUnitNumber.set(static_cast<uint16>(u.number));
  bool fresh = false;
  Instance* made = san_insert(san_map<P>(b.maps), path, fresh);
  if (!fresh) NRV_LOG(NRV_CRIT, "Insert Failed : m_%s_map (%s)", mc->name, label.c_str());
  return fresh ? made : nullptr;
}

template <class D, class SystemDevice, class FcPath, class IscsiPath>
Instance* build_unit(San_Build& b, const Logical_Unit& u, const Unit_Row& row, Path_Kind kind,
                     const Instance* initiator, const Instance* target) {
  const std::string label = format_text(row.label, u.identifier.c_str());
  D* d = D::create(true);
  const Host_Keys host = host_keys(b.catalogue);
  d->SystemCreationClassName.set(host.creation_class_name);
  d->SystemName.set(host.name);
  d->CreationClassName.set(D::static_meta_class.name);
  std::string device_id = u.identifier;
  if constexpr (std::is_same_v<D, NRVTAVO_StorageVolume>) {
    if (!u.designator.empty()) device_id = u.designator;
    NRV_LOG(NRV_DBG, "StorageVolumeInstance->DeviceID = %s", device_id.c_str());
  }
  d->DeviceID.set(device_id);
  d->ElementName.set(device_name_text(u.device_type, u.number));
  const std::string inquiry = inquiry_text(u);
  d->Description.set(inquiry);
  Array<String> info = {String(inquiry), String(u.os_device)};
  Array<String> descriptions = {
      String(std::is_same_v<D, NRVTAVO_TapeDrive> ? "standard SCSI Inquery data" : "Standard SCSI inquiry data"),
      String("OS Device Name")};
  if (!u.second_identity.empty()) {
    info.append(String(u.second_identity));
    descriptions.append(String("NORVANE:ISCSI_LUN_PATH"));
  }
  d->OtherIdentifyingInfo.set(info);
  d->IdentifyingDescriptions.set(descriptions);
  if constexpr (requires { d->NumberOfBlocks; }) {
    d->Name.set(device_id);
    d->BlockSize.set(u.block_size);
    d->NumberOfBlocks.set(u.blocks);
  }
  if constexpr (requires { d->OtherDeviceType; }) {
    d->DeviceType.set(1);  // Other: the SCSI type is in the name
    d->OtherDeviceType.set(device_name_text(u.device_type, u.number));
  }
  bool fresh = false;
  Instance* device = san_insert(san_map<D>(b.maps), d, fresh);
  if (device == nullptr) return nullptr;
  if (fresh) san_associate<SystemDevice>(b, label, b.catalogue.host, device);
  if (initiator != nullptr && target != nullptr) {
    if (kind == Path_Kind::kFc)
      build_path<FcPath>(b, row, label, initiator, target, device, u);
    else
      build_path<IscsiPath>(b, row, label, initiator, target, device, u);
  }
  return device;
}

enum Unit_Class : uint8_t { kVolume, kTape, kArbitrary, kDisk, kExtent };

constexpr Unit_Row kUnitRows[] = {
    {"Storage Volume: %s", "Storage Volume",
     build_unit<NRVTAVO_StorageVolume, NRVTAVO_StorageVolumeSystemDevice, NRVTAVO_SCSIInitiatorTargetStorageVolumePath,
                NRVTAVO_iSCSIInitiatorTargetStorageVolumePath>},
    {"Tape Drive: %s", "Tape Drive",
     build_unit<NRVTAVO_TapeDrive, NRVTAVO_TapeDriveSystemDevice, NRVTAVO_SCSIInitiatorTargetTapeDrivePath,
                NRVTAVO_iSCSIInitiatorTargetTapeDrivePath>},
    {"SCSI Arbitrary Logical Unit: %s", "SCSI Arbitrary Logical Unit",
     build_unit<NRVTAVO_SCSIArbitraryLogicalUnit, NRVTAVO_SCSIArbitraryLogicalUnitSystemDevice,
                NRVTAVO_SCSIInitiatorTargetArbitraryLogicalUnitPath,
                NRVTAVO_iSCSIInitiatorTargetArbitraryLogicalUnitPath>},
    {"Logical Disk: %s", "Logical Disk",
     build_unit<NRVTAVO_LogicalDisk, NRVTAVO_LogicalDiskSystemDevice, NRVTAVO_SCSIInitiatorTargetLogicalDiskPath,
                NRVTAVO_iSCSIInitiatorTargetLogicalDiskPath>},
    {"Storage Extent: %s", "Storage Extent",
     build_unit<NRVTAVO_StorageExtent, NRVTAVO_StorageExtentSystemDevice, NRVTAVO_SCSIInitiatorTargetStorageExtentPath,
                NRVTAVO_iSCSIInitiatorTargetStorageExtentPath>},
};

Unit_Class unit_class(uint32_t device_type) {
  switch (device_type) {
    case 0:
    case 14: return kVolume;
    case 1: return kTape;
    case 12:
    case 13:
    case 16: return kArbitrary;
    case 17: return kDisk;
    default: return kExtent;
  }
}

}  // namespace

std::string device_name_text(uint32_t device_type, uint32_t number) {
  static constexpr const char* kNames[] = {
      "Storage Volume: %d",         "Tape Drive %d",         "Printer %d",
      "Processor %d",               "Write-once device %d",  "CD/DVD %d",
      "Scanner %d",                 "Optical memory device %d", "Jukebox %d",
      "Communications device %d",   nullptr,                 nullptr,
      "Storage array controller %d", "Enclosure services %d", "Storage Volume: %d",
      "Optical card reader/writer %d", "Bridge controller %d", "Object-based storage device: %d"};
  const char* format = device_type < std::size(kNames) ? kNames[device_type] : nullptr;
  return format_text(format ? format : "Unknown device %d", static_cast<int>(number));
}

Instance* san_insert(Instance_Map& map, Instance* instance, bool& fresh) {
  fresh = false;
  if (instance == nullptr) return nullptr;
  if (Instance* existing = map.lookup(instance)) {
    destroy(instance);
    return existing;
  }
  if (map.insert(instance) < 0) {
    NRV_LOG(NRV_CRIT, "Insert Failed : m_%s_map", instance->meta_class->name);
    destroy(instance);
    return nullptr;
  }
  fresh = true;
  return instance;
}

Instance* build_logical_unit(San_Build& b, const Logical_Unit& unit, Path_Kind kind, const Instance* initiator,
                             const Instance* target) {
  const Unit_Class c = unit_class(unit.device_type);
  if (c == kExtent) NRV_LOG(NRV_DBG, "Peripheral devices type is 0x%02X", unit.device_type);
  const Unit_Row& row = kUnitRows[c];
  return row.build(b, unit, row, kind, initiator, target);
}

}  // namespace cimple
