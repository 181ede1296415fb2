// iSCSI targets of an iSCSI function: the lists the SAN catalogue reads
// (targets, sessions, session information, LUNs and their properties) and the
// changes the iSCSI setting service makes (add, remove, log in and out, boot
// target, login and timeout properties).  Changes stay for the process.
#include <algorithm>

#include "sim/RmIscsiCommon.h"
#include "sim/RmRecords.h"

namespace nrvsim::rm {
namespace {

constexpr HBA_UINT32 kMaxExtendedTimeout = 3200;

IscsiSession* find_session(Function& fn, uint32_t id, IscsiTarget** owner) {
  for (auto& t : fn.iscsi_targets)
    for (auto& s : t.sessions)
      if (s.id == id) {
        if (owner) *owner = &t;
        return &s;
      }
  return nullptr;
}

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

// Adds (or re-addresses) a target with its login settings, logging in when asked.
RM_STATUS add_target(HBA_NAME name, HBA_UINT32 do_login, const char* target, const RM_IP_ADDRESS* portal,
                     const RM_ISCSI_LOGIN_OPTIONS* options, const RM_ISCSI_AUTH* auth, bool boot) {
  const std::string wanted = get_text(target, 512);
  if (wanted.empty() || wanted.size() > 223 || portal == nullptr || ip_text(*portal).empty())
    return kStatusBadArgument;
  return on_iscsi(name, [&](Site& s, Function& fn) -> RM_STATUS {
    IscsiTarget* t = find_target(fn, target);
    if (t == nullptr) {
      fn.iscsi_targets.push_back(IscsiTarget{});
      t = &fn.iscsi_targets.back();
      t->name = wanted;
    }
    t->portal = endpoint_of(*portal);
    if (options) t->login = login_of(*options);
    if (auth) t->auth = auth_of(*auth, t->auth);
    if (boot) t->boot = true;
    if (do_login) login(s, fn, *t, portal);
    return RM_STATUS_SUCCESS;
  });
}

}  // namespace

RM_STATUS handle_iSCSI_GetTargets(HBA_NAME a1, HBA_UINT8 /*flag*/, void* buffer, HBA_UINT32* size) {
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    std::vector<IscsiTargetEntry> list(fn.iscsi_targets.size());
    for (size_t i = 0; i < list.size(); ++i) {
      const IscsiTarget& t = fn.iscsi_targets[i];
      IscsiTargetEntry& e = list[i];
      std::memset(&e, 0, sizeof e);
      put_text(e.name, sizeof e.name, t.name);
      e.flags = static_cast<HBA_UINT8>((t.sessions.empty() ? 0 : kTargetHasSessions) | (t.boot ? kTargetIsBoot : 0));
      e.authMethod = static_cast<HBA_UINT8>(t.auth.method);
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
                                 const RM_ISCSI_LOGIN_OPTIONS* options, const RM_ISCSI_AUTH* auth) {
  return add_target(a1, do_login, target, portal, options, auth, false);
}

RM_STATUS handle_iSCSI_AddBootTarget(HBA_NAME a1, HBA_UINT32 do_login, const char* target,
                                     const RM_IP_ADDRESS* portal, const RM_ISCSI_LOGIN_OPTIONS* options,
                                     const RM_ISCSI_AUTH* auth) {
  return add_target(a1, do_login, target, portal, options, auth, true);
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
                                   const RM_ISCSI_LOGIN_OPTIONS* options, const RM_ISCSI_AUTH* auth) {
  return on_iscsi(a1, [&](Site& s, Function& fn) -> RM_STATUS {
    if (fn.initiator.name.empty()) return kStatusBadValue;
    IscsiTarget* t = find_target(fn, target);
    if (t == nullptr) return kStatusNotFound;
    if (options) t->login = login_of(*options);
    if (auth) t->auth = auth_of(*auth, t->auth);
    login(s, fn, *t, portal);
    return RM_STATUS_SUCCESS;
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

RM_STATUS handle_iSCSI_SetBootSession(HBA_NAME a1, const char* target, const RM_ISCSI_SESSION_ID* id,
                                      HBA_UINT32 enable) {
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    IscsiTarget* t = find_target(fn, target);
    if (t == nullptr) return kStatusNotFound;
    if (id != nullptr && std::none_of(t->sessions.begin(), t->sessions.end(),
                                      [&](const IscsiSession& s) { return s.id == id->sessionId; }))
      return kStatusNotFound;
    t->boot = enable != 0;
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_GetTargetLoginAuthProperties(HBA_NAME a1, const char* target, RM_ISCSI_LOGIN_OPTIONS* options,
                                                    RM_ISCSI_AUTH* auth) {
  if (options == nullptr || auth == nullptr) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    IscsiTarget* t = find_target(fn, target);
    if (t == nullptr) return kStatusNotFound;
    put_login(t->login, *options);
    put_auth(t->auth, *auth);
    return RM_STATUS_SUCCESS;
  });
}

RM_STATUS handle_iSCSI_SetTargetLoginAuthProperties(HBA_NAME a1, const char* target,
                                                    const RM_ISCSI_LOGIN_OPTIONS* options,
                                                    const RM_ISCSI_AUTH* auth) {
  if (options == nullptr || auth == nullptr) return kStatusBadArgument;
  if (auth->method > 2) return kStatusBadValue;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    IscsiTarget* t = find_target(fn, target);
    if (t == nullptr) return kStatusNotFound;
    t->login = login_of(*options);
    t->auth = auth_of(*auth, t->auth);
    return RM_STATUS_SUCCESS;
  });
}

// A refused value is explained in the record's status-detail byte.
RM_STATUS handle_iSCSI_SetTargetProperties(HBA_NAME a1, const char* target, RM_ISCSI_TARGET_PROPERTIES* props) {
  if (props == nullptr) return kStatusBadArgument;
  return on_iscsi(a1, [&](Site&, Function& fn) -> RM_STATUS {
    IscsiTarget* t = find_target(fn, target);
    if (t == nullptr) return kStatusNotFound;
    if (props->extendedTimeOut > kMaxExtendedTimeout) {
      props->statusDetail = static_cast<HBA_UINT8>(kStatusBadValue);
      return kStatusBadValue;
    }
    t->extended_timeout = props->extendedTimeOut;
    return RM_STATUS_SUCCESS;
  });
}

}  // namespace nrvsim::rm
