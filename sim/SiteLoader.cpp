// Site description reader.  Every field is checked for its type; a bad field
// is reported with its JSON path so a hand-edited site is easy to mend.
#include "sim/SiteLoader.h"

#include <algorithm>
#include <fstream>
#include <set>
#include <sstream>

#include <nlohmann/json.hpp>

#include "sim/ScsiData.h"
#include "sim/SiteJson.h"

namespace nrvsim {
namespace {

using nlohmann::json;

Endpoint read_endpoint(const Node& n) {  // "10.0.0.1:3260" or "[fe80::1]:3260"
  const std::string s = n.text();
  const size_t colon = s.rfind(':');
  if (colon == std::string::npos || colon + 1 == s.size()) n.fail("expected address:port");
  Endpoint e;
  e.ip = s.substr(0, colon);
  if (e.ip.size() > 2 && e.ip.front() == '[' && e.ip.back() == ']') e.ip = e.ip.substr(1, e.ip.size() - 2);
  try {
    const unsigned long port = std::stoul(s.substr(colon + 1));
    if (port > 65535) n.fail("port out of range");
    e.port = static_cast<uint16_t>(port);
  } catch (const std::logic_error&) {
    n.fail("expected address:port");
  }
  return e;
}

AttrMap read_attrs(const Node& n) {
  AttrMap out;
  if (!n.j.is_object()) n.fail("must be an object of attribute number to value");
  for (const auto& [key, value] : n.j.items()) {
    Node v{value, n.path + "." + key};
    unsigned long num = 0;
    try {
      num = std::stoul(key, nullptr, 0);
    } catch (const std::exception&) {
      v.fail("key is not an attribute number");
    }
    if (num > UINT16_MAX) v.fail("attribute number out of range");
    if (value.is_string()) {
      out[static_cast<uint16_t>(num)] = value.get<std::string>();
    } else {
      const uint64_t x = v.number();
      if (x > UINT32_MAX) out[static_cast<uint16_t>(num)] = x;
      else out[static_cast<uint16_t>(num)] = static_cast<uint32_t>(x);
    }
  }
  return out;
}

VpdEntries read_vpd(const Node& parent, const char* key) {
  VpdEntries out;
  for (const Node& e : parent.items(key)) {
    if (!e.j.is_array() || e.j.size() != 2) e.fail("must be a [keyword, value] pair");
    const std::string kw = e.at(size_t{0}).text();
    if (kw.empty() || kw.size() > 3) e.fail("keyword must have 1 to 3 characters");
    out.emplace_back(kw, e.at(size_t{1}).text());
  }
  return out;
}

ScsiUnit read_unit(const Node& n, uint32_t default_lun) {
  ScsiUnit u;
  u.lun = n.u32("lun", default_lun);
  // The LUN travels in the 8-byte SAM LUN field, single level: peripheral
  // device addressing below 256, flat space addressing up to 16383.
  if (u.lun > kMaxFlatSpaceLun) n.at("lun").fail("LUN must be 0 to 16383 (SAM flat space addressing)");
  const uint32_t type = n.u32("type", 0);
  if (type > 0x1F) n.at("type").fail("peripheral device type must be 0 to 31");
  u.device_type = static_cast<uint8_t>(type);
  u.vendor = n.str("vendor", "NORVANE");
  u.product = n.str("product", "SIM DISK");
  u.revision = n.str("revision", "0001");
  u.serial = n.str("serial", "");
  u.blocks = n.u64("blocks", type == 0 ? 2097152 : 0);
  u.block_size = n.u32("block_size", 512);
  u.os_device = n.str("os_device", "");
  u.oas = n.boolean("oas", false);
  if (n.has("naa")) {
    const std::string hex = n.at("naa").text();
    if (hex.size() != 16 && hex.size() != 32) n.at("naa").fail("NAA identifier must be 16 or 32 hex digits");
    for (size_t i = 0; i < hex.size(); i += 2) {
      try {
        u.naa.push_back(static_cast<uint8_t>(std::stoul(hex.substr(i, 2), nullptr, 16)));
      } catch (const std::exception&) {
        n.at("naa").fail("not hexadecimal");
      }
    }
  }
  return u;
}

std::vector<ScsiUnit> read_units(const Node& n) {
  std::vector<ScsiUnit> out;
  std::set<uint32_t> seen;
  uint32_t next = 0;
  for (const Node& u : n.items("luns")) {
    out.push_back(read_unit(u, next));
    if (!seen.insert(out.back().lun).second) u.fail("duplicate LUN");
    next = out.back().lun + 1;
  }
  return out;
}

std::vector<DriverParam> read_params(const Node& n, const char* key) {
  std::vector<DriverParam> out;
  for (const Node& p : n.items(key)) {
    DriverParam d;
    d.name = p.at("name").text();
    if (d.name.size() > 31) p.at("name").fail("at most 31 characters");
    d.help = p.str("help");
    if (d.help.size() > 43) p.at("help").fail("at most 43 characters");
    d.min = p.u32("min", 0);
    d.max = p.u32("max", 0xFFFFFFFF);
    d.def = p.u32("default", d.min);
    d.current = p.u32("current", d.def);
    d.exported = p.u32("export", 1);
    d.changeable = p.u32("changeable", 1);
    if (d.min > d.max || d.def < d.min || d.def > d.max || d.current < d.min || d.current > d.max)
      p.fail("needs min <= default, current <= max");
    out.push_back(std::move(d));
  }
  return out;
}

std::array<uint16_t, 4> read_thresholds(const Node& n, const char* key, std::array<uint16_t, 4> def) {
  if (!n.has(key)) return def;
  Node t = n.at(key);
  if (!t.j.is_array() || t.j.size() != 4) t.fail("must list high alarm, low alarm, high warning, low warning");
  std::array<uint16_t, 4> out{};
  for (size_t i = 0; i < 4; ++i) {
    const uint64_t v = t.at(i).number();
    if (v > UINT16_MAX) t.at(i).fail("out of range");
    out[i] = static_cast<uint16_t>(v);
  }
  return out;
}

SffData read_sff(const Node& n) {
  SffData s;
  s.present = true;
  s.vendor = n.str("vendor", "NORVANE");
  s.part_number = n.str("part_number", "");
  s.revision = n.str("revision", "A");
  s.serial = n.str("serial", "");
  s.date_code = n.str("date_code", "250101");
  if (s.date_code.size() != 6) n.at("date_code").fail("must be six digits YYMMDD");
  if (n.has("oui")) {
    Node o = n.at("oui");
    const std::string t = o.text();
    if (t.size() != 8) o.fail("must look like 00:90:fa");
    for (size_t i = 0; i < 3; ++i) {
      try {
        s.oui[i] = static_cast<uint8_t>(std::stoul(t.substr(i * 3, 2), nullptr, 16));
      } catch (const std::exception&) {
        o.fail("not hexadecimal");
      }
    }
  }
  s.identifier = static_cast<uint8_t>(n.u32("identifier", 3));
  s.ext_identifier = static_cast<uint8_t>(n.u32("ext_identifier", 4));
  s.connector = static_cast<uint8_t>(n.u32("connector", 7));
  s.wavelength = n.u16("wavelength", 850);
  s.diagnostics = n.has("diagnostics");
  if (s.diagnostics) {
    Node d = n.at("diagnostics");
    auto f = [&](const char* k, float def) { return d.has(k) ? static_cast<float>(d.at(k).real()) : def; };
    s.temperature = f("temperature", 35.0f);
    s.vcc = f("vcc", 3.3f);
    s.tx_bias = f("tx_bias_ma", 6.5f);
    s.tx_power = f("tx_power_mw", 0.55f);
    s.rx_power = f("rx_power_mw", 0.48f);
    s.temp_thresholds = read_thresholds(d, "temperature_thresholds", {0x5000, 0xFB00, 0x4B00, 0x0000});
    s.vcc_thresholds = read_thresholds(d, "vcc_thresholds", {37000, 29000, 36000, 30000});
    s.bias_thresholds = read_thresholds(d, "bias_thresholds", {7500, 500, 7000, 1000});
    s.tx_thresholds = read_thresholds(d, "tx_power_thresholds", {12589, 1000, 10000, 1259});
    s.rx_thresholds = read_thresholds(d, "rx_power_thresholds", {15849, 100, 12589, 158});
  }
  return s;
}

// "event_log": [{"module": "FCoE", "modes": {"ram": {"level": 5, "port_mask": 3,
// "pci_func_mask": "0x3f"}, "uart": {"level": 9}}}, ...]; absent modes log nowhere.
std::vector<EventLogModule> read_event_log(const Node& n) {
  static constexpr const char* kModes[] = {"ram", "uart", "nvram", "tftp"};
  std::vector<EventLogModule> out;
  for (const Node& m : n.items("event_log")) {
    EventLogModule module;
    module.name = m.at("module").text();
    if (module.name.empty() || module.name.size() > 31) m.at("module").fail("1 to 31 characters");
    if (m.has("modes")) {
      const Node modes = m.at("modes");
      if (!modes.j.is_object()) modes.fail("must map mode names to their settings");
      for (auto it = modes.j.begin(); it != modes.j.end(); ++it) {
        const auto known = std::find(std::begin(kModes), std::end(kModes), it.key());
        if (known == std::end(kModes)) modes.at(it.key().c_str()).fail("not one of ram, uart, nvram, tftp");
        const Node mode = modes.at(it.key().c_str());
        EventLogMode& setting = module.modes[static_cast<size_t>(known - std::begin(kModes))];
        setting.enabled = true;
        setting.level = mode.u32("level", 5);
        if (setting.level < 1 || setting.level > 11) mode.at("level").fail("a trace level 1 to 11");
        setting.port_mask = mode.u32("port_mask", 0xFFFFFFFF);
        setting.pci_func_mask = mode.u32("pci_func_mask", 0xFFFFFFFF);
      }
    }
    out.push_back(std::move(module));
  }
  return out;
}

Kind read_kind(const Node& n) {
  const std::string k = n.text();
  if (k == "nic") return Kind::kNic;
  if (k == "iscsi") return Kind::kIscsi;
  if (k == "fcoe") return Kind::kFcoe;
  n.fail("must be \"nic\", \"iscsi\" or \"fcoe\"");
}

IpConfig read_ip(const Node& n) {
  IpConfig ip;
  ip.address = n.str("ipv4");
  ip.netmask = n.str("netmask", ip.address.empty() ? "" : "255.255.255.0");
  ip.gateway = n.str("gateway");
  ip.ipv6_gateway = n.str("ipv6_gateway");
  ip.dhcp = n.boolean("dhcp", false);
  ip.vlan = n.u16("vlan", 0);
  return ip;
}

LoginOptions read_login(const Node& n) {
  LoginOptions o;
  auto flag = [&](const char* key, uint8_t def) {
    const uint32_t v = n.u32(key, def);
    if (v > 1) n.at(key).fail("must be 0 or 1");
    return static_cast<uint8_t>(v);
  };
  o.immediate_data = flag("immediate_data", 1);
  o.header_digest = flag("header_digest", 0);
  o.data_digest = flag("data_digest", 0);
  return o;
}

Authentication read_auth(const Node& n) {
  Authentication a;
  a.method = n.u32("auth", 0);
  if (a.method > 2) n.at("auth").fail("must be 0 (none), 1 (one-way CHAP) or 2 (mutual CHAP)");
  a.initiator_chap = n.str("chap_name");
  a.initiator_secret = n.str("chap_secret");
  a.target_chap = n.str("target_chap_name");
  a.target_secret = n.str("target_chap_secret");
  return a;
}

IscsiTarget read_iscsi_target(const Node& n) {
  IscsiTarget t;
  t.name = n.at("name").text();
  if (t.name.empty() || t.name.size() > 223) n.at("name").fail("iSCSI name must have 1 to 223 characters");
  t.alias = n.str("alias");
  t.portal = read_endpoint(n.at("portal"));
  t.login = read_login(n);
  t.auth = read_auth(n);
  t.extended_timeout = n.u32("extended_timeout", 30);
  t.boot = n.boolean("boot", false);
  for (const Node& s : n.items("sessions")) {
    IscsiSession session;
    session.isid = s.u64("isid", 0x400001370000ULL);
    session.tsih = s.u16("tsih", 1);
    session.state = s.u32("state", 0);
    uint16_t cid = 0;
    for (const Node& c : s.items("connections")) {
      IscsiConnection conn;
      conn.cid = c.u16("cid", cid);
      conn.local = read_endpoint(c.at("local"));
      conn.remote = c.has("remote") ? read_endpoint(c.at("remote")) : t.portal;
      cid = static_cast<uint16_t>(conn.cid + 1);
      session.connections.push_back(conn);
    }
    t.sessions.push_back(std::move(session));
  }
  t.luns = read_units(n);
  return t;
}

Function read_function(const Node& n, const Card& card) {
  Function f;
  f.kind = read_kind(n.at("kind"));
  f.port = n.u32("port", 0);
  if (f.port >= card.ports.size()) n.at("port").fail("no such physical port on the card");
  f.pci_function = n.u16("pci_function", 0);
  f.mac = n.mac("mac");
  if (f.kind == Kind::kFcoe) {
    f.id = n.wwn("wwpn");
    f.wwnn = n.has("wwnn") ? n.wwn("wwnn") : f.id;
    f.fc_id = n.u32("fc_id", 0);
    f.fabric = n.has("fabric") ? n.wwn("fabric") : Wwn{};
    f.in_hba_api = n.boolean("hba_api", true);
    f.fip.fcf_vlan = n.u16("fcoe_vlan", 1002);
    if (f.fip.fcf_vlan == 0 || f.fip.fcf_vlan > 4094) n.at("fcoe_vlan").fail("VLAN must be 1 to 4094");
  } else {
    f.id = n.has("identifier") ? n.wwn("identifier") : wwn_from_mac(f.mac);
  }
  f.factory_id = f.id;
  f.factory_wwnn = f.wwnn;
  f.nv_id = f.id;
  f.nv_wwnn = f.wwnn;
  f.ifname = n.str("ifname");
  f.mtu = n.u32("mtu", 1500);
  f.ip = read_ip(n);
  if (n.has("driver")) {
    Node d = n.at("driver");
    f.driver_name = d.str("name");
    f.driver_version = d.str("version");
    f.driver_type = d.u32("type", 0);
  }
  for (const Node& a : n.items("arp")) f.arp.push_back(ArpEntry{a.at("ip").text(), a.mac("mac")});
  for (const Node& r : n.items("routes"))
    f.routes.push_back(RouteEntry{r.at("destination").text(), r.str("netmask", "255.255.255.0"), r.str("gateway")});
  if (n.has("hba_attributes")) f.hba_overrides = read_attrs(n.at("hba_attributes"));
  if (n.has("port_attributes")) f.port_overrides = read_attrs(n.at("port_attributes"));
  if (n.has("statistics")) {
    for (const auto& [num, value] : read_attrs(n.at("statistics"))) {
      if (const auto* v = std::get_if<uint32_t>(&value)) f.statistics[num] = *v;
      else if (const auto* w = std::get_if<uint64_t>(&value)) f.statistics[num] = *w;
      else n.at("statistics").fail("statistics must be numbers");
    }
  }
  if (f.kind == Kind::kFcoe) {
    uint32_t scsi_target = 0;
    std::set<Wwn> target_ports;
    for (const Node& t : n.items("targets")) {
      FcTarget target;
      target.wwpn = t.wwn("wwpn");
      if (!target_ports.insert(target.wwpn).second) t.at("wwpn").fail("two targets with one WWPN on a port");
      target.wwnn = t.has("wwnn") ? t.wwn("wwnn") : target.wwpn;
      target.fc_id = t.u32("fc_id", 0);
      target.scsi_target = t.u32("scsi_target", scsi_target);
      scsi_target = target.scsi_target + 1;
      target.luns = read_units(t);
      f.fc_targets.push_back(std::move(target));
    }
    for (const Node& v : n.items("vports")) {
      VPort vp;
      vp.wwpn = v.wwn("wwpn");
      vp.wwnn = v.has("wwnn") ? v.wwn("wwnn") : vp.wwpn;
      vp.fc_id = v.u32("fc_id", 0);
      vp.name = v.str("name");
      vp.vm_name = v.str("vm");
      f.vports.push_back(std::move(vp));
    }
    f.driver_params = read_params(n, "driver_params");
  } else if (n.has("targets") || n.has("vports")) {
    n.fail("only FCoE functions have FC targets and virtual ports");
  }
  if (f.kind == Kind::kIscsi) {
    if (n.has("initiator")) {
      Node i = n.at("initiator");
      f.initiator.name = i.at("name").text();
      f.initiator.alias = i.str("alias");
      f.initiator.login = read_login(i);
      f.initiator.auth = read_auth(i);
      for (const Node& p : i.items("send_target_portals"))
        f.initiator.portals.push_back(IscsiPortal{read_endpoint(p), f.initiator.login, {}});
      for (const Node& p : i.items("isns_servers")) f.initiator.isns.push_back(read_endpoint(p));
      f.initiator.isns_enabled = i.boolean("isns_enabled", !f.initiator.isns.empty());
    }
    for (const Node& t : n.items("iscsi_targets")) f.iscsi_targets.push_back(read_iscsi_target(t));
  } else if (n.has("iscsi_targets") || n.has("initiator")) {
    n.fail("only iSCSI functions have an initiator and iSCSI targets");
  }
  return f;
}

Card read_card(const Node& n) {
  Card c;
  c.model = n.at("model").text();
  c.description = n.str("description", c.model);
  c.manufacturer = n.str("manufacturer", "Norvane");
  c.serial = n.at("serial").text();
  c.hardware_version = n.str("hardware_version", "1");
  c.sub_adapter = n.str("sub_adapter");
  c.pci_bus = n.u32("pci_bus", 0);
  c.vendor_id = n.u32("vendor_id", 0x1C7E);
  c.device_id = n.u32("device_id", 0x0710);
  c.sub_vendor_id = n.u32("sub_vendor_id", c.vendor_id);
  c.sub_device_id = n.u32("sub_device_id", 0xE712);
  c.temperature = n.i32("temperature", 45);
  c.warning_temp = n.i32("warning_temperature", 85);
  c.critical_temp = n.i32("critical_temperature", 100);
  if (n.has("firmware")) {
    Node fw = n.at("firmware");
    c.firmware.operational = fw.str("operational");
    c.firmware.flash = fw.str("flash", c.firmware.operational);
    c.firmware.boot = fw.str("boot");
    c.firmware.option_rom = fw.str("option_rom", c.firmware.boot);
    c.firmware.ulp = fw.str("ulp", c.firmware.operational);
    c.firmware.sp = fw.str("sp", c.firmware.operational);
    c.firmware.ncsi = fw.str("ncsi");
    c.firmware.ipl_file = fw.str("ipl_file");
    c.firmware.uefi = fw.str("uefi");
  }
  c.vpd = read_vpd(n, "vpd");
  c.fru = read_vpd(n, "fru");
  c.event_log = read_event_log(n);
  for (const Node& f : n.items("features")) {
    const uint64_t v = f.number();
    if (v > UINT32_MAX) f.fail("out of range");
    c.features.push_back(static_cast<uint32_t>(v));
  }
  for (const Node& p : n.items("ports")) {
    PhysicalPort port;
    port.link_up = p.boolean("link_up", true);
    port.speed_mbps = p.u32("speed_mbps", 10000);
    port.max_speed_mbps = p.u32("max_speed_mbps", port.speed_mbps);
    port.link_down_reason = p.u32("link_down_reason", 0);
    port.enabled = p.boolean("enabled", true);
    port.is_10gbaset = p.boolean("10gbaset", false);
    port.beacon = p.boolean("beacon_available", true) ? 2 : 1;
    if (p.has("sff")) port.sff = read_sff(p.at("sff"));
    c.ports.push_back(std::move(port));
  }
  if (c.ports.empty()) n.fail("a card needs at least one entry in \"ports\"");
  for (const Node& f : n.items("functions")) c.functions.push_back(read_function(f, c));
  if (c.functions.empty()) n.fail("a card needs at least one entry in \"functions\"");
  return c;
}

FaultRule read_fault(const Node& n) {
  FaultRule r;
  r.function = n.at("function").text();
  if (n.has("status")) r.status = n.u32("status", 0);
  r.first_call = n.u64("call", 0);
  r.count = n.u64("count", 1);
  if (n.has("adapter")) r.adapter = n.wwn("adapter");
  if (n.has("lun")) r.lun = n.u32("lun", 0);
  r.delay_ms = n.u32("delay_ms", 0);
  if (!r.status && r.delay_ms == 0) n.fail("a fault needs \"status\" or \"delay_ms\"");
  if (n.has("call") && r.first_call == 0) n.at("call").fail("calls are counted from 1");
  return r;
}

// Numbers what the file leaves implicit and refuses identifiers that would
// make two functions indistinguishable to the module.
void finish(Site& site, const Node& root) {
  std::set<Wwn> ids;
  uint32_t next_instance = 0;
  uint32_t hba_index = 0;
  for (size_t ci = 0; ci < site.cards.size(); ++ci) {
    Card& card = site.cards[ci];
    for (size_t fi = 0; fi < card.functions.size(); ++fi) {
      Function& f = card.functions[fi];
      const Node where{root.j, root.path + ".cards[" + std::to_string(ci) + "].functions[" + std::to_string(fi) + "]"};
      f.instance = next_instance++;
      if (!ids.insert(f.id).second) where.fail("identifier " + wwn_plain(f.id) + " is used twice");
      for (auto& t : f.iscsi_targets)
        for (auto& session : t.sessions) session.id = site.next_session_id++;
      if (f.kind == Kind::kFcoe && f.in_hba_api) {
        f.hba_name = "com.norvane-" + card.model + "-" + std::to_string(hba_index++);
      }
    }
  }
}

}  // namespace

LoadResult load_site_text(const std::string& text, const std::string& origin) {
  LoadResult result;
  try {
    const json doc = json::parse(text);
    const Node root{doc, "$"};
    if (!doc.is_object()) root.fail("a site is a JSON object");
    LoadedSite loaded;
    if (root.has("library")) {
      Node lib = root.at("library");
      loaded.site.library.version = lib.str("version", loaded.site.library.version);
      loaded.site.library.tiro_version = lib.str("tiro_version", loaded.site.library.tiro_version);
      loaded.site.library.init_status = lib.u32("init_status", 0);
      loaded.site.library.global_driver_params = read_params(lib, "driver_params");
      loaded.site.library.dump_directory = lib.str("dump_directory", loaded.site.library.dump_directory);
      loaded.site.library.dump_retention = lib.u32("dump_retention", loaded.site.library.dump_retention);
      loaded.site.library.target_os = lib.str("target_os", loaded.site.library.target_os);
    }
    for (const Node& c : root.items("cards")) loaded.site.cards.push_back(read_card(c));
    for (const Node& f : root.items("faults")) loaded.faults.push_back(read_fault(f));
    finish(loaded.site, root);
    result.loaded = std::move(loaded);
    result.ok = true;
  } catch (const SiteError& e) {
    result.error = origin + ": " + e.what();
  } catch (const json::exception& e) {
    result.error = origin + ": " + e.what();
  } catch (const std::exception& e) {
    result.error = origin + ": " + e.what();
  }
  return result;
}

LoadResult load_site_file(const std::string& path) {
  std::ifstream in(path);
  if (!in) {
    LoadResult r;
    r.error = path + ": cannot open the site file";
    return r;
  }
  std::ostringstream text;
  text << in.rdbuf();
  return load_site_text(text.str(), path);
}

}  // namespace nrvsim
