// The simulated hardware: cards, their PCI functions, the SAN behind them and
// the management library's own settings.  Plain data; SiteLoader fills it and
// the library entry points read and change it under SimSite's lock.
#pragma once

#include <array>
#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <utility>
#include <variant>
#include <vector>

#include "sim/Names.h"

namespace nrvsim {

enum class Kind : uint8_t { kNic, kIscsi, kFcoe };

// Protocol mask bits of the adapter information record.
inline constexpr uint32_t kMaskIscsi = 0x04;
inline constexpr uint32_t kMaskNic = 0x08;
inline constexpr uint32_t kMaskFcoe = 0x10;

// A value put straight into an attribute blob by number (site overrides).
using AttrValue = std::variant<uint32_t, uint64_t, std::string>;
using AttrMap = std::map<uint16_t, AttrValue>;

// (keyword, value) in the order the card's EEPROM lists them.
using VpdEntries = std::vector<std::pair<std::string, std::string>>;

struct ScsiUnit {  // one logical unit, FC or iSCSI
  uint32_t lun = 0;
  uint8_t device_type = 0;  // SCSI peripheral device type
  std::string vendor, product, revision, serial;
  std::vector<uint8_t> naa;  // page 0x83 designator (NAA), 8 or 16 bytes
  uint64_t blocks = 0;       // number of logical blocks
  uint32_t block_size = 512;
  std::string os_device;
  bool oas = false;  // optimized-access state
};

struct FcTarget {
  Wwn wwpn{}, wwnn{};
  uint32_t fc_id = 0;
  uint32_t scsi_target = 0;
  std::vector<ScsiUnit> luns;
};

struct VPort {
  Wwn wwpn{}, wwnn{};
  uint32_t fc_id = 0;
  std::string name;
  std::string vm_name;
  uint32_t state = 1;
};

struct Endpoint {  // IP address and TCP port as text and number
  std::string ip;
  uint16_t port = 0;
};

struct IscsiConnection {
  uint16_t cid = 0;
  Endpoint local, remote;
};

struct IscsiSession {
  uint32_t id = 0;  // library handle, unique within the site
  uint64_t isid = 0;
  uint16_t tsih = 0;
  uint32_t state = 0;  // 0 open, 1 closed, ...
  std::vector<IscsiConnection> connections;
};

struct LoginOptions {
  uint8_t immediate_data = 1, header_digest = 0, data_digest = 0;
};

struct Authentication {
  uint32_t method = 0;  // 0 none, 1 one-way CHAP, 2 mutual
  std::string initiator_chap, target_chap, initiator_secret, target_secret;
};

struct IscsiPortal {
  Endpoint address;
  LoginOptions login;
  Authentication auth;
};

struct IscsiTarget {
  std::string name, alias;
  Endpoint portal;
  LoginOptions login;
  Authentication auth;
  uint32_t extended_timeout = 30;  // seconds
  bool boot = false;
  std::vector<IscsiSession> sessions;
  std::vector<ScsiUnit> luns;
};

struct IscsiInitiator {
  std::string name, alias;
  LoginOptions login;
  Authentication auth;
  std::vector<IscsiPortal> portals;  // send-target portals
  std::vector<Endpoint> isns;
  bool isns_enabled = false;
};

struct IpConfig {
  std::string address, netmask, gateway, ipv6_gateway;
  bool dhcp = false;
  uint16_t vlan = 0;
};

struct ArpEntry {
  std::string ip;
  Mac mac{};
};

struct RouteEntry {
  std::string destination, netmask, gateway;
};

struct DriverParam {
  std::string name, help;
  uint32_t min = 0, max = 0, def = 0, current = 0;
  uint32_t exported = 1, changeable = 1;
};

struct SffData {
  bool present = false, diagnostics = false;
  uint8_t identifier = 3, ext_identifier = 4, connector = 7;
  uint16_t wavelength = 850;
  std::string vendor, part_number, revision, serial, date_code;
  std::array<uint8_t, 3> oui{};
  float temperature = 0, vcc = 0, tx_bias = 0, tx_power = 0, rx_power = 0;
  // high alarm, low alarm, high warning, low warning; raw SFF-8472 units
  std::array<uint16_t, 4> temp_thresholds{}, vcc_thresholds{}, bias_thresholds{}, tx_thresholds{},
      rx_thresholds{};
};

// Data-centre bridging state of a physical port.
struct DcbSettings {
  uint32_t dcbx_state = 1, lldp_tx = 1, lldp_rx = 1, pfc_enabled = 1;
  uint32_t fcoe_priority = 3, iscsi_priority = 4, roce_priority = 5;
  std::array<uint32_t, 4> tlv_transmit{1, 1, 1, 1};  // port description, system name, description, capabilities
  std::array<uint8_t, 8> groups{0x07, 0x08, 0x10, 0x20, 0x40, 0x80, 0x00, 0x00};  // priorities per group
  uint8_t group15 = 0;
  uint8_t pfc_bitmap = 0x18;
  std::array<uint8_t, 8> bandwidth{40, 30, 10, 10, 10, 0, 0, 0};  // percent per group
};

// FCoE initialization protocol state of an FCoE function.
struct FipSettings {
  std::array<uint8_t, 3> fc_map{0x0E, 0xFC, 0x00};
  uint32_t cin_vlan = 0;
  Wwn connect_fabric{}, connect_switch{};
  uint32_t connect_flags = 0;
  uint16_t connect_vlan = 0;
  uint16_t fcf_vlan = 1002;  // VLAN the fabric's FCF announces
  Mac fcf_mac{{0x00, 0x05, 0x73, 0xa1, 0x0b, 0x20}};
};

struct QosLimits {
  uint32_t max_bytes_per_second = 0, max_ios_per_second = 0, max_bits_per_second = 0;
};

struct PhysicalPort {
  bool link_up = true;
  uint32_t speed_mbps = 10000;
  uint32_t max_speed_mbps = 10000;
  uint32_t link_down_reason = 0;
  bool enabled = true;
  uint32_t beacon = 2;     // library beacon state: 2 off, 3 on (1: not available)
  uint32_t cable_nvp = 69; // nominal velocity of propagation, percent
  DcbSettings dcb;
  bool is_10gbaset = false;
  SffData sff;
};

// One PCI function: what the management library calls a local HBA.
struct Function {
  Kind kind = Kind::kNic;
  uint32_t instance = 0;  // management-library instance number
  uint32_t port = 0;      // index into Card::ports
  uint16_t pci_function = 0;
  Wwn id{};               // identifier the library addresses it by
  Wwn wwnn{};             // FCoE only
  Wwn factory_id{}, factory_wwnn{};  // restored by RestoreWWN
  Wwn nv_id{}, nv_wwnn{};             // non-volatile (configured) names
  bool volatile_names = false;        // a volatile WWN change is in force
  Mac mac{};
  std::string ifname;
  uint32_t mtu = 1500;
  IpConfig ip;
  std::string driver_name, driver_version;
  uint32_t driver_type = 0;
  uint32_t fc_id = 0;
  Wwn fabric{};
  AttrMap hba_overrides, port_overrides;
  std::map<uint16_t, uint64_t> statistics;
  std::vector<FcTarget> fc_targets;
  std::vector<VPort> vports;
  std::vector<DriverParam> driver_params;
  std::vector<ArpEntry> arp;
  std::vector<RouteEntry> routes;
  IscsiInitiator initiator;
  std::vector<IscsiTarget> iscsi_targets;
  std::string hba_name;  // HBA API adapter name (FCoE), set by the loader
  bool in_hba_api = true;  // FCoE: listed by the HBA API library
  FipSettings fip;
  QosLimits qos;
};

// One firmware module's event-log (trace) configuration: per mode ("ram",
// "uart", "nvram", "tftp" in that order) whether it logs there, at which
// trace level (library numbering 1..11) and for which ports and functions.
struct EventLogMode {
  bool enabled = false;
  uint32_t level = 5;
  uint32_t port_mask = 0xFFFFFFFF;
  uint32_t pci_func_mask = 0xFFFFFFFF;
};
struct EventLogModule {
  std::string name;
  std::array<EventLogMode, 4> modes{};
};

struct Firmware {
  std::string operational, flash, boot, option_rom, ulp, sp, ncsi, ipl_file, uefi;
};

struct Card {
  std::string model, description, manufacturer = "Norvane", serial, hardware_version;
  std::string sub_adapter;
  uint32_t pci_bus = 0;
  uint32_t vendor_id = 0x1C7E, device_id = 0, sub_vendor_id = 0, sub_device_id = 0;
  int32_t temperature = 45, warning_temp = 85, critical_temp = 100;
  Firmware firmware;
  VpdEntries vpd, fru;
  std::vector<EventLogModule> event_log;  // empty: the card offers no event-log configuration
  std::vector<uint32_t> features;
  std::vector<PhysicalPort> ports;
  std::vector<Function> functions;
};

struct LibraryInfo {
  std::string version = "12.8.351.29";
  std::string tiro_version = "4.2.11";
  uint32_t init_status = 0;
  std::vector<DriverParam> global_driver_params;
  std::string dump_directory = "/var/crash/norvane";
  std::string target_os = "Linux";
  uint32_t dump_retention = 10;
};

// A diagnostic started through the library, until its results are read.
struct DiagRun {
  Wwn function{};
  uint32_t kind = 0;    // which start call made it (library's numbering)
  uint32_t cycles = 0;
};

struct Site {
  LibraryInfo library;
  std::vector<Card> cards;
  uint32_t next_session_id = 1;
  std::map<uint32_t, DiagRun> diagnostics;  // by handle
  uint32_t next_diag_handle = 1;
  std::vector<std::string> dump_files;
  std::set<uint32_t> registrations;  // event registrations of the management library
  uint32_t next_registration = 1;
};

}  // namespace nrvsim
