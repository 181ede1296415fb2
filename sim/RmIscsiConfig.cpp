// iSCSI function configuration: the port's network settings, the initiator
// properties, send-target portals, iSNS servers and ping.
#include <algorithm>

#include <arpa/inet.h>

#include "sim/RmIscsiCommon.h"

namespace nrvsim::rm {
namespace {

std::vector<IscsiPortal>::iterator find_portal(Function& fn, const RM_IP_ADDRESS& address) {
  auto& list = fn.initiator.portals;
  return std::find_if(list.begin(), list.end(),
                      [&](const IscsiPortal& p) { return same_endpoint(p.address, address); });
}

// True when `ip` lies in the IPv4 subnet of `address`/`mask`.
bool same_subnet(const std::string& ip, const std::string& address, const std::string& mask) {
  in_addr a{}, b{}, m{};
  if (inet_pton(AF_INET, ip.c_str(), &a) != 1 || inet_pton(AF_INET, address.c_str(), &b) != 1 ||
      inet_pton(AF_INET, mask.c_str(), &m) != 1)
    return false;
  return (a.s_addr & m.s_addr) == (b.s_addr & m.s_addr);
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
    put_login(fn.initiator.login, props->loginOptions);
    put_auth(fn.initiator.auth, props->auth);
    if (extra) std::memset(extra, 0, sizeof *extra);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_SetInitiatorProperties(HBA_NAME a1, const RM_ISCSI_INITIATOR_PROPERTIES* props) {
  if (props == nullptr) return kStatusBadArgument;
  const std::string name = get_text(props->initiatorName, sizeof props->initiatorName);
  if (name.empty() || props->auth.method > 2) return kStatusBadValue;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    fn.initiator.name = name;
    fn.initiator.alias = get_text(props->initiatorAlias, sizeof props->initiatorAlias);
    fn.initiator.login = login_of(props->loginOptions);
    fn.initiator.auth = auth_of(props->auth, fn.initiator.auth);
    return RM_STATUS_SUCCESS;
  });
}

// An existing portal answers 116 and hands back its own login options, so
// the caller can see which digests are in force.
RM_STATUS handle_iSCSI_AddSendTargetPortal(HBA_NAME a1, const RM_IP_ADDRESS* portal, HBA_UINT32,
                                           RM_ISCSI_LOGIN_OPTIONS* options, const RM_ISCSI_AUTH* auth) {
  if (portal == nullptr || ip_text(*portal).empty()) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    auto it = find_portal(fn, *portal);
    if (it != fn.initiator.portals.end()) {
      if (options) put_login(it->login, *options);
      return RM_STATUS_ISCSI_DIGEST_MISMATCH;
    }
    IscsiPortal p;
    p.address = endpoint_of(*portal);
    p.login = options ? login_of(*options) : fn.initiator.login;
    if (auth) p.auth = auth_of(*auth, Authentication{});
    fn.initiator.portals.push_back(p);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_RemoveSendTargetPortal(HBA_NAME a1, const RM_IP_ADDRESS* portal) {
  if (portal == nullptr) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    auto it = find_portal(fn, *portal);
    if (it == fn.initiator.portals.end()) return kStatusNotFound;
    fn.initiator.portals.erase(it);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_GetSendTargetPortalProperties(HBA_NAME a1, const RM_IP_ADDRESS* portal,
                                                     RM_ISCSI_PORTAL_PROPERTIES* props) {
  if (portal == nullptr || props == nullptr) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    auto it = find_portal(fn, *portal);
    if (it == fn.initiator.portals.end()) return kStatusNotFound;
    std::memset(props, 0, sizeof *props);
    props->address = ip_record(it->address.ip, it->address.port);
    put_login(it->login, props->loginOptions);
    put_auth(it->auth, props->auth);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_SetSendTargetPortalProperties(HBA_NAME a1, const RM_ISCSI_PORTAL_PROPERTIES* props) {
  if (props == nullptr) return kStatusBadArgument;
  if (props->auth.method > 2) return kStatusBadValue;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    auto it = find_portal(fn, props->address);
    if (it == fn.initiator.portals.end()) return kStatusNotFound;
    it->login = login_of(props->loginOptions);
    it->auth = auth_of(props->auth, it->auth);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_AddiSNSServer(HBA_NAME a1, const RM_IP_ADDRESS* server) {
  if (server == nullptr || ip_text(*server).empty()) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    auto& list = fn.initiator.isns;
    if (std::any_of(list.begin(), list.end(), [&](const Endpoint& e) { return same_endpoint(e, *server); }))
      return kStatusBadValue;
    list.push_back(endpoint_of(*server));
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_RemoveiSNSServer(HBA_NAME a1, const RM_IP_ADDRESS* server) {
  if (server == nullptr) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    auto& list = fn.initiator.isns;
    auto it = std::find_if(list.begin(), list.end(), [&](const Endpoint& e) { return same_endpoint(e, *server); });
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

// Reachable: an address of the site (portal, iSNS server, gateway, ARP entry)
// or any host of the function's own subnet.
RM_STATUS handle_Ping(HBA_NAME a1, const RM_IP_ADDRESS* address, HBA_UINT8* reachable) {
  if (address == nullptr || reachable == nullptr) return kStatusBadArgument;
  const std::string ip = ip_text(*address);
  if (ip.empty()) return kStatusBadValue;
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const Function& fn = at(s, r);
    if (fn.kind == Kind::kFcoe) return RM_STATUS_ITEM_NOT_OFFERED;
    bool known = ip == fn.ip.gateway || same_subnet(ip, fn.ip.address, fn.ip.netmask);
    for (const auto& t : fn.iscsi_targets) known = known || t.portal.ip == ip;
    for (const auto& e : fn.initiator.isns) known = known || e.ip == ip;
    for (const auto& p : fn.initiator.portals) known = known || p.address.ip == ip;
    for (const auto& e : fn.arp) known = known || e.ip == ip;
    *reachable = known ? 1 : 0;
    return RM_STATUS_SUCCESS;
  });
}

}  // namespace nrvsim::rm
