// Wrapper operations of the iSCSI initiator: portals, targets, sessions, iSNS
// servers, ping, initiator properties, network settings, ARP and route tables.
#include <arpa/inet.h>

#include <atomic>

#include "access/NRV_WrapperCall.h"

namespace cimple {

using wrapper::validated;

namespace {

std::atomic<NRV_MethodWrapper::SanChangeHandler> g_sanChanged{nullptr};

// Passes a successful change on to the catalogue's owner.
RM_STATUS sanChanged(RM_STATUS status, const char* text, bool rebuildNow) {
  if (status != RM_STATUS_SUCCESS) return status;
  if (text != nullptr) NRV_LOG(NRV_DBG, "%s", text);
  if (auto handler = g_sanChanged.load()) handler(rebuildNow);
  return status;
}

// The same operation with an address record built first; a text that does
// not form one answers kBadAddress without calling the library.
template <class Call>
RM_STATUS withAddress(const HBA_NAME& name, const char* operation, const std::string& text,
                      HBA_UINT16 port, Call call) {
  return validated(name, operation, [&] {
    RM_IP_ADDRESS address{};
    if (!NRV_MethodWrapper::makeAddress(text, port, address)) {
      NRV_LOG(NRV_ERR, "%s: invalid address %s", operation, text.c_str());
      return NRV_MethodWrapper::kBadAddress;
    }
    return call(address);
  });
}

// Session record: the identifier, and the target's dotted IPv4 address when given.
bool makeSession(HBA_UINT32 sessionId, const std::string& address, RM_ISCSI_SESSION_ID& out) {
  out = RM_ISCSI_SESSION_ID{};
  out.sessionId = sessionId;
  if (address.empty()) return true;
  if (inet_pton(AF_INET, address.c_str(), out.targetAddress.address) != 1) return false;
  out.hasTargetAddress = 1;
  return true;
}

}  // namespace

void NRV_MethodWrapper::setSanChangeHandler(SanChangeHandler handler) { g_sanChanged = handler; }

bool NRV_MethodWrapper::makeAddress(const std::string& text, HBA_UINT16 port, RM_IP_ADDRESS& out) {
  out = RM_IP_ADDRESS{};
  out.port = port;
  if (text.empty()) return false;
  if (inet_pton(AF_INET, text.c_str(), out.address) == 1) return true;
  if (inet_pton(AF_INET6, text.c_str(), out.address) == 1) {
    out.flags |= RM_IP_FLAG_IPV6;
    return true;
  }
  // A host name: let the resolver decide.
  return ipAddr2IpInfo(text.c_str(), &out) == 0;
}

RM_STATUS NRV_MethodWrapper::Ping(const HBA_NAME& name, const std::string& address, HBA_UINT16 port,
                                  bool& reachable) {
  reachable = false;
  return withAddress(name, "Ping", address, port, [&](const RM_IP_ADDRESS& record) {
    HBA_UINT8 answer = 0;
    const RM_STATUS status = LRM_Ping(name, &record, &answer);
    reachable = status == RM_STATUS_SUCCESS && answer != 0;
    return status;
  });
}

RM_STATUS NRV_MethodWrapper::GetiSNSServer(const HBA_NAME& name,
                                           std::vector<RM_IP_ADDRESS>& servers) {
  return validated(name, "GetiSNSServer", [&] {
    return wrapper::readTable(servers, 8, [&](void* buffer, HBA_UINT32* size) {
      return LRM_iSCSI_GetiSNSServers(name, buffer, size);
    });
  });
}

RM_STATUS NRV_MethodWrapper::UpdateiSNSServer(const HBA_NAME& name, const std::string& address,
                                              HBA_UINT16 port, HBA_UINT32 enable) {
  return withAddress(name, "UpdateiSNSServer", address, port, [&](const RM_IP_ADDRESS& record) {
    HBA_UINT8 reachable = 0;
    const RM_STATUS ping = LRM_Ping(name, &record, &reachable);
    RM_STATUS status = LRM_iSCSI_AddiSNSServer(name, &record);
    if (status != RM_STATUS_SUCCESS) return status;
    status = LRM_iSCSI_SetiSNSState(name, enable);
    if (status != RM_STATUS_SUCCESS) return status;
    if (ping != RM_STATUS_SUCCESS || reachable == 0)
      NRV_LOG(NRV_WARN, "iSNS server has been updated, but IP address is unreachable");
    return status;
  });
}

RM_STATUS NRV_MethodWrapper::DeleteiSNSServer(const HBA_NAME& name, const std::string& address,
                                              HBA_UINT16 port) {
  return withAddress(name, "DeleteiSNSServer", address, port, [&](const RM_IP_ADDRESS& record) {
    return LRM_iSCSI_RemoveiSNSServer(name, &record);
  });
}

RM_STATUS NRV_MethodWrapper::GetIscsiInitiatorProps(const HBA_NAME& name,
                                                    RM_ISCSI_INITIATOR_PROPERTIES& properties) {
  return validated(name, "GetIscsiInitiatorProps", [&] {
    RM_ISCSI_INITIATOR_EXTRA extra{};
    return LRM_iSCSI_GetInitiatorProperties(name, &properties, &extra);
  });
}

RM_STATUS NRV_MethodWrapper::SetInitiatorProperties(
    const HBA_NAME& name, const RM_ISCSI_INITIATOR_PROPERTIES& properties) {
  return validated(name, "SetInitiatorProperties",
                   [&] { return LRM_iSCSI_SetInitiatorProperties(name, &properties); });
}

RM_STATUS NRV_MethodWrapper::GetTargetLoginAuthProperties(const HBA_NAME& name,
                                                          const std::string& target,
                                                          RM_ISCSI_LOGIN_OPTIONS& options,
                                                          RM_ISCSI_AUTH& auth) {
  return validated(name, "GetTargetLoginAuthProperties", [&] {
    return LRM_iSCSI_GetTargetLoginAuthProperties(name, target.c_str(), &options, &auth);
  });
}

RM_STATUS NRV_MethodWrapper::SetTargetLoginAuthProperties(const HBA_NAME& name,
                                                          const std::string& target,
                                                          const RM_ISCSI_LOGIN_OPTIONS& options,
                                                          const RM_ISCSI_AUTH& auth) {
  return validated(name, "SetTargetLoginAuthProperties", [&] {
    return LRM_iSCSI_SetTargetLoginAuthProperties(name, target.c_str(), &options, &auth);
  });
}

RM_STATUS NRV_MethodWrapper::AddTargetPortal(const HBA_NAME& name, const std::string& address,
                                             HBA_UINT16 port, RM_ISCSI_LOGIN_OPTIONS& options,
                                             const RM_ISCSI_AUTH& auth) {
  const RM_STATUS status =
      withAddress(name, "AddTargetPortal", address, port, [&](const RM_IP_ADDRESS& record) {
        const bool digestsAsked = options.headerDigest != 0 || options.dataDigest != 0;
        RM_STATUS status = LRM_iSCSI_AddSendTargetPortal(name, &record, 0, &options, &auth);
        const bool digestsKept = options.headerDigest != 0 || options.dataDigest != 0;
        if (status == RM_STATUS_ISCSI_DIGEST_MISMATCH && digestsKept && !digestsAsked) {
          // The existing portal still carries digests; replace it with one without.
          NRV_LOG(NRV_DBG, "AddTargetPortal: re-adding the portal without digests");
          status = LRM_iSCSI_RemoveSendTargetPortal(name, &record);
          if (status != RM_STATUS_SUCCESS) return status;
          options.headerDigest = 0;
          options.dataDigest = 0;
          status = LRM_iSCSI_AddSendTargetPortal(name, &record, 0, &options, &auth);
        }
        return status;
      });
  return sanChanged(status, nullptr, false);
}

RM_STATUS NRV_MethodWrapper::RemoveTargetPortal(const HBA_NAME& name, const std::string& address,
                                                HBA_UINT16 port) {
  const RM_STATUS status = withAddress(
      name, "RemoveTargetPortal", address, port,
      [&](const RM_IP_ADDRESS& record) { return LRM_iSCSI_RemoveSendTargetPortal(name, &record); });
  return sanChanged(status, "RemoveTargetPortal: Target Portal removed. Refreshing SAN Data.",
                    true);
}

RM_STATUS NRV_MethodWrapper::GetTargetPortalProperties(const HBA_NAME& name,
                                                       const std::string& address, HBA_UINT16 port,
                                                       RM_ISCSI_PORTAL_PROPERTIES& properties) {
  return withAddress(name, "GetTargetPortalProperties", address, port,
                     [&](const RM_IP_ADDRESS& record) {
                       return LRM_iSCSI_GetSendTargetPortalProperties(name, &record, &properties);
                     });
}

RM_STATUS NRV_MethodWrapper::SetTargetPortalProperties(
    const HBA_NAME& name, const RM_ISCSI_PORTAL_PROPERTIES& properties) {
  return validated(name, "SetTargetPortalProperties",
                   [&] { return LRM_iSCSI_SetSendTargetPortalProperties(name, &properties); });
}

RM_STATUS NRV_MethodWrapper::AddTarget(const HBA_NAME& name, const std::string& target,
                                       const std::string& address, HBA_UINT16 port, bool login,
                                       bool boot, const RM_ISCSI_LOGIN_OPTIONS& options,
                                       const RM_ISCSI_AUTH& auth) {
  const RM_STATUS status =
      withAddress(name, "AddTarget", address, port, [&](const RM_IP_ADDRESS& record) {
        const HBA_UINT32 doLogin = login ? 1 : 0;
        if (boot)
          return LRM_iSCSI_AddBootTarget(name, doLogin, target.c_str(), &record, &options, &auth);
        return LRM_iSCSI_AddTarget(name, doLogin, target.c_str(), &record, &options, &auth);
      });
  return sanChanged(status, "AddTarget: Target added. Refreshing SAN Data.", true);
}

RM_STATUS NRV_MethodWrapper::RemoveTarget(const HBA_NAME& name, const std::string& target) {
  const RM_STATUS status =
      validated(name, "RemoveTarget", [&] { return LRM_iSCSI_RemoveTarget(name, target.c_str()); });
  return sanChanged(status, "RemoveTarget: Target removed. Refreshing SAN Data.", true);
}

RM_STATUS NRV_MethodWrapper::TargetLogin(const HBA_NAME& name, const std::string& target,
                                         const std::string& address, HBA_UINT16 port,
                                         const RM_ISCSI_LOGIN_OPTIONS& options,
                                         const RM_ISCSI_AUTH& auth) {
  const RM_STATUS status =
      withAddress(name, "TargetLogin", address, port, [&](const RM_IP_ADDRESS& record) {
        return LRM_iSCSI_TargetLogin(name, target.c_str(), 0, &record, &options, &auth);
      });
  return sanChanged(status, "TargetLogin: Login done. Refreshing SAN Data.", true);
}

RM_STATUS NRV_MethodWrapper::TargetLogout(const HBA_NAME& name, const std::string& target,
                                          HBA_UINT32 sessionId, const std::string& address) {
  const RM_STATUS status = validated(name, "TargetLogout", [&] {
    RM_ISCSI_SESSION_ID session;
    if (!makeSession(sessionId, address, session)) return kBadAddress;
    return LRM_iSCSI_TargetLogout(name, target.c_str(), &session);
  });
  return sanChanged(status, "TargetLogout: Logout done. Refreshing SAN Data.", true);
}

RM_STATUS NRV_MethodWrapper::SetBootTargetSession(const HBA_NAME& name, const std::string& target,
                                                  HBA_UINT32 sessionId, const std::string& address,
                                                  HBA_UINT32 enable) {
  return validated(name, "SetBootTargetSession", [&] {
    RM_ISCSI_SESSION_ID session;
    if (!makeSession(sessionId, address, session)) return kBadAddress;
    return LRM_iSCSI_SetBootSession(name, target.c_str(), &session, enable);
  });
}

RM_STATUS NRV_MethodWrapper::SetTargetProperties(const HBA_NAME& name, const std::string& target,
                                                 RM_ISCSI_TARGET_PROPERTIES& properties) {
  return validated(name, "SetTargetProperties", [&] {
    return LRM_iSCSI_SetTargetProperties(name, target.c_str(), &properties);
  });
}

RM_STATUS NRV_MethodWrapper::GetiSCSITargetList(const HBA_NAME& name, HBA_UINT8 flag,
                                                std::vector<uint8_t>& list) {
  // Room for 128 targets of 516 bytes after the count word and the header.
  constexpr HBA_UINT32 kEntry = 516, kHeader = 524 - kEntry, kInitial = 128;
  return validated(name, "GetiSCSITargetList", [&] {
    auto attempt = [&](HBA_UINT32 capacity) {
      list.assign(kHeader + capacity * kEntry, 0);
      std::memcpy(list.data(), &capacity, sizeof capacity);
      HBA_UINT32 size = static_cast<HBA_UINT32>(list.size());
      return LRM_iSCSI_GetTargets(name, flag, list.data(), &size);
    };
    RM_STATUS status = attempt(kInitial);
    if (status == RM_STATUS_ERROR_BUFFER_TOO_SMALL) {
      HBA_UINT32 reported = 0;
      std::memcpy(&reported, list.data(), sizeof reported);
      status = attempt(reported + 32);
    }
    if (status != RM_STATUS_SUCCESS) list.clear();
    return status;
  });
}

RM_STATUS NRV_MethodWrapper::GetiSCSILuns(const HBA_NAME& name, const std::string& target,
                                          std::vector<uint8_t>& luns) {
  return validated(name, "GetiSCSILuns", [&] {
    return wrapper::readSized(luns, 4096, [&](void* buffer, HBA_UINT32* size) {
      return LRM_iSCSI_GetLuns(name, target.c_str(), buffer, size);
    });
  });
}

RM_STATUS NRV_MethodWrapper::GetiSCSISessions(const HBA_NAME& name, const std::string& target,
                                              std::vector<uint8_t>& sessions) {
  return validated(name, "GetiSCSISessions", [&] {
    return wrapper::readSized(sessions, 4096, [&](void* buffer, HBA_UINT32* size) {
      return LRM_iSCSI_GetSessions(name, target.c_str(), buffer, size);
    });
  });
}

RM_STATUS NRV_MethodWrapper::GetiSCSILunProperties(const HBA_NAME& name, const std::string& target,
                                                   HBA_UINT32 lun,
                                                   std::vector<uint8_t>& properties) {
  return validated(name, "GetiSCSILunProperties", [&] {
    return wrapper::readSized(properties, 1024, [&](void* buffer, HBA_UINT32* size) {
      return LRM_iSCSI_GetLunProperties(name, target.c_str(), lun, buffer, size);
    });
  });
}

RM_STATUS NRV_MethodWrapper::GetSessionInfo(const HBA_NAME& name, const void* session,
                                            std::vector<uint8_t>& info) {
  return validated(name, "GetSessionInfo", [&] {
    return wrapper::readSized(info, 4096, [&](void* buffer, HBA_UINT32* size) {
      return LRM_iSCSI_GetSessionInfo(name, session, buffer, size);
    });
  });
}

RM_STATUS NRV_MethodWrapper::GetIscsiPortStatistics(const HBA_NAME& name,
                                                    std::vector<uint8_t>& statistics) {
  return validated(name, "GetIscsiPortStatistics", [&] {
    return wrapper::readSized(statistics, RM_PORT_STATISTICS_SIZE,
                              [&](void* buffer, HBA_UINT32* size) {
                                return LRM_iSCSI_GetPortStatistics(name, buffer, size);
                              });
  });
}

RM_STATUS NRV_MethodWrapper::SetNetworkSettings(const HBA_NAME& name,
                                                const RM_NETWORK_SETTINGS& settings) {
  return validated(name, "SetNetworkSettings",
                   [&] { return LRM_Ini_SetNetworkProperties(name, &settings); });
}

RM_STATUS NRV_MethodWrapper::discoverARPTable(const HBA_NAME& name,
                                              std::vector<RM_ARP_ENTRY>& entries) {
  return validated(name, "discoverARPTable", [&] {
    return wrapper::readTable(entries, 32, [&](void* buffer, HBA_UINT32* size) {
      return LRM_Ini_GetARPTable(name, buffer, size);
    });
  });
}

RM_STATUS NRV_MethodWrapper::discoverRoute(const HBA_NAME& name,
                                           std::vector<RM_ROUTE_ENTRY>& entries) {
  return validated(name, "discoverRoute", [&] {
    return wrapper::readTable(entries, 32, [&](void* buffer, HBA_UINT32* size) {
      return LRM_Ini_GetRouteTable(name, buffer, size);
    });
  });
}

}  // namespace cimple
