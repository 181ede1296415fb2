// Text forms of world-wide names, MACs and addresses, version parsing and the
// system queries: accepted forms, strict refusals, and no writes past buffers.
#include "access/NRV_Common.h"

#include <sys/stat.h>

#include <cstdlib>
#include <cstring>
#include <fstream>
#include <string>

#include <gtest/gtest.h>

#include "TestSupport.h"
#include "logging/NRV_SystemPaths.h"

using namespace cimple;
using nrv_test::LogCapture;

namespace {

std::string bytes(const HBA_NAME& n) {
  char text[kHbaNamePlainSize];
  return HBAName2string(n, text);
}

}  // namespace

TEST(WwnText, PlainFormReadsPairs) {
  HBA_NAME n{};
  ASSERT_EQ(1, string2HBAName(&n, "2000001122334455"));
  const unsigned char expected[8] = {0x20, 0x00, 0x00, 0x11, 0x22, 0x33, 0x44, 0x55};
  EXPECT_EQ(0, std::memcmp(expected, n.wwn, 8));
  ASSERT_EQ(1, string2HBAName(&n, "abcdefABCDEF0918"));
  EXPECT_EQ("ABCDEFABCDEF0918", bytes(n));
}

TEST(WwnText, PlainFormRefusals) {
  LogCapture log;
  HBA_NAME n{};
  n.wwn[0] = 0x77;
  for (const char* bad : {"200000112233445", "20000011223344556", "200000112233445G", "",
                          "2000 01122334455", "20:00:00:11:22:33:44:55"}) {
    log.reset();
    EXPECT_EQ(0, string2HBAName(&n, bad)) << bad;
    EXPECT_EQ(1, log.count("INVALID WWN", NRV_ERR)) << bad;
  }
  EXPECT_EQ(0, string2HBAName(&n, nullptr));
  EXPECT_EQ(0x77, n.wwn[0]);  // a refused text leaves the name alone
}

TEST(WwnText, ColonFormAcceptsColonsAndSpaces) {
  LogCapture log;
  HBA_NAME n{};
  ASSERT_EQ(0, str2HBAName(&n, "20:00:00:11:22:33:44:55"));
  EXPECT_EQ("2000001122334455", bytes(n));
  EXPECT_TRUE(log.contains("wwpn:( 20:00:00:11:22:33:44:55 ) "));
  EXPECT_TRUE(log.contains("After tokenizing wwpn:( 20  0  0 11 22 33 44 55 )"));
  ASSERT_EQ(0, str2HBAName(&n, "10 00 00 aa bb cc dd ee"));
  EXPECT_EQ("100000AABBCCDDEE", bytes(n));
}

TEST(WwnText, ColonFormRefusals) {
  LogCapture log;
  HBA_NAME n{};
  for (const char* bad : {"20-00-00-11-22-33-44-55", "20:00:00:11:22:33:44:5", "20:00:00:11:22:33:44:555",
                          "20:00:00:11:22:33:44:5G", "2000:00:11:22:33:44:55:", "200000112233445500000"}) {
    log.reset();
    EXPECT_EQ(1, str2HBAName(&n, bad)) << bad;
    EXPECT_EQ(1, log.count("INVALID HBA Name", NRV_ERR)) << bad;
  }
  EXPECT_EQ(1, str2HBAName(&n, nullptr));
}

TEST(WwnText, DeviceIdToColonForm) {
  char out[kHbaNameColonSize];
  ASSERT_EQ(0, Id2HBAName(out, "2000001122334455"));
  EXPECT_STREQ("20:00:00:11:22:33:44:55", out);
  ASSERT_EQ(0, Id2HBAName(out, "\"2000001122334455\""));
  EXPECT_STREQ("20:00:00:11:22:33:44:55", out);
  // Then back to bytes, the way every caller uses it.
  HBA_NAME n{};
  EXPECT_EQ(0, str2HBAName(&n, out));
}

TEST(WwnText, DeviceIdRefusals) {
  LogCapture log;
  char out[kHbaNameColonSize] = "unchanged";
  EXPECT_EQ(1, Id2HBAName(nullptr, "2000001122334455"));
  EXPECT_EQ(1, Id2HBAName(out, nullptr));
  EXPECT_EQ(2, log.count("Null pointer argument in one of the arguments", NRV_ERR));
  // A short identifier is refused instead of being read past its end.
  auto* shortId = static_cast<char*>(std::malloc(5));
  std::memcpy(shortId, "2000", 5);
  EXPECT_EQ(1, Id2HBAName(out, shortId));
  EXPECT_STREQ("", out);
  std::free(shortId);
}

TEST(WwnText, Writers) {
  HBA_NAME n{{0x20, 0x00, 0x00, 0x11, 0x22, 0x33, 0x44, 0x55}};
  char plain[kHbaNamePlainSize];
  char colon[kHbaNameColonSize];
  EXPECT_STREQ("2000001122334455", HBAName2string(n, plain));
  EXPECT_STREQ("20:00:00:11:22:33:44:55", HBAName2Id(n, colon));
  EXPECT_EQ(nullptr, HBAName2string(n, nullptr));
  EXPECT_EQ(nullptr, HBAName2Id(n, nullptr));

  uint8_t sixteen[16];
  for (int i = 0; i < 16; ++i) sixteen[i] = static_cast<uint8_t>(i * 17);
  char text[kHexBytes16Size];
  EXPECT_STREQ("00112233445566778899AABBCCDDEEFF", bytes16ToString(sixteen, text));
  EXPECT_STREQ("0011223344556677", descriptor2string(8, sixteen, text));
  EXPECT_STREQ("00112233445566778899AABB", descriptor2string(12, sixteen, text));
  EXPECT_STREQ("00112233445566778899AABBCCDDEEFF", descriptor2string(16, sixteen, text));
  LogCapture log;
  EXPECT_STREQ("", descriptor2string(10, sixteen, text));
  EXPECT_EQ(1, log.count("INVALID Descriptor", NRV_ERR));
}

TEST(MacText, Forms) {
  const uint8_t mac[6] = {0x02, 0x11, 0x22, 0xaa, 0xBB, 0x0f};
  std::string s = "MAC=";
  EXPECT_EQ(0, MAC2String(mac, s));
  EXPECT_EQ("MAC=02-11-22-aa-bb-0f", s);

  char wwn[kMacColonHbaNameSize];
  ASSERT_EQ(0u, MAC2HBAName(wwn, "02-11-22-33-44-55"));
  EXPECT_STREQ("02:11:22:33:44:55:00:00", wwn);
  for (const char* bad : {"02:11:22:33:44:55", "02-11-22-33-44-5", "02-11-22-33-44-555", "0Z-11-22-33-44-55"})
    EXPECT_EQ(kNrvFailure, MAC2HBAName(wwn, bad)) << bad;

  char text[] = "02-11-22-33-44-55";
  EXPECT_EQ(12u, removeSeptr(text));
  EXPECT_STREQ("021122334455", text);
  char other[] = "0211-22";
  EXPECT_EQ(7u, removeSeptr(other));
  EXPECT_STREQ("0211-22", other);
}

TEST(IpText, DottedIpv4RoundTrip) {
  RM_IP_ADDRESS a{};
  std::memset(a.address, 0xEE, sizeof a.address);
  a.port = 3260;
  ASSERT_EQ(0, ipAddr2IpInfo("192.168.10.254", &a));
  EXPECT_EQ(192, a.address[0]);
  EXPECT_EQ(254, a.address[3]);
  EXPECT_EQ(0, a.address[4]);  // the rest of the address is cleared
  EXPECT_EQ(3260, a.port);     // the port is the caller's
  EXPECT_EQ(0, a.flags & RM_IP_FLAG_IPV6);
  std::string text;
  EXPECT_EQ(0, ipInfo2String(a, text));
  EXPECT_EQ("192.168.10.254", text);
}

TEST(IpText, Ipv6Text) {
  RM_IP_ADDRESS a{};
  a.flags = RM_IP_FLAG_IPV6;
  a.address[0] = 0xfe;
  a.address[1] = 0x80;
  a.address[15] = 0x01;
  std::string text;
  EXPECT_EQ(0, ipInfo2String(a, text));
  EXPECT_EQ("fe80::1", text);
}

TEST(IpText, UnresolvableText) {
  LogCapture log;
  RM_IP_ADDRESS a{};
  EXPECT_EQ(1, ipAddr2IpInfo("999.1.1.1.invalid..", &a));
  EXPECT_EQ(1, log.count("getaddrinfo fails with", NRV_CRIT));
  EXPECT_EQ(1, log.count("NRV_HostAddrStrToIPAddr returned false", NRV_ERR));
}

TEST(DecimalJoin, FitsAndStops) {
  const uint8_t b[4] = {10, 0, 255, 7};  // 255 reads as -1
  char out[32];
  EXPECT_EQ(0, joinDecimal(b, out, ".", 4, 31));
  EXPECT_STREQ("10.0.-1.7", out);
  char small[7];
  std::memset(small, 'X', sizeof small);
  EXPECT_EQ(1, joinDecimal(b, small, ".", 4, 6));
  EXPECT_STREQ("10.0", small);  // ".-1" would not fit in 6
}

TEST(VersionText, DottedParts) {
  uint16_t major = 9, minor = 9, revision = 9, build = 9;
  EXPECT_EQ(0, parseDottedVersion("12.4.270", &major, &minor, &revision, &build));
  EXPECT_EQ(12, major);
  EXPECT_EQ(4, minor);
  EXPECT_EQ(270, revision);
  EXPECT_EQ(9, build);  // missing: keeps its value
}

class SystemInfo : public ::testing::Test {
 protected:
  void SetUp() override {
    root_ = ::testing::TempDir() + "nrv_access_sysroot_" + std::to_string(getpid());
    mkdir(root_.c_str(), 0755);
    mkdir((root_ + "/proc").c_str(), 0755);
    mkdir((root_ + "/etc").c_str(), 0755);
    const char* old = std::getenv(kSysrootVariable);
    saved_ = old ? old : "";
    hadOld_ = old != nullptr;
    setenv(kSysrootVariable, root_.c_str(), 1);
  }
  void TearDown() override {
    if (hadOld_) setenv(kSysrootVariable, saved_.c_str(), 1);
    else unsetenv(kSysrootVariable);
    std::remove((root_ + "/proc/version").c_str());
    std::remove((root_ + "/etc/issue").c_str());
  }
  void write(const char* rel, const std::string& content) {
    std::ofstream(root_ + rel, std::ios::binary) << content;
  }
  std::string root_, saved_;
  bool hadOld_ = false;
};

TEST_F(SystemInfo, ReadsVersionLineAndWholeIssue) {
  write("/proc/version", "Linux version 6.1.0 (gcc 12)\nsecond line\n");
  write("/etc/issue", "Debian GNU/Linux 12 \\n \\l\n\n");
  std::string name, distribution;
  EXPECT_EQ(0u, getOSInformation(name, distribution));
  EXPECT_EQ("Linux version 6.1.0 (gcc 12)", name);
  EXPECT_EQ("Debian GNU/Linux 12 \\n \\l\n\n", distribution);
}

TEST_F(SystemInfo, MissingFilesGiveUnknown) {
  std::string name, distribution;
  EXPECT_EQ(kNrvFailure, getOSInformation(name, distribution));
  EXPECT_EQ("Unknown", name);
  EXPECT_EQ("Unknown", distribution);
  write("/proc/version", "Linux version x\n");
  LogCapture log;
  EXPECT_EQ(kNrvFailure, getOSInformation(name, distribution));
  EXPECT_EQ("Linux version x", name);
  EXPECT_EQ("Unknown", distribution);
  EXPECT_EQ(1, log.count("Unable to open the /etc/issue file to get OSDistribution Name", NRV_DBG));
}

TEST_F(SystemInfo, WritableRootIsNotReadOnly) {
  EXPECT_FALSE(IsReadOnlyFS());
  EXPECT_FALSE(IsReadOnlyFS());
}
