// iSCSI initiator, targets, sessions and logical units of an iSCSI function,
// and the network settings of its port.  Changes (targets added, sessions
// logged in or out, portals, iSNS servers) stay in the site for the process.
#include <algorithm>

#include "sim/RmCommon.h"
#include "sim/RmRecords.h"
#include "sim/ScsiData.h"

namespace nrvsim::rm {
namespace {

// Runs f on an iSCSI function; other kinds do not offer the item.
template <class F>
RM_STATUS on_iscsi(HBA_NAME name, F&& f) {
  return on_function(name, [&](Site& s, FunctionRef r) -> RM_STATUS {
    Function& fn = at(s, r);
    if (fn.kind != Kind::kIscsi) return RM_STATUS_ITEM_NOT_OFFERED;
    return f(s, fn);
  });
}

IscsiTarget* find_target(Function& fn, const char* name) {
  const std::string wanted = get_text(name, 512);
  auto it = std::find_if(fn.iscsi_targets.begin(), fn.iscsi_targets.end(),
                         [&](const IscsiTarget& t) { return t.name == wanted; });
  return it == fn.iscsi_targets.end() ? nullptr : &*it;
}

IscsiSession* find_session(Function& fn, uint32_t id, IscsiTarget** owner) {
  for (auto& t : fn.iscsi_targets)
    for (auto& s : t.sessions)
      if (s.id == id) {
        if (owner) *owner = &t;
        return &s;
      }
  return nullptr;
}

Endpoint endpoint_of(const RM_IP_ADDRESS& a) { return Endpoint{ip_text(a), a.port}; }
bool same(const Endpoint& e, const RM_IP_ADDRESS& a) { return e.ip == ip_text(a) && e.port == a.port; }

void fill_unit_properties(const ScsiUnit& u, IscsiLunProperties& p) {
  p.lun = u.lun;
  p.deviceType = u.device_type;
  p.blocks = u.blocks;
  p.blockSize = u.block_size;
  put_text(p.vendor, sizeof p.vendor, u.vendor);
  put_text(p.product, sizeof p.product, u.product);
  put_text(p.revision, sizeof p.revision, u.revision);
  put_text(p.serialNumber, sizeof p.serialNumber, u.serial);
  put_text(p.osDeviceName, sizeof p.osDeviceName, u.os_device);
  const size_t n = std::min(u.naa.size(), sizeof p.naa);
  std::copy_n(u.naa.begin(), n, p.naa);
  p.naaLength = static_cast<HBA_UINT32>(n);
}

RM_STATUS login(Site& s, Function& fn, IscsiTarget& t, const RM_IP_ADDRESS* portal) {
  if (portal != nullptr && !ip_text(*portal).empty()) t.portal = endpoint_of(*portal);
  IscsiSession session;
  session.id = s.next_session_id++;
  session.isid = 0x400001370000ULL + session.id;
  session.tsih = static_cast<uint16_t>(0x100 + (session.id & 0xFEFF));
  session.state = 0;
  IscsiConnection conn;
  conn.cid = 0;
  conn.local = Endpoint{fn.ip.address, static_cast<uint16_t>(49152 + (session.id % 16384))};
  conn.remote = t.portal;
  session.connections.push_back(conn);
  t.sessions.push_back(std::move(session));
  return RM_STATUS_SUCCESS;
}

}  // namespace

RM_STATUS handle_Ini_GetNetworkProperties(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const Function& fn = at(s, r);
    if (fn.kind == Kind::kFcoe) return RM_STATUS_ITEM_NOT_OFFERED;
    RM_NETWORK_SETTINGS rec{};
    std::copy_n(fn.mac.begin(), 6, rec.header);
    rec.ipv4Address = ip_record(fn.ip.address, 0);
    rec.subnetMask = ip_record(fn.ip.netmask, 0);
    rec.gateway = ip_record(fn.ip.gateway, 0);
    rec.vlanId = static_cast<HBA_UINT8>(fn.ip.vlan);
    rec.vlanEnabled = fn.ip.vlan != 0 ? 1 : 0;
    return deliver_bytes(&rec, sizeof rec, buffer, size);
  });
}

RM_STATUS handle_Ini_SetNetworkProperties(HBA_NAME a1, const RM_NETWORK_SETTINGS* rec) {
  if (rec == nullptr) return kStatusBadArgument;
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    Function& fn = at(s, r);
    if (fn.kind == Kind::kFcoe) return RM_STATUS_ITEM_NOT_OFFERED;
    const std::string addr = ip_text(rec->ipv4Address);
    const std::string mask = ip_text(rec->subnetMask);
    if (addr.empty() || mask.empty()) return kStatusBadValue;
    fn.ip.address = addr;
    fn.ip.netmask = mask;
    fn.ip.gateway = ip_text(rec->gateway);
    fn.ip.vlan = rec->vlanEnabled ? rec->vlanId : 0;
    fn.ip.dhcp = false;
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_GetInitiatorProperties(HBA_NAME a1, RM_ISCSI_INITIATOR_PROPERTIES* props,
                                              RM_ISCSI_INITIATOR_EXTRA* extra) {
  if (props == nullptr) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    std::memset(props, 0, sizeof *props);
    put_text(props->initiatorName, sizeof props->initiatorName, fn.initiator.name);
    put_text(props->initiatorAlias, sizeof props->initiatorAlias, fn.initiator.alias);
    props->loginOptions.immediateData = 1;
    props->auth.method = fn.initiator.auth_method;
    put_text(props->auth.initiatorChapName, sizeof props->auth.initiatorChapName, fn.initiator.chap_name);
    props->auth.hasInitiatorChapName = fn.initiator.chap_name.empty() ? 0 : 1;
    if (extra) std::memset(extra, 0, sizeof *extra);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_SetInitiatorProperties(HBA_NAME a1, const RM_ISCSI_INITIATOR_PROPERTIES* props) {
  if (props == nullptr) return kStatusBadArgument;
  const std::string name = get_text(props->initiatorName, sizeof props->initiatorName);
  if (name.empty()) return kStatusBadValue;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    fn.initiator.name = name;
    fn.initiator.alias = get_text(props->initiatorAlias, sizeof props->initiatorAlias);
    fn.initiator.auth_method = props->auth.method;
    if (props->auth.hasInitiatorChapName)
      fn.initiator.chap_name = get_text(props->auth.initiatorChapName, sizeof props->auth.initiatorChapName);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_GetTargets(HBA_NAME a1, HBA_UINT8 /*flag*/, void* buffer, HBA_UINT32* size) {
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    std::vector<IscsiTargetEntry> list(fn.iscsi_targets.size());
    for (size_t i = 0; i < list.size(); ++i) {
      const IscsiTarget& t = fn.iscsi_targets[i];
      IscsiTargetEntry& e = list[i];
      std::memset(&e, 0, sizeof e);
      put_text(e.name, sizeof e.name, t.name);
      e.flags = static_cast<HBA_UINT8>((t.sessions.empty() ? 0 : kTargetHasSessions) | (t.boot ? kTargetIsBoot : 0));
      e.authMethod = static_cast<HBA_UINT8>(t.auth_method);
      e.portalPort = t.portal.port;
    }
    return deliver_list(list, kTargetListHeader, buffer, size);
  });
}

RM_STATUS handle_iSCSI_GetSessions(HBA_NAME a1, const char* target, void* buffer, HBA_UINT32* size) {
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    IscsiTarget* t = find_target(fn, target);
    if (t == nullptr) return kStatusNotFound;
    std::vector<IscsiSessionEntry> list(t->sessions.size());
    for (size_t i = 0; i < list.size(); ++i) {
      std::memset(&list[i], 0, sizeof list[i]);
      list[i].isid = t->sessions[i].isid;
      list[i].tsih = t->sessions[i].tsih;
      list[i].sessionId = t->sessions[i].id;
    }
    return deliver_list(list, kSessionListHeader, buffer, size);
  });
}

RM_STATUS handle_iSCSI_GetSessionInfo(HBA_NAME a1, const void* entry, void* buffer, HBA_UINT32* size) {
  if (entry == nullptr) return kStatusBadArgument;
  IscsiSessionEntry wanted;
  std::memcpy(&wanted, entry, sizeof wanted);
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    IscsiTarget* t = nullptr;
    IscsiSession* session = find_session(fn, wanted.sessionId, &t);
    if (session == nullptr) return kStatusNotFound;
    IscsiSessionInfo info;
    std::memset(&info, 0, sizeof info);
    info.isid = session->isid;
    info.tsih = session->tsih;
    info.state = session->state;
    info.sessionId = session->id;
    put_text(info.targetName, sizeof info.targetName, t->name);
    put_text(info.initiatorName, sizeof info.initiatorName, fn.initiator.name);
    const size_t n = std::min<size_t>(session->connections.size(), 4);
    info.connectionCount = static_cast<HBA_UINT16>(n);
    for (size_t i = 0; i < n; ++i) {
      const IscsiConnection& c = session->connections[i];
      info.connections[i].cid = c.cid;
      info.connections[i].state = 0;
      info.connections[i].local = ip_record(c.local.ip, c.local.port);
      info.connections[i].remote = ip_record(c.remote.ip, c.remote.port);
    }
    return deliver_bytes(&info, sizeof info, buffer, size);
  });
}

RM_STATUS handle_iSCSI_GetLuns(HBA_NAME a1, const char* target, void* buffer, HBA_UINT32* size) {
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    IscsiTarget* t = find_target(fn, target);
    if (t == nullptr) return kStatusNotFound;
    std::vector<IscsiLunEntry> list(t->luns.size());
    for (size_t i = 0; i < list.size(); ++i) {
      std::memset(&list[i], 0, sizeof list[i]);
      list[i].lun = t->luns[i].lun;
      list[i].deviceType = t->luns[i].device_type;
    }
    return deliver_list(list, kLunListHeader, buffer, size);
  });
}

RM_STATUS handle_iSCSI_GetLunProperties(HBA_NAME a1, const char* target, HBA_UINT32 lun, void* buffer,
                                        HBA_UINT32* size) {
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    IscsiTarget* t = find_target(fn, target);
    if (t == nullptr) return kStatusNotFound;
    for (const ScsiUnit& u : t->luns) {
      if (u.lun != lun) continue;
      IscsiLunProperties p;
      std::memset(&p, 0, sizeof p);
      fill_unit_properties(u, p);
      return deliver_bytes(&p, sizeof p, buffer, size);
    }
    return kStatusNotFound;
  });
}

RM_STATUS handle_iSCSI_AddTarget(HBA_NAME a1, HBA_UINT32 do_login, const char* target, const RM_IP_ADDRESS* portal,
                                 const RM_ISCSI_LOGIN_OPTIONS*, const RM_ISCSI_AUTH* auth) {
  const std::string name = get_text(target, 512);
  if (name.empty() || name.size() > 223 || portal == nullptr) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site& s, Function& fn) -> RM_STATUS {
    IscsiTarget* t = find_target(fn, target);
    if (t == nullptr) {
      IscsiTarget fresh;
      fresh.name = name;
      fresh.portal = endpoint_of(*portal);
      if (auth) fresh.auth_method = auth->method;
      fn.iscsi_targets.push_back(std::move(fresh));
      t = &fn.iscsi_targets.back();
    } else {
      t->portal = endpoint_of(*portal);
    }
    return do_login ? login(s, fn, *t, portal) : RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_RemoveTarget(HBA_NAME a1, const char* target) {
  const std::string name = get_text(target, 512);
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    auto it = std::find_if(fn.iscsi_targets.begin(), fn.iscsi_targets.end(),
                           [&](const IscsiTarget& t) { return t.name == name; });
    if (it == fn.iscsi_targets.end()) return kStatusNotFound;
    fn.iscsi_targets.erase(it);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_TargetLogin(HBA_NAME a1, const char* target, HBA_UINT32, const RM_IP_ADDRESS* portal,
                                   const RM_ISCSI_LOGIN_OPTIONS*, const RM_ISCSI_AUTH*) {
  return on_iscsi(a1, [&](Site& s, Function& fn) -> RM_STATUS {
    IscsiTarget* t = find_target(fn, target);
    if (t == nullptr) return kStatusNotFound;
    return login(s, fn, *t, portal);
  });
}

// Without a session record every session of the target is closed.
RM_STATUS handle_iSCSI_TargetLogout(HBA_NAME a1, const char* target, const RM_ISCSI_SESSION_ID* id) {
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    IscsiTarget* t = find_target(fn, target);
    if (t == nullptr) return kStatusNotFound;
    if (id == nullptr) {
      if (t->sessions.empty()) return kStatusNotFound;
      t->sessions.clear();
      return RM_STATUS_SUCCESS;
    }
    auto it = std::find_if(t->sessions.begin(), t->sessions.end(),
                           [&](const IscsiSession& s) { return s.id == id->sessionId; });
    if (it == t->sessions.end()) return kStatusNotFound;
    t->sessions.erase(it);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_AddSendTargetPortal(HBA_NAME a1, const RM_IP_ADDRESS* portal, HBA_UINT32,
                                           RM_ISCSI_LOGIN_OPTIONS*, const RM_ISCSI_AUTH*) {
  if (portal == nullptr || ip_text(*portal).empty()) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    auto& list = fn.initiator.portals;
    if (std::any_of(list.begin(), list.end(), [&](const Endpoint& e) { return same(e, *portal); }))
      return kStatusBadValue;
    list.push_back(endpoint_of(*portal));
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_RemoveSendTargetPortal(HBA_NAME a1, const RM_IP_ADDRESS* portal) {
  if (portal == nullptr) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    auto& list = fn.initiator.portals;
    auto it = std::find_if(list.begin(), list.end(), [&](const Endpoint& e) { return same(e, *portal); });
    if (it == list.end()) return kStatusNotFound;
    list.erase(it);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_AddiSNSServer(HBA_NAME a1, const RM_IP_ADDRESS* server) {
  if (server == nullptr || ip_text(*server).empty()) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    auto& list = fn.initiator.isns;
    if (std::any_of(list.begin(), list.end(), [&](const Endpoint& e) { return same(e, *server); }))
      return kStatusBadValue;
    list.push_back(endpoint_of(*server));
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_RemoveiSNSServer(HBA_NAME a1, const RM_IP_ADDRESS* server) {
  if (server == nullptr) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    auto& list = fn.initiator.isns;
    auto it = std::find_if(list.begin(), list.end(), [&](const Endpoint& e) { return same(e, *server); });
    if (it == list.end()) return kStatusNotFound;
    list.erase(it);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_GetiSNSServers(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    std::vector<RM_IP_ADDRESS> list;
    for (const Endpoint& e : fn.initiator.isns) list.push_back(ip_record(e.ip, e.port));
    return deliver_list(list, sizeof(RM_TABLE_HEADER), buffer, size);
  });
}

RM_STATUS handle_iSCSI_SetiSNSState(HBA_NAME a1, HBA_UINT32 enable) {
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    fn.initiator.isns_enabled = enable != 0;
    return RM_STATUS_SUCCESS;
  });
}

}  // namespace nrvsim::rm
