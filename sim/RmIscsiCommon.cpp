// Shared iSCSI handler helpers.
#include "sim/RmIscsiCommon.h"

#include <algorithm>

namespace nrvsim::rm {

IscsiTarget* find_target(Function& fn, const char* name) {
  const std::string wanted = get_text(name, 512);
  auto it = std::find_if(fn.iscsi_targets.begin(), fn.iscsi_targets.end(),
                         [&](const IscsiTarget& t) { return t.name == wanted; });
  return it == fn.iscsi_targets.end() ? nullptr : &*it;
}

Endpoint endpoint_of(const RM_IP_ADDRESS& a) { return Endpoint{ip_text(a), a.port}; }

bool same_endpoint(const Endpoint& e, const RM_IP_ADDRESS& a) { return e.ip == ip_text(a) && e.port == a.port; }

void put_login(const LoginOptions& from, RM_ISCSI_LOGIN_OPTIONS& to) {
  to = RM_ISCSI_LOGIN_OPTIONS{};
  to.immediateData = from.immediate_data;
  to.headerDigest = from.header_digest;
  to.dataDigest = from.data_digest;
}

LoginOptions login_of(const RM_ISCSI_LOGIN_OPTIONS& from) {
  return LoginOptions{static_cast<uint8_t>(from.immediateData ? 1 : 0), static_cast<uint8_t>(from.headerDigest ? 1 : 0),
                      static_cast<uint8_t>(from.dataDigest ? 1 : 0)};
}

void put_auth(const Authentication& from, RM_ISCSI_AUTH& to) {
  std::memset(&to, 0, sizeof to);
  to.method = from.method;
  put_text(to.initiatorChapName, sizeof to.initiatorChapName, from.initiator_chap);
  put_text(to.targetChapName, sizeof to.targetChapName, from.target_chap);
  put_text(to.initiatorSecret, sizeof to.initiatorSecret, from.initiator_secret);
  put_text(to.targetSecret, sizeof to.targetSecret, from.target_secret);
  to.hasInitiatorChapName = from.initiator_chap.empty() ? 0 : 1;
  to.hasTargetChapName = from.target_chap.empty() ? 0 : 1;
  to.hasInitiatorSecret = from.initiator_secret.empty() ? 0 : 1;
  to.hasTargetSecret = from.target_secret.empty() ? 0 : 1;
}

Authentication auth_of(const RM_ISCSI_AUTH& from, const Authentication& current) {
  Authentication a = current;
  a.method = from.method;
  if (from.hasInitiatorChapName) a.initiator_chap = get_text(from.initiatorChapName, sizeof from.initiatorChapName);
  if (from.hasTargetChapName) a.target_chap = get_text(from.targetChapName, sizeof from.targetChapName);
  if (from.hasInitiatorSecret) a.initiator_secret = get_text(from.initiatorSecret, sizeof from.initiatorSecret);
  if (from.hasTargetSecret) a.target_secret = get_text(from.targetSecret, sizeof from.targetSecret);
  return a;
}

void login(Site& s, Function& fn, IscsiTarget& t, const RM_IP_ADDRESS* portal) {
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
}

}  // namespace nrvsim::rm
