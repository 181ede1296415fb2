#include "agent/San_Catalogue.h"

#include "agent/Catalogue_Services.h"
#include "agent/San_Devices.h"
#include "data/NRV_SanScan.h"
#include "logging/Log.h"

namespace cimple {

namespace {

std::string text_of(const Property<String>& p) { return p.null ? std::string() : p.value.str(); }

std::string hex_of(const uint8_t* bytes, size_t n) {
  std::string out;
  char pair[3];
  for (size_t i = 0; i < n; ++i) {
    snprintf(pair, sizeof pair, "%02X", bytes[i]);
    out += pair;
  }
  return out;
}

template <class E>
E* hosted(San_Build& b) {
  E* e = E::create(true);
  const Host_Keys host = host_keys(b.catalogue);
  e->SystemCreationClassName.set(host.creation_class_name);
  e->SystemName.set(host.name);
  e->CreationClassName.set(E::static_meta_class.name);
  e->EnabledState.set(2);
  return e;
}

// ---- FC ---------------------------------------------------------------------

// The endpoint of one target port, made once however many units and
// initiators reach it.
Instance* fc_target_endpoint(San_Build& b, const std::string& initiator, const std::string& target) {
  auto* e = hosted<NRVTAVO_SCSIProtocolEndpoint>(b);
  e->Name.set("Target:" + target);
  e->ElementName.set("SCSI Target Endpoint:" + target);
  e->ConnectionType.set(2);  // Fibre Channel
  e->Role.set(3);            // target
  e->ProtocolIFType.set(56);
  bool fresh = false;
  Instance* endpoint = san_insert(san_map<NRVTAVO_SCSIProtocolEndpoint>(b.maps), e, fresh);
  if (endpoint != nullptr && fresh)
    san_associate<NRVTAVO_LocalHostedAccessPoint>(
        b, format_text("Local Hosted Access Point %s:%s:%s", host_keys(b.catalogue).name.c_str(),
                       initiator.c_str(), target.c_str()),
        b.catalogue.host, endpoint);
  return endpoint;
}

Logical_Unit fc_unit(const Target& t) {
  Logical_Unit u;
  u.number = static_cast<uint32_t>(t.getFcpLun() >> 48) & 0x3FFF;
  u.device_type = t.getDeviceType();
  u.vendor = t.getVendor();
  u.product = t.getProduct();
  u.revision = t.getRevision();
  u.serial = t.getSerialNumber();
  u.os_device = t.getOSDeviceName();
  u.block_size = t.getBlockLength();
  u.blocks = t.getBlockLength() ? t.getLastLogicalBlockAddress() + 1 : 0;
  // The target port and the LUN name the unit whichever initiator reaches it.
  u.identifier = format_text("%s_%016llX_%s_%s", t.getPortName().c_str(), static_cast<unsigned long long>(t.getFcpLun()),
                             u.vendor.c_str(), u.serial.c_str());
  const DeviceIdentifier& id = t.getDeviceIdentifier();
  if (id.identifierLength > 0) u.designator = hex_of(id.identifier, id.identifierLength);
  return u;
}

void build_fc(San_Build& b, const San_Anchors& anchors, const San_Scan& scan) {
  NRV_LOG(NRV_DBG, "Entering update SAN maps for FCoE ifdef");
  for (const San_Fc_Port& fc : scan.fc_ports) {
    NRV_LOG(NRV_DBG, "Creating classes for port %d.", static_cast<int>(fc.port_index));
    NRV_LOG(NRV_DBG, "Checking Number of target instance.");
    const auto found = anchors.fc_initiators.find(fc.port_name);
    const Instance* initiator = found == anchors.fc_initiators.end() ? nullptr : found->second;
    if (initiator == nullptr && !fc.targets.empty())
      NRV_LOG(NRV_DBG, "Could not find NRVTAVO_SCSIProtocolEndpoint Initiator instance.");
    const int count = static_cast<int>(fc.targets.size());
    for (int i = 0; i < count; ++i) {
      const Target& t = *fc.targets[i];
      NRV_LOG(NRV_DBG, "Creating classes for target %d of %d.", i, count);
      Instance* endpoint = fc_target_endpoint(b, fc.port_name, t.getPortName());
      NRV_LOG(NRV_DBG, "Target %d is of type %d.", i, static_cast<int>(t.getDeviceType()));
      build_logical_unit(b, fc_unit(t), Path_Kind::kFc, initiator, endpoint);
    }
  }
}

// ---- iSCSI ------------------------------------------------------------------

struct Iscsi_Port_Build {
  San_Build& b;
  const San_Iscsi_Port& port;
  const Iscsi_Anchor* anchor;  // null when the adapter catalogue has none
};

Instance* insert_fresh(Instance_Map& map, Instance* instance) {
  bool fresh = false;
  Instance* made = san_insert(map, instance, fresh);
  if (made != nullptr && !fresh) {
    NRV_LOG(NRV_CRIT, "Insert Failed : m_%s_map", made->meta_class->name);
    return nullptr;
  }
  return made;
}

template <class C>
Instance* insert_fresh(San_Build& b, C* instance) {
  return insert_fresh(san_map<C>(b.maps), instance);
}

void closed_session(Iscsi_Port_Build& p, size_t target_index, const Iscsi_Target& t, const Iscsi_Session& s) {
  auto* session = NRVTAVO_iSCSISession::create(true);
  session->InstanceID.set(format_text("NRV:iSCSI Closed Session:%d:%d:%s:%s:%d", static_cast<int>(target_index),
                                      static_cast<int>(s.number), p.port.found.port_name.c_str(), t.name.c_str(),
                                      static_cast<int>(s.tsih)));
  session->ElementName.set(iscsi_session_state_text(s.state));
  session->StatusDescriptions.set({String(iscsi_session_state_text(s.state))});
  session->TSIH.set(s.tsih);
  session->EndPointName.set(t.name);
  insert_fresh(p.b, session);
}

// An open (or opening) session: the initiator endpoint, the session, its
// statistics and connections.  Answers the initiator endpoint.
Instance* open_session(Iscsi_Port_Build& p, const Iscsi_Target& t, const Iscsi_Session& s) {
  San_Build& b = p.b;
  const std::string& port_name = p.port.found.port_name;
  const std::string initiator_name = s.initiator_name.empty() ? p.port.initiator_name : s.initiator_name;
  const unsigned long long isid = s.isid;
  const int tsih = s.tsih;

  auto* e = hosted<NRVTAVO_iSCSIProtocolEndpoint>(b);
  e->Name.set(format_text("%s i 0x%llx", initiator_name.c_str(), isid));
  NRV_LOG(NRV_DBG, "NRVTAVO_iSCSIProtocolEndpoint::Name=%s", e->Name.value.c_str());
  e->ElementName.set(e->Name.value);
  e->Identifier.set(initiator_name);
  e->ConnectionType.set(7);  // iSCSI
  e->Role.set(2);            // initiator
  bool fresh = false;
  Instance* endpoint = san_insert(san_map<NRVTAVO_iSCSIProtocolEndpoint>(b.maps), e, fresh);
  if (endpoint == nullptr) return nullptr;
  const std::string label = port_name + ":" + t.name;
  if (fresh) {
    san_associate<NRVTAVO_HostedISCSIAccesspoint>(b, label, b.catalogue.host, endpoint);
    if (p.anchor && p.anchor->controller)
      san_associate<NRVTAVO_SAPAvailableForISCSIEndpoint>(b, label, endpoint, p.anchor->controller);
  }

  auto* s_inst = NRVTAVO_iSCSISession::create(true);
  s_inst->InstanceID.set(format_text("NRV:iSCSI Session:%s:%s:%d", port_name.c_str(), t.name.c_str(), tsih));
  NRV_LOG(NRV_DBG, "NRVTAVO_iSCSISession::InstanceID=%s", s_inst->InstanceID.value.c_str());
  s_inst->ElementName.set(iscsi_session_state_text(s.state));
  s_inst->StatusDescriptions.set({String(iscsi_session_state_text(s.state))});
  s_inst->TSIH.set(s.tsih);
  s_inst->EndPointName.set(t.name);
  s_inst->CurrentConnections.set(static_cast<uint32>(s.connections.size()));
  Instance* session = insert_fresh(b, s_inst);
  if (session == nullptr) return endpoint;
  NRV_LOG(NRV_DBG, "NRVTAVO_iSCSISession::create() SUCCESFUL");
  san_associate<NRVTAVO_iSCSISessionEndpointOfNetworkPipe>(b, label, endpoint, session);

  auto* st = NRVTAVO_ISCSISessionStatistics::create(true);
  st->InstanceID.set(
      format_text("NRV:Session Statistics:%s:%s:i0x%llx:t%d", port_name.c_str(), t.name.c_str(), isid, tsih));
  st->ElementName.set(st->InstanceID.value);
  if (Instance* stats = insert_fresh(b, st); stats && p.anchor && p.anchor->controller)
    san_associate<NRVTAVO_ISCSISessionStatisticalData>(b, label, p.anchor->controller, stats);

  for (const Iscsi_Connection& c : s.connections) {
    auto* conn = NRVTAVO_iSCSIConnection::create(true);
    conn->InstanceID.set(
        format_text("NRV:iSCSI Connection:i0x%llx:%s:t%d:%d", isid, t.name.c_str(), tsih, static_cast<int>(c.cid)));
    conn->ElementName.set(format_text("%s:%u -> %s:%u", c.local_address.c_str(), c.local_port,
                                      c.remote_address.c_str(), c.remote_port));
    conn->ConnectionID.set(c.cid);
    conn->StatusDescriptions.set({String(s.state == 0 ? "CONNECTED" : iscsi_session_state_text(s.state))});
    Instance* connection = insert_fresh(b, conn);
    if (connection == nullptr) continue;
    NRV_LOG(NRV_DBG, "NRVTAVO_iSCSIConnection::create() SUCCESFUL");
    san_associate<NRVTAVO_NetworkPipeComposition>(b, label, session, connection);
    if (p.anchor && p.anchor->tcp_endpoint)
      san_associate<NRVTAVO_iSCSIConnectionEndpointOfNetworkPipe>(b, label, p.anchor->tcp_endpoint, connection);
  }
  return endpoint;
}

Instance* iscsi_target_endpoint(San_Build& b, const std::string& port_name, const Iscsi_Target& t) {
  auto* e = hosted<NRVTAVO_iSCSITargetProtocolEndpoint>(b);
  e->Name.set(format_text("%s:%s", t.name.c_str(), port_name.c_str()));
  e->ElementName.set(t.name);
  e->Identifier.set(t.name);
  e->ConnectionType.set(7);
  e->Role.set(3);
  Instance* endpoint = insert_fresh(san_map<NRVTAVO_iSCSITargetProtocolEndpoint>(b.maps), e);
  if (endpoint == nullptr) {
    NRV_LOG(NRV_CRIT, "Insert Failed : m_NRVTAVO_iSCSITargetProtocolEndpoint_map for Name = %s:%s", t.name.c_str(),
            port_name.c_str());
    return nullptr;
  }
  san_associate<NRVTAVO_iSCSILocalHostedAccessPoint>(b, t.name, b.catalogue.host, endpoint);
  return endpoint;
}

Logical_Unit iscsi_unit(const std::string& port_name, size_t target_index, size_t unit_index, const Iscsi_Target& t,
                        const Iscsi_Lun& l) {
  Logical_Unit u;
  u.number = l.lun;
  u.device_type = l.device_type;
  u.vendor = l.vendor;
  u.product = l.product;
  u.revision = l.revision;
  u.serial = l.serial;
  u.os_device = l.os_device;
  u.blocks = l.blocks;
  u.block_size = l.block_size;
  u.identifier = format_text("%s:%s:%s:%d", port_name.c_str(), t.name.c_str(), l.serial.c_str(), static_cast<int>(l.lun));
  u.designator = hex_of(l.naa.data(), l.naa.size());
  u.second_identity = format_text("%zu:%zu:%s:%s", target_index, unit_index, t.name.c_str(), port_name.c_str());
  return u;
}

void build_iscsi_port(Iscsi_Port_Build& p) {
  const std::string& port_name = p.port.found.port_name;
  if (p.port.found.status != 0) NRV_LOG(NRV_DBG, "GetiSCSITargets failed");
  NRV_LOG(NRV_DBG, "Creating classes for adapter %d and port %d.", static_cast<int>(p.port.adapter),
          static_cast<int>(p.port.port_index));
  const auto& targets = p.port.found.targets;
  for (size_t ti = 0; ti < targets.size(); ++ti) {
    const Iscsi_Target& t = targets[ti];
    const Instance* initiator = nullptr;
    for (const Iscsi_Session& s : t.sessions) {
      if (s.state == 1) {
        closed_session(p, ti, t, s);
        continue;
      }
      const Instance* endpoint = open_session(p, t, s);
      if (initiator == nullptr) initiator = endpoint;
    }
    const Instance* target = iscsi_target_endpoint(p.b, port_name, t);
    if (initiator == nullptr && !t.luns.empty())
      NRV_LOG(NRV_DBG, "Could not find NRVTAVO_iSCSIProtocolEndpoint Initiator instance.");
    for (size_t ui = 0; ui < t.luns.size(); ++ui) {
      NRV_LOG(NRV_DBG, "iSCSI Target %zu LUN %zu is of type %d.", ti, ui, static_cast<int>(t.luns[ui].device_type));
      build_logical_unit(p.b, iscsi_unit(port_name, ti, ui, t, t.luns[ui]), Path_Kind::kIscsi, initiator, target);
    }
  }
  if (p.port.found.status == 0) NRV_LOG(NRV_DBG, "GetiSCSITargets succesful");
}

}  // namespace

San_Anchors::~San_Anchors() {
  for (Instance* i : owned_) unref(i);
}

Instance* San_Anchors::keep(const Instance* instance) {
  if (instance == nullptr) return nullptr;
  Instance* copy = clone(instance);
  owned_.push_back(copy);
  return copy;
}

std::string iscsi_tcp_element_name(const std::string& port_name) { return "TCP Protocol Endpoint " + port_name; }

std::unique_ptr<San_Anchors> collect_san_anchors(ProviderAgent& agent, const San_Scan& scan) {
  auto anchors = std::make_unique<San_Anchors>();
  if (!agent.m_CIM_ComputerSystem_map.empty()) anchors->host = anchors->keep(agent.m_CIM_ComputerSystem_map[0]);
  const Instance_Map& initiators = agent.m_NRVTAVO_SCSIProtocolInitiatorEndpoint_map;
  for (size_t i = 0; i < initiators.size(); ++i) {
    const auto* e = static_cast<const NRVTAVO_SCSIProtocolInitiatorEndpoint*>(initiators[i]);
    anchors->fc_initiators.emplace(text_of(e->Name), anchors->keep(e));
  }
  if (scan.iscsi_ports.empty()) return anchors;
  std::unordered_map<std::string, const Instance*> controllers, tcp;
  const Instance_Map& cm = agent.m_NRVTAVO_SCSIProtocolController_map;
  for (size_t i = 0; i < cm.size(); ++i)
    controllers.emplace(text_of(static_cast<const NRVTAVO_SCSIProtocolController*>(cm[i])->DeviceID), cm[i]);
  const Instance_Map& tm = agent.m_NRVTAVO_TCPProtocolEndpoint_map;
  for (size_t i = 0; i < tm.size(); ++i)
    tcp.emplace(text_of(static_cast<const NRVTAVO_TCPProtocolEndpoint*>(tm[i])->ElementName), tm[i]);
  if (controllers.empty()) NRV_LOG(NRV_CRIT, "m_NRVTAVO_SCSIProtocolController_map size 0");
  for (const San_Iscsi_Port& port : scan.iscsi_ports) {
    const std::string& name = port.found.port_name;
    Iscsi_Anchor& anchor = anchors->iscsi[name];
    if (auto c = controllers.find(name); c != controllers.end()) anchor.controller = anchors->keep(c->second);
    if (auto t = tcp.find(iscsi_tcp_element_name(name)); t != tcp.end()) anchor.tcp_endpoint = anchors->keep(t->second);
  }
  return anchors;
}

void build_san_catalogue(ProviderAgent& agent, const San_Anchors& anchors, const San_Scan& scan, San_Maps& maps) {
  NRV_LOG(NRV_DBG, "PERF: updateSANMaps: Entry");
  if (anchors.host == nullptr) {
    NRV_LOG(NRV_CRIT, "Could not find the Computer System Instance");
    return;
  }
  San_Build b(agent, maps, anchors.host);
  for (const San_Iscsi_Port& port : scan.iscsi_ports) {
    const auto found = anchors.iscsi.find(port.found.port_name);
    Iscsi_Port_Build p{b, port, found == anchors.iscsi.end() ? nullptr : &found->second};
    build_iscsi_port(p);
  }
  try {
    build_fc(b, anchors, scan);
  } catch (const std::exception&) {
    NRV_LOG(NRV_ERR, "FCoE SAN refresh failed");
  }
  NRV_LOG(NRV_DBG, "PERF: updateSANMaps: cleanExit");
}

}  // namespace cimple
