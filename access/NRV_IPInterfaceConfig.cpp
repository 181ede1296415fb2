// Interface queries through ioctls on a datagram socket; getifaddrs answers
// only whether an interface without an IPv4 address holds an IPv6 one.
#include "access/NRV_IPInterfaceConfig.h"

#include <arpa/inet.h>
#include <ifaddrs.h>
#include <net/if.h>
#include <netinet/in.h>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cstring>
#include <stdexcept>

#include "logging/Log.h"

namespace cimple {

namespace {

// Dotted text of an IPv4 socket address; "" for any other family.
std::string dotted(const sockaddr& address) {
  if (address.sa_family != AF_INET) return {};
  sockaddr_in in{};
  std::memcpy(&in, &address, sizeof in);
  char text[INET_ADDRSTRLEN] = {};
  return inet_ntop(AF_INET, &in.sin_addr, text, sizeof text) ? text : "";
}

// Whether the stack lists an IPv6 address for the interface.
bool hasIPv6Address(const std::string& name) {
  ifaddrs* list = nullptr;
  if (getifaddrs(&list) != 0) return false;
  bool found = false;
  for (const ifaddrs* a = list; a != nullptr && !found; a = a->ifa_next)
    found = a->ifa_addr != nullptr && a->ifa_addr->sa_family == AF_INET6 && a->ifa_name != nullptr &&
            name == a->ifa_name;
  freeifaddrs(list);
  return found;
}

// Runs the interface request `request` for the interface on `socket`; false
// when the stack refuses it.
bool query(int socket, unsigned long request, const std::string& strInterface, ifreq& answer) {
  std::memset(&answer, 0, sizeof answer);
  // The name field holds IFNAMSIZ bytes with its terminator.
  std::strncpy(answer.ifr_name, strInterface.c_str(), IFNAMSIZ - 1);
  return ::ioctl(socket, request, &answer) == 0;
}

}  // namespace

NRV_IPInterfaceConfig::NRV_IPInterfaceConfig() {
  m_Socket = ::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);
  if (m_Socket < 0) throw std::runtime_error("NRV_IPInterfaceConfig: no datagram socket");
}

NRV_IPInterfaceConfig::~NRV_IPInterfaceConfig() {
  if (m_Socket >= 0) ::close(m_Socket);
  m_Socket = -1;
  NRV_LOG(NRV_DBG, "NRV_IPInterfaceConfig -- Destructor of IPInterfaceConfig");
}

int NRV_IPInterfaceConfig::GetInterfaceState(const std::string& strInterface) {
  NRV_LOG(NRV_DBG, "GetInterfaceState -- Retrieving the Interface info");
  ifreq answer;
  if (!query(m_Socket, SIOCGIFFLAGS, strInterface, answer)) {
    NRV_LOG(NRV_DBG, "GetInterfaceState -- Failed to obtain the the Interface State for strInterface: [%s]",
            strInterface.c_str());
    return 0;
  }
  NRV_LOG(NRV_DBG, "GetInterfaceState -- Interface info Retrieved");
  if (answer.ifr_flags & IFF_UP) {
    NRV_LOG(NRV_DBG, "GetInterfaceState -- Interface: [%s] is UP", strInterface.c_str());
    return 1;
  }
  NRV_LOG(NRV_DBG, "GetInterfaceState -- Interface: [%s] is Down", strInterface.c_str());
  return 0;
}

int NRV_IPInterfaceConfig::GetIPAddressType(const std::string& strInterface) {
  NRV_LOG(NRV_DBG, "GetIPAddressType -- Retrieve IP Address type for strInterface: [%s]", strInterface.c_str());
  ifreq answer;
  int family = -1;
  if (query(m_Socket, SIOCGIFADDR, strInterface, answer))
    family = answer.ifr_addr.sa_family;
  else if (hasIPv6Address(strInterface.substr(0, IFNAMSIZ - 1)))
    // The IPv4 socket's request knows no IPv6 addresses.
    family = AF_INET6;
  if (family < 0) {
    NRV_LOG(NRV_DBG, "GetIPAddressType -- Failed to obtain the IP Address type for strInterface: [%s]",
            strInterface.c_str());
    return -1;
  }
  NRV_LOG(NRV_DBG, "GetIPAddressType -- INET FAMILY for strInterface [%s]: [%d]", strInterface.c_str(), family);
  return family;
}

std::string NRV_IPInterfaceConfig::GetIPv4Address(const std::string& strInterface) {
  NRV_LOG(NRV_DBG, "GetIPv4Address --- Retrieve the IPv4 Address for the Interface");
  ifreq answer;
  if (query(m_Socket, SIOCGIFADDR, strInterface, answer)) {
    NRV_LOG(NRV_DBG, "GetIPv4Address --- Retrieve the passed Interface details");
    const std::string address = dotted(answer.ifr_addr);
    if (!address.empty()) {
      NRV_LOG(NRV_DBG, "GetIPv4Address --- Retrieved the type for Interface");
      NRV_LOG(NRV_ERR, "GetIPv4Address --- IPv4 Address for strInterface [%s]: [%s]", strInterface.c_str(),
              address.c_str());
      return address;
    }
  }
  NRV_LOG(NRV_DBG, "GetIPv4Address --- Failed to obtain the IP Address for strInterface: [%s]",
          strInterface.c_str());
  return {};
}

std::string NRV_IPInterfaceConfig::GetIPv4SubnetMask(const std::string& strInterface) {
  NRV_LOG(NRV_DBG, "GetIPv4SubnetMask - IPv4 Subnet Mask for strInterface [%s]:", strInterface.c_str());
  ifreq answer;
  if (query(m_Socket, SIOCGIFNETMASK, strInterface, answer)) {
    const std::string mask = dotted(answer.ifr_netmask);
    if (!mask.empty()) {
      NRV_LOG(NRV_DBG, "GetIPv4 Subnet Mask for strInterface [%s]: [%s]", strInterface.c_str(), mask.c_str());
      return mask;
    }
  }
  NRV_LOG(NRV_DBG, "GetIPv4SubnetMask - Failed to obtain the IPv4 Subnet Mask for strInterface: [%s]",
          strInterface.c_str());
  return {};
}

}  // namespace cimple
