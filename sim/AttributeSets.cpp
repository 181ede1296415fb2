// Attribute and statistics blobs of a simulated function.
#include "sim/AttributeSets.h"

#include <cstring>
#include <string>

#include "access/RM_Attributes.h"
#include "sim/AttributeBlob.h"

namespace nrvsim::rm {
namespace {

// HBA API port states and speed bits, which the management library reuses.
constexpr uint32_t kStateOnline = 2, kStateOffline = 3, kStateLinkDown = 6, kStateDisabled = 22;

uint32_t speed_code(uint32_t mbps) {
  switch (mbps) {
    case 1000: return 1;
    case 2000: return 2;
    case 4000: return 8;
    case 8000: return 16;
    case 10000: return 4;
    default: return 0;
  }
}

std::string speed_text(uint32_t mbps) {
  if (mbps == 0) return "0";
  if (mbps % 1000 == 0) return std::to_string(mbps / 1000) + " Gbps";
  return std::to_string(mbps) + " Mbps";
}

uint32_t function_type(Kind kind) {
  switch (kind) {
    case Kind::kNic: return 2;
    case Kind::kIscsi: return 3;
    case Kind::kFcoe: return 4;
  }
  return 0;
}

uint32_t port_state(const PhysicalPort& p) {
  if (!p.enabled) return kStateDisabled;
  return p.link_up ? kStateOnline : kStateLinkDown;
}

// Site overrides win over computed values: written first, and the reader
// answers the first entry of a number.
void put_overrides(BlobWriter& w, const AttrMap& overrides) {
  for (const auto& [num, value] : overrides) {
    if (const auto* v = std::get_if<uint32_t>(&value)) w.u32(num, *v);
    else if (const auto* q = std::get_if<uint64_t>(&value)) w.u64(num, *q);
    else w.text(num, std::get<std::string>(value));
  }
}

void put_phy(BlobWriter& w, const PhysicalPort& p) {
  w.u32(RM_PA_PHY_TEMP, 58);
  w.u32(RM_PA_PHY_ONLINE_ESTIMATION, 1);
  for (uint16_t n : {RM_PA_PHY_PAIR_A_SNR, RM_PA_PHY_PAIR_B_SNR, RM_PA_PHY_PAIR_C_SNR, RM_PA_PHY_PAIR_D_SNR})
    w.text(n, "23.4 dB");
  for (uint16_t n : {RM_PA_PHY_PAIR_A_AVG_MSE, RM_PA_PHY_PAIR_B_AVG_MSE, RM_PA_PHY_PAIR_C_AVG_MSE,
                     RM_PA_PHY_PAIR_D_AVG_MSE})
    w.text(n, "0.0062");
  w.u32(RM_PA_PHY_AUTO_NEG_STATUS, 1);
  w.u32(RM_PA_PHY_AUTO_NEG_ENABLE, 1);
  w.u32(RM_PA_PHY_CABLE_NVP, p.cable_nvp);
  w.u32(RM_PA_PHY_TIME_SINCE_LINK, 86400);
  w.text(RM_PA_PHY_CONFIG_ID, "0x0003");
  w.text(RM_PA_PHY_FIRMWARE_REV, "2.4.5");
  w.u32(RM_PA_PHY_LINE_RATE_ADVERTISED, 0x7);
  w.u32(RM_PA_PHY_LINK_PARTNER_AUTO_NEG, 1);
  w.u32(RM_PA_PHY_INTERFACE_TYPE, 1);
  w.u32(RM_PA_PHY_AUTONEG_SUPPORTED_SPEEDS, 0x7);
  w.u32(RM_PA_PHY_FORCE_SUPPORTED_SPEEDS, 0x6);
  w.u32(RM_PA_PHY_CONFIGURED_PORT_SPEED, p.speed_mbps);
  w.u32(RM_PA_PHY_PORT_SPEED_MODE, 0);
  w.u32(RM_PA_PHY_DAC_CABLE_LENGTH, 0);
}

}  // namespace

std::vector<uint8_t> hba_attribute_blob(const Card& card, const Function& fn) {
  BlobWriter w;
  put_overrides(w, fn.hba_overrides);
  const Firmware& fw = card.firmware;
  w.text(RM_HA_MANUFACTURER, card.manufacturer);
  w.text(RM_HA_SERIAL_NUMBER, card.serial);
  w.text(RM_HA_MODEL, card.model);
  w.text(RM_HA_MODEL_DESCRIPTION, card.description);
  w.text(RM_HA_NODE_SYMBOLIC_NAME, card.model + " FV" + fw.operational + " DV" + fn.driver_version);
  w.text(RM_HA_HARDWARE_VERSION, card.hardware_version);
  w.text(RM_HA_OPTION_ROM_VERSION, fw.option_rom);
  w.text(RM_HA_FIRMWARE_VERSION, fw.operational);
  w.u32(RM_HA_VENDOR_SPECIFIC_ID, (card.device_id << 16) | card.vendor_id);
  w.text(RM_HA_DRIVER_NAME, fn.driver_name);
  w.u32(RM_HA_DEVICE_ID, card.device_id);
  w.u32(RM_HA_MODEL_ID, card.sub_device_id);
  w.text(RM_HA_OPERATIONAL_FIRMWARE_VERSION, fw.operational);
  w.bytes(RM_HA_IEEE_ADDRESS, fn.mac.data(), static_cast<uint16_t>(fn.mac.size()));
  w.u32(RM_HA_BOOT_CODE_ENABLED, fw.boot.empty() ? 0 : 1);
  w.text(RM_HA_DRIVER_VERSION, fn.driver_version);
  w.text(RM_HA_BOOT_IMAGE_VERSION, fw.boot);
  w.u32(RM_HA_DIAG_VERSION_NUMBER, 3);
  w.text(RM_HA_FUNCTIONAL_FIRMWARE_VERSION, fw.operational);
  w.text(RM_HA_KERNEL_FIRMWARE_VERSION, fw.operational);
  w.u32(RM_HA_SLI_MODE, 4);
  w.u32(RM_HA_BOARD_TEMPERATURE, static_cast<uint32_t>(card.temperature));
  w.u32(RM_HA_PCI_BUS_NUMBER, card.pci_bus);
  w.u32(RM_HA_FUNCTION_TYPE, function_type(fn.kind));
  w.u32(RM_HA_SUB_DEVICE_ID, card.sub_device_id);
  w.u32(RM_HA_PORT_NUMBER, fn.port);
  w.u32(RM_HA_PCI_FUNCTION_NUMBER, fn.pci_function);
  w.u32(RM_HA_SUB_VENDOR_ID, card.sub_vendor_id);
  w.u32(RM_HA_FIRMWARE_STATUS, 0);
  w.text(RM_HA_SP_FIRMWARE_VERSION, fw.sp);
  w.text(RM_HA_SP_FIRMWARE_NAME, "SP-" + card.model);
  w.text(RM_HA_ULP_FIRMWARE_VERSION, fw.ulp);
  w.text(RM_HA_ULP_FIRMWARE_NAME, "ULP-" + card.model);
  w.text(RM_HA_IPL_FILENAME, fw.ipl_file);
  w.text(RM_HA_NCSI_VERSION, fw.ncsi);
  for (uint16_t n : {RM_HA_FCOE_UNIVERSAL_VERSION, RM_HA_FCOE_X86_BIOS_VERSION, RM_HA_FCOE_EFI_VERSION,
                     RM_HA_FCOE_FCODE_VERSION})
    w.text(n, fw.boot);
  for (uint16_t n : {RM_HA_UEFI_BIOS_VERSION, RM_HA_UEFI_NIC_VERSION, RM_HA_UEFI_FCODE_VERSION,
                     RM_HA_UEFI_ISCSI_VERSION})
    w.text(n, fw.uefi);
  w.text(RM_HA_PCI_BUS_SPEED, "8.0 GT/s");
  w.text(RM_HA_PCI_BUS_WIDTH, "x8");
  w.u32(RM_HA_PORT_CONNECTION_TYPE, card.ports[fn.port].is_10gbaset ? 2 : 1);
  w.text(RM_HA_SUBADAPTER_NUMBER, card.sub_adapter);
  w.text(RM_HA_FIRMWARE_ON_FLASH, fw.flash);
  return w.finish();
}

std::vector<uint8_t> port_attribute_blob(const Card& card, const Function& fn) {
  BlobWriter w;
  put_overrides(w, fn.port_overrides);
  const PhysicalPort& phys = card.ports[fn.port];
  const uint32_t state = port_state(phys);
  const uint32_t speed = phys.link_up ? speed_code(phys.speed_mbps) : 0;
  w.u32(RM_PA_PORT_STATE, state);
  w.u32(RM_PA_PHYSICAL_PORT_STATE, phys.link_up ? kStateOnline : kStateLinkDown);
  w.u32(RM_PA_PORT_SUPPORTED_SPEED, speed_code(phys.max_speed_mbps));
  w.u32(RM_PA_PORT_SPEED, speed);
  w.u32(RM_PA_PHYSICAL_PORT_SPEED, speed);
  w.text(RM_PA_FUNC_PORT_SPEED, speed_text(phys.link_up ? phys.speed_mbps : 0));
  w.text(RM_PA_FUNC_QOS_BANDWIDTH, "100");
  w.text(RM_PA_FUNC_QOS_MIN_BANDWIDTH, "0");
  w.u32(RM_PA_PHY_LINK_DOWN_REASON, phys.link_up ? 0 : phys.link_down_reason);
  w.u32(RM_PA_SPECIAL_FEATURE, 0);
  w.u32(RM_PA_FUNCTION_TYPE, static_cast<uint32_t>(fn.kind == Kind::kNic ? 2 : fn.kind == Kind::kIscsi ? 3 : 4));
  w.text(RM_PA_IPV6_GATEWAY_ADDR, fn.ip.ipv6_gateway);
  if (fn.kind == Kind::kFcoe) {
    w.text(RM_PA_PORT_SYMBOLIC_NAME, card.model + " " + fn.hba_name);
    w.u32(RM_PA_PORT_FC_ID, fn.fc_id);
    w.u32(RM_PA_PORT_TYPE, phys.link_up ? 5 : 1);  // N_Port, else unknown
    w.u32(RM_PA_PORT_SERVICE_TYPE, 8);             // class 3
    w.bytes(RM_PA_PORT_NODE_WWN, fn.wwnn.data(), 8);
    w.bytes(RM_PA_PORT_PORT_WWN, fn.id.data(), 8);
    w.u32(RM_PA_PORT_MAX_FRAME_SIZE, 2048);
    w.text(RM_PA_OS_DEVICE_NAME, fn.ifname);
    w.u32(RM_PA_NUMBER_OF_DISCOVERED_PORTS, static_cast<uint32_t>(fn.fc_targets.size()));
    RM_FABRIC_RECORD fabric{};
    std::memcpy(fabric.fabricName, fn.fabric.data(), 8);
    fabric.flags = phys.link_up ? 0x00000001u : 0u;
    w.bytes(RM_PA_FABRIC, &fabric, sizeof fabric);
    w.u32(RM_PA_PFC_THROTTLE, 0);
  } else {
    w.u32(RM_PA_MAXIMUM_MTU, 9000);
    w.u32(RM_PA_CURRENT_MTU, fn.mtu);
    w.text(RM_PA_PERMANENT_MAC_ADDRESS, mac_text(fn.mac, '-'));
  }
  if (fn.kind == Kind::kIscsi) {
    w.u32(RM_PA_LDTO, 30);
    w.u32(RM_PA_DEFAULT_ETO, 30);
    w.u32(RM_PA_MAX_CDB_LENGTH, 16);
    w.bytes(RM_PA_PORT_NODE_WWN, fn.id.data(), 8);
    w.bytes(RM_PA_PORT_PORT_WWN, fn.id.data(), 8);
    RM_FABRIC_RECORD fabric{};
    w.bytes(RM_PA_FABRIC, &fabric, sizeof fabric);
    bool boot = false;
    for (const auto& t : fn.iscsi_targets) boot = boot || t.boot;
    w.u32(RM_PA_ISCSI_BOOT_ENABLED, boot ? 1 : 0);
  }
  if (fn.kind == Kind::kNic) {
    w.text(RM_PA_IF_NAME, fn.ifname);
    w.text(RM_PA_PROTOCOL_IF_TYPE, "Ethernet CSMA/CD");
    w.text(RM_PA_LINK_TECHNOLOGY, "Ethernet");
    w.text(RM_PA_CAPABILITIES, "AlertOnLan,WakeOnLan,FailOver");
    w.text(RM_PA_ENABLED_CAPABILITIES, "WakeOnLan");
    w.text(RM_PA_IP_PROTOCOL_ENDPOINT_NAME, fn.ifname);
    w.text(RM_PA_IP_PROTOCOL_IF_TYPE, "IPv4");
    w.text(RM_PA_IPV4_ADDRESS, fn.ip.address);
    w.text(RM_PA_SUBNET_MASK, fn.ip.netmask);
    w.text(RM_PA_ADDRESS_ORIGIN, fn.ip.dhcp ? "DHCP" : "Static");
    w.text(RM_PA_GATEWAY_ADDRESS, fn.ip.gateway);
    w.u32(RM_PA_VNIC_ENABLED_STATE, 0);
    w.text(RM_PA_VNIC_NAME, "");
    w.u32(RM_PA_VNIC_OUTER_VLAN_ID, fn.ip.vlan);
    w.text(RM_PA_VNIC_MIN_BANDWIDTH, "0");
    w.text(RM_PA_VNIC_MAX_BANDWIDTH, "100");
    w.u32(RM_PA_SRIOV_STATE, 0);
    w.u32(RM_PA_VEPA_STATE, 0);
  }
  if (phys.is_10gbaset) put_phy(w, phys);
  return w.finish();
}

std::vector<uint8_t> port_statistics_blob(const Card& card, const Function& fn) {
  BlobWriter w;
  // Counters grow with the port's traffic; a site may pin any of them.
  const uint64_t seed = 1000003ull * (fn.instance + 1);
  for (uint16_t n = RM_PS_FIRST_VALID; n <= RM_PS_LAST_VALID; ++n) {
    if (n == 1034 || n == 1035 || (n > 1048 && n < 1057)) continue;
    // Loop-initialisation and not-operational-sequence counts exist on FC
    // links only; leaving them out also keeps a 10GBaseT port's blob, PHY
    // counters included, within the 512 bytes callers pass.
    if (fn.kind != Kind::kFcoe && (n == 1036 || n == 1037)) continue;
    auto it = fn.statistics.find(n);
    const bool up = card.ports[fn.port].link_up;
    w.u64(n, it != fn.statistics.end() ? it->second : (up ? seed * (n - 1020) : 0));
  }
  if (card.ports[fn.port].is_10gbaset) {
    for (uint16_t n = RM_PS_PHY_LDPC_ERRS; n <= RM_PS_PHY_MDI_CRC8_ERRS; ++n) {
      auto it = fn.statistics.find(n);
      w.u64(n, it != fn.statistics.end() ? it->second : 0);
    }
  }
  return w.finish();
}

}  // namespace nrvsim::rm
