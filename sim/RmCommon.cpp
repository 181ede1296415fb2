// Address records and feature lists shared by the handlers.
#include "sim/RmCommon.h"

#include <arpa/inet.h>

#include <algorithm>

#include "access/RM_Attributes.h"

namespace nrvsim::rm {

RM_IP_ADDRESS ip_record(const std::string& text, uint16_t port) {
  RM_IP_ADDRESS r{};
  r.port = port;
  if (inet_pton(AF_INET, text.c_str(), r.address) == 1) return r;
  if (inet_pton(AF_INET6, text.c_str(), r.address) == 1) {
    r.flags = RM_IP_FLAG_IPV6;
    return r;
  }
  std::memset(r.address, 0, sizeof r.address);
  return r;
}

std::string ip_text(const RM_IP_ADDRESS& record) {
  char buf[INET6_ADDRSTRLEN] = {};
  const int family = (record.flags & RM_IP_FLAG_IPV6) ? AF_INET6 : AF_INET;
  if (inet_ntop(family, record.address, buf, sizeof buf) == nullptr) return {};
  return buf;
}

std::vector<uint32_t> features_of(const Card& card, const Function& fn) {
  std::vector<uint32_t> out = card.features;
  if (fn.kind == Kind::kFcoe) out.push_back(RM_FEATURE_FCOE);
  if (fn.kind == Kind::kIscsi) out.push_back(RM_FEATURE_ISCSI);
  std::sort(out.begin(), out.end());
  out.erase(std::unique(out.begin(), out.end()), out.end());
  return out;
}

}  // namespace nrvsim::rm
