// The interface queries against this machine's own network stack: every
// interface it has (the loopback at least) answers what getifaddrs says of
// it, and a missing or over-long name answers the failure values.
#include <arpa/inet.h>
#include <gtest/gtest.h>
#include <ifaddrs.h>
#include <net/if.h>

#include <map>
#include <string>

#include "access/NRV_IPInterfaceConfig.h"

namespace {

using cimple::NRV_IPInterfaceConfig;

struct Expected {
  bool up = false;
  std::string ipv4, mask;
  bool ipv6 = false;
};

std::string dotted(const sockaddr* address) {
  if (address == nullptr || address->sa_family != AF_INET) return {};
  char text[INET_ADDRSTRLEN] = {};
  inet_ntop(AF_INET, &reinterpret_cast<const sockaddr_in*>(address)->sin_addr, text, sizeof text);
  return text;
}

// Every interface of the host as getifaddrs lists it (the first IPv4
// address of each, as the interface request answers it).
std::map<std::string, Expected> hostInterfaces() {
  std::map<std::string, Expected> out;
  ifaddrs* list = nullptr;
  if (getifaddrs(&list) != 0) return out;
  for (const ifaddrs* a = list; a != nullptr; a = a->ifa_next) {
    Expected& e = out[a->ifa_name];
    e.up = (a->ifa_flags & IFF_UP) != 0;
    if (a->ifa_addr == nullptr) continue;
    if (a->ifa_addr->sa_family == AF_INET6) e.ipv6 = true;
    if (a->ifa_addr->sa_family == AF_INET && e.ipv4.empty()) {
      e.ipv4 = dotted(a->ifa_addr);
      e.mask = dotted(a->ifa_netmask);
    }
  }
  freeifaddrs(list);
  return out;
}

TEST(IPInterfaceConfig, AnswersForEveryInterfaceOfTheHost) {
  const std::map<std::string, Expected> interfaces = hostInterfaces();
  ASSERT_EQ(interfaces.count("lo"), 1u);
  NRV_IPInterfaceConfig config;
  for (const auto& [name, e] : interfaces) {
    SCOPED_TRACE(name);
    EXPECT_EQ(config.GetInterfaceState(name), e.up ? 1 : 0);
    EXPECT_EQ(config.GetIPv4Address(name), e.ipv4);
    EXPECT_EQ(config.GetIPv4SubnetMask(name), e.mask);
    EXPECT_EQ(config.GetIPAddressType(name), !e.ipv4.empty() ? AF_INET : e.ipv6 ? AF_INET6 : -1);
  }
  EXPECT_EQ(config.GetIPv4Address("lo"), "127.0.0.1");
}

TEST(IPInterfaceConfig, MissingAndOverlongNamesAnswerTheFailureValues) {
  NRV_IPInterfaceConfig config;
  for (const std::string& name : {std::string("nrv-missing0"), std::string(""), std::string(64, 'x'),
                                  std::string("lo") + std::string(30, 'o')}) {
    EXPECT_EQ(config.GetInterfaceState(name), 0);
    EXPECT_EQ(config.GetIPAddressType(name), -1);
    EXPECT_EQ(config.GetIPv4Address(name), "");
    EXPECT_EQ(config.GetIPv4SubnetMask(name), "");
  }
}

}  // namespace
