// What the host's network stack says about one named interface: whether it
// is up, the family of its address, and its IPv4 address and mask, for the
// IP-configuration providers.
//
// Contract: one object holds one IPv4 datagram socket for its lifetime (the
// constructor throws std::runtime_error when none can be opened); it is used
// by one call at a time.  A name longer than the platform's interface-name
// field is cut to fit.  No query throws; failures answer the values stated.
#pragma once

#include <string>

namespace cimple {

class NRV_IPInterfaceConfig {
 public:
  NRV_IPInterfaceConfig();
  ~NRV_IPInterfaceConfig();
  NRV_IPInterfaceConfig(const NRV_IPInterfaceConfig&) = delete;
  NRV_IPInterfaceConfig& operator=(const NRV_IPInterfaceConfig&) = delete;

  // 1 when the interface is up; 0 when it is down or cannot be asked.
  int GetInterfaceState(const std::string& strInterface);
  // The family of the interface's address (2 IPv4, 10 when it holds only
  // IPv6 addresses); -1 when it has no address or cannot be asked.
  int GetIPAddressType(const std::string& strInterface);
  // Dotted IPv4 address and mask; "" when there is none.
  std::string GetIPv4Address(const std::string& strInterface);
  std::string GetIPv4SubnetMask(const std::string& strInterface);

 private:
  int m_Socket = -1;
};

}  // namespace cimple
