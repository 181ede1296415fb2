#include "agent/Catalogue_PCI.h"

#include <cstring>
#include <iterator>

#include "access/RM_Api.h"
#include "agent/Association_Builder.h"
#include "agent/Catalogue_Features.h"
#include "agent/Catalogue_Profiles.h"
#include "agent/Catalogue_Services.h"
#include "agent/ProviderAgent.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

constexpr HBA_UINT32 kConfigSpace = 256;

struct Kind_Texts {
  const char* id_failure;
  const char* str_failure;
  const char* element_format;  // adapter number
  const char* vpd_word;        // "NIC port %s CreateVPD ..."
};
// In the order of PCI_Kind.
constexpr Kind_Texts kKinds[] = {
    {"NRVTAVO_PCIPort Id2HBAName failed", "::str2HBAName failed", "Norvane:NICAdapter%u", "NIC"},
    {"NRVTAVO_PCIPort Id2HBAName failed", "::str2HBAName failed", "Norvane:NICAdapter%u", "iSCSI"},
    {"NRV_MethodWrapper::Id2HBAName failed", "NRV_MethodWrapper::str2HBAName failed", "Norvane:FCOEAdapter%u",
     "FCoE"},
};

// Little-endian fields of the standard configuration header.
struct Config_Header {
  uint8_t bytes[kConfigSpace] = {};
  uint8_t u8(size_t at) const { return bytes[at]; }
  uint16_t u16(size_t at) const { return static_cast<uint16_t>(bytes[at] | bytes[at + 1] << 8); }
  uint32_t u32(size_t at) const { return u16(at) | static_cast<uint32_t>(u16(at + 2)) << 16; }
};

bool read_config(const HBA_NAME& handle, Config_Header& header) {
  HBA_UINT32 size = kConfigSpace;
  const RM_STATUS status = RM_DiagReadPCIRegistersV2(handle, header.bytes, &size);
  NRV_LOG(NRV_DBG, "RM_DiagReadPCIRegistersV2 status = %d ", static_cast<int>(status));
  if (status != 0) {
    NRV_LOG(NRV_ERR, "RM_DiagReadPCIRegistersV2 call failed");
    return false;
  }
  NRV_LOG(NRV_DBG, "RM_DiagReadPCIRegistersV2 call passed");
  return true;
}

void fill_from_header(NRVTAVO_PCIDevice* device, const Config_Header& h) {
  device->VendorID.set(h.u16(0x00));
  device->PCIDeviceID.set(h.u16(0x02));
  device->CommandRegister.set(h.u16(0x04));
  device->RevisionID.set(h.u8(0x08));
  device->ClassCode.set(h.u8(0x0B));
  device->CacheLineSize.set(h.u8(0x0C));
  device->LatencyTimer.set(h.u8(0x0D));
  Array<uint32> bars;
  for (size_t at = 0x10; at < 0x28; at += 4) bars.append(h.u32(at));
  device->BaseAddress.set(bars);
  device->SubsystemVendorID.set(h.u16(0x2C));
  device->SubsystemID.set(h.u16(0x2E));
  device->ExpansionROMBaseAddress.set(h.u32(0x30));
  device->InterruptPin.set(h.u8(0x3D));
  device->MinGrantTime.set(h.u8(0x3E));
  device->MaxLatency.set(h.u8(0x3F));
}

}  // namespace

Instance* create_pci_device(Catalogue_Build& build, const Function_View& fn, Instance* port, PCI_Kind kind) {
  NRV_LOG(NRV_DBG, "Creating NRVTAVO_PCIDevice");
  const Kind_Texts& texts = kKinds[static_cast<size_t>(kind)];
  const std::string& id = fn.name();
  HBA_NAME handle{};
  Config_Header header;
  if (port == nullptr || !port_handle(id, handle, texts.id_failure, texts.str_failure) ||
      !read_config(handle, header)) {
    NRV_LOG(NRV_ERR, "CreatePCIDeviceInstance failed");
    return nullptr;
  }
  ProviderAgent& agent = build.agent;
  auto* device = NRVTAVO_PCIDevice::create(true);
  const Host_Keys host = host_keys(build);
  device->SystemCreationClassName.set(host.creation_class_name);
  device->SystemName.set(host.name);
  device->CreationClassName.set("NRVTAVO_PCIDevice");
  const uint32_t bus = fn.a.integer(RM_HA_PCI_BUS_NUMBER);
  const uint32_t function = fn.a.integer(RM_HA_PCI_FUNCTION_NUMBER);
  device->DeviceID.set(kind == PCI_Kind::kFcoe ? format_text("%s:0x%04X", id.c_str(), header.u16(0x02))
                                               : format_text("%u:%u:0x%04X", bus, function, header.u16(0x02)));
  device->ElementName.set(format_text(texts.element_format, fn.adapter.getAdapterNumber()));
  device->Description.set(format_text("port # %u", fn.physical_port()));
  device->BusNumber.set(static_cast<uint8>(bus));
  device->DeviceNumber.set(0);
  device->FunctionNumber.set(static_cast<uint8>(function));
  device->EnabledState.set(2);
  device->OperationalStatus.set({2});
  fill_from_header(device, header);
  Instance* pci = insert_instance(agent, device, "Insert Failed : m_NRVTAVO_PCIDevice_map");
  if (pci == nullptr) {
    NRV_LOG(NRV_ERR, "Failed to create NRVTAVO_PCIDevice");
    NRV_LOG(NRV_ERR, "CreatePCIDeviceInstance failed");
    return nullptr;
  }

  const bool vpd = feature_create_vpd(agent, id) == 0;
  NRV_LOG(NRV_DBG, vpd ? "%s port %s CreateVPD created" : "%s port %s CreateVPD failed", texts.vpd_word, id.c_str());
  if (vpd) {
    auto* keys = NRVTAVO_VitalProductData::create(true);
    keys->InstanceID.set(id);
    if (Instance* data = agent.m_NRVTAVO_VitalProductData_map.lookup(keys))
      associate<NRVTAVO_ElementVPD>(build, id, pci, data);
    destroy(keys);
  }
  if (kind == PCI_Kind::kFcoe)
    associate<NRVTAVO_FCConcreteIdentity>(build, id, port, pci);
  else
    associate<NRVTAVO_ConcreteIdentity>(build, id, port, pci);
  if (!associate<NRVTAVO_SystemDevice>(build, id, build.host, pci))
    NRV_LOG(NRV_ERR, "Failed to create NRVTAVO_SystemDevice");
  Instance* profile = find_profile(agent, Profile::kPCIDevice);
  if (profile == nullptr)
    NRV_LOG(NRV_ERR, "Missing Profile Registration Profile instance");
  else if (!associate<NRVTAVO_PCIElementConformsToProfile>(build, id, profile, pci))
    NRV_LOG(NRV_ERR, "Failed to create NRVTAVO_PCIElementConformsToProfile");
  return pci;
}

}  // namespace cimple
