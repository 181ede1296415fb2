// What the iSCSI handlers share: the iSCSI-function guard, target lookup and
// the conversions between the site's login and authentication settings and
// the library's records.
#pragma once

#include <string>

#include "sim/RmCommon.h"

namespace nrvsim::rm {

// Runs f(Site&, Function&) on an iSCSI function; other kinds do not offer it.
template <class F>
RM_STATUS on_iscsi(HBA_NAME name, F&& f) {
  return on_function(name, [&](Site& s, FunctionRef r) -> RM_STATUS {
    Function& fn = at(s, r);
    if (fn.kind != Kind::kIscsi) return RM_STATUS_ITEM_NOT_OFFERED;
    return f(s, fn);
  });
}

IscsiTarget* find_target(Function& fn, const char* name);

Endpoint endpoint_of(const RM_IP_ADDRESS& a);
bool same_endpoint(const Endpoint& e, const RM_IP_ADDRESS& a);

void put_login(const LoginOptions& from, RM_ISCSI_LOGIN_OPTIONS& to);
LoginOptions login_of(const RM_ISCSI_LOGIN_OPTIONS& from);
void put_auth(const Authentication& from, RM_ISCSI_AUTH& to);
// Strings whose presence byte is clear keep their current value.
Authentication auth_of(const RM_ISCSI_AUTH& from, const Authentication& current);

// Opens a session on `t` (one connection from the function's address).
void login(Site& s, Function& fn, IscsiTarget& t, const RM_IP_ADDRESS* portal);

}  // namespace nrvsim::rm
