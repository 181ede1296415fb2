// The wrapper operations with logic of their own, against the stub management
// library: address records, the iSNS update sequence, the portal re-add on a
// digest mismatch, FIP texts, CEE parameter routing, feature gates, growing
// lists and lists that claim more than they hold.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "TestSupport.h"
#include "access/NRV_MethodWrapper.h"
#include "access/NRV_Runtime_Loader.h"

using namespace cimple;
using nrv_test::LogCapture;
using nrv_test::runInChild;
using nrv_test::stubDir;

namespace {

std::string stubPath() { return stubDir("nohba") + ":" + stubDir("lrm") + ":" + stubDir("nomgmt"); }

template <class Fn>
Fn stubFunction(const char* symbol) {
  void* h = dlopen("liblrmapi.so", RTLD_NOW | RTLD_NOLOAD);
  void* p = h ? dlsym(h, symbol) : nullptr;
  if (h) dlclose(h);
  return reinterpret_cast<Fn>(p);
}

// The stub's record of the calls it answered; reading it clears it.
class Calls {
 public:
  // Resolves the stub's controls once the library is loaded.
  bool bind() {
    m_text = stubFunction<const char* (*)()>("stub_calls");
    m_clear = stubFunction<void (*)()>("stub_clear_calls");
    if (m_clear) m_clear();
    return m_text && m_clear;
  }
  std::string operator()() {
    std::string all = m_text();
    m_clear();
    return all;
  }

 private:
  const char* (*m_text)() = nullptr;
  void (*m_clear)() = nullptr;
};

// A name the stub answers as local; `byte5` steers the stub's FIP answers.
HBA_NAME local(unsigned char byte5 = 0) {
  HBA_NAME n{{0x20, 0, 0, 0, 0, byte5, 0, 0}};
  return n;
}
const HBA_NAME kRemote{{0x10, 0, 0, 0, 0, 0, 0, 0}};

// Runs the scenarios of one child test with the stub library loaded.
class StubLibrary : public ::testing::Test {
 protected:
  void SetUp() override {
    ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
    m_wrapper = std::make_unique<NRV_MethodWrapper>();
    ASSERT_TRUE(m_calls.bind());
  }
  void TearDown() override {
    m_wrapper.reset();
    NRV_Runtime_Loader::unloadLibraries();
  }
  std::unique_ptr<NRV_MethodWrapper> m_wrapper;
  Calls m_calls;
  LogCapture m_log;
};

}  // namespace

// ---- Address records (no library) ---------------------------------------------------

TEST(WrapperAddress, DottedIPv4FillsTheFirstFourBytesAndThePort) {
  RM_IP_ADDRESS a;
  ASSERT_TRUE(NRV_MethodWrapper::makeAddress("10.1.2.254", 3260, a));
  EXPECT_EQ(10, a.address[0]);
  EXPECT_EQ(254, a.address[3]);
  EXPECT_EQ(0, a.address[4]);
  EXPECT_EQ(3260, a.port);
  EXPECT_EQ(0, a.flags & RM_IP_FLAG_IPV6);
}

TEST(WrapperAddress, IPv6IsFlagged) {
  RM_IP_ADDRESS a;
  ASSERT_TRUE(NRV_MethodWrapper::makeAddress("fe80::1", 3205, a));
  EXPECT_EQ(0xFE, a.address[0]);
  EXPECT_EQ(1, a.address[15]);
  EXPECT_EQ(RM_IP_FLAG_IPV6, a.flags & RM_IP_FLAG_IPV6);
}

TEST(WrapperAddress, EmptyTextIsRefused) {
  RM_IP_ADDRESS a;
  EXPECT_FALSE(NRV_MethodWrapper::makeAddress("", 3260, a));
}

// ---- Scenarios against the stub (each in its own process) -------------------------------

TEST(WrapperOperations, AgainstTheStubLibrary) {
  EXPECT_EQ(0, runInChild("StubLibrary.DISABLED_*", stubPath()));
}

TEST_F(StubLibrary, DISABLED_UnknownPortsNeverReachTheLibrary) {
  RM_ISCSI_LOGIN_OPTIONS options{};
  const RM_ISCSI_AUTH auth{};
  std::vector<std::string> files;
  EXPECT_EQ(1u, NRV_MethodWrapper::UpdateiSNSServer(kRemote, "10.0.0.5", 3205, 1));
  EXPECT_EQ(1u, NRV_MethodWrapper::AddTargetPortal(kRemote, "10.0.0.5", 3260, options, auth));
  EXPECT_EQ(1u, NRV_MethodWrapper::nrvcimSetCEEParams(kRemote, "dcbxstate", 1));
  EXPECT_EQ(1u, NRV_MethodWrapper::GetDumpFileNames(kRemote, files));
  EXPECT_EQ("", m_calls());
  EXPECT_EQ(4, m_log.count("INVALID wwpn", NRV_ERR));
}

TEST_F(StubLibrary, DISABLED_ISNSUpdatePingsAddsThenEnables) {
  EXPECT_EQ(0u, NRV_MethodWrapper::UpdateiSNSServer(local(), "10.0.0.5", 3205, 1));
  EXPECT_EQ("ping 10 3205;addisns 10 3205;isnsstate 1 0;", m_calls());
  EXPECT_EQ(0, m_log.count("iSNS server has been updated, but IP address is unreachable"));

  // A silent server is still added, with a warning.
  EXPECT_EQ(0u, NRV_MethodWrapper::UpdateiSNSServer(local(), "172.16.0.1", 3205, 0));
  EXPECT_EQ("ping 172 3205;addisns 172 3205;isnsstate 0 0;", m_calls());
  EXPECT_EQ(1,
            m_log.count("iSNS server has been updated, but IP address is unreachable", NRV_WARN));

  // A refused add leaves the iSNS state alone and reports the library's status.
  EXPECT_EQ(33u, NRV_MethodWrapper::UpdateiSNSServer(local(), "192.168.0.1", 3205, 1));
  EXPECT_EQ("ping 192 3205;addisns 192 3205;", m_calls());

  EXPECT_EQ(NRV_MethodWrapper::kBadAddress,
            NRV_MethodWrapper::UpdateiSNSServer(local(), "", 3205, 1));
  EXPECT_EQ("", m_calls());
}

TEST_F(StubLibrary, DISABLED_PortalWithStaleDigestsIsReAddedOnce) {
  auto digests = stubFunction<void (*)(int)>("stub_set_portal_digests");
  ASSERT_NE(nullptr, digests);
  const RM_ISCSI_AUTH auth{};

  digests(1);
  RM_ISCSI_LOGIN_OPTIONS none{};
  EXPECT_EQ(0u, NRV_MethodWrapper::AddTargetPortal(local(), "10.0.0.9", 3260, none, auth));
  EXPECT_EQ("addportal 0 0;removeportal 0 0;addportal 0 0;", m_calls());
  EXPECT_EQ(0, none.headerDigest);

  // Asked with a digest, the mismatch is the caller's to report.
  digests(1);
  RM_ISCSI_LOGIN_OPTIONS header{};
  header.headerDigest = 1;
  EXPECT_EQ(116u, NRV_MethodWrapper::AddTargetPortal(local(), "10.0.0.9", 3260, header, auth));
  EXPECT_EQ("addportal 1 0;", m_calls());
  digests(0);
}

TEST_F(StubLibrary, DISABLED_LogoutNamesTheTargetAddressOnlyWhenGiven) {
  EXPECT_EQ(0u, NRV_MethodWrapper::TargetLogout(local(), "iqn.2001-05.com.example:t1", 17, ""));
  EXPECT_EQ(0u,
            NRV_MethodWrapper::TargetLogout(local(), "iqn.2001-05.com.example:t1", 18, "10.1.1.1"));
  EXPECT_EQ("logout 17 0;logout 18 1;", m_calls());
  // The session record holds an IPv4 address only.
  EXPECT_EQ(NRV_MethodWrapper::kBadAddress,
            NRV_MethodWrapper::TargetLogout(local(), "iqn.2001-05.com.example:t1", 19, "fe80::1"));
  EXPECT_EQ("", m_calls());
}

TEST_F(StubLibrary, DISABLED_FIPParametersAsTexts) {
  NRV_MethodWrapper::FIPParams p;
  EXPECT_EQ(0u, NRV_MethodWrapper::nrvGetFIPParams(local(1), p));
  EXPECT_EQ("10:00:00:00:C9:AA:BB:CC", p.fabricName);
  EXPECT_EQ("20:01:00:05:1E:0A:0B:0C", p.switchName);
  EXPECT_EQ("1002", p.vlan);
  EXPECT_EQ("0x0EFC00", p.fcMap);
  EXPECT_EQ(7u, p.cinVlanId);
  // Without the VLAN flag the VLAN is any.
  EXPECT_EQ(0u, NRV_MethodWrapper::nrvGetFIPParams(local(0), p));
  EXPECT_EQ("Any", p.vlan);

  HBA_NAME failing = local();
  failing.wwn[6] = 0xEE;  // the stub's feature query answers 190
  EXPECT_EQ(190u, NRV_MethodWrapper::nrvGetFIPParams(failing, p));
  EXPECT_EQ(1, m_log.count("Failed to get the feature, returned with value 190", NRV_ERR));
}

TEST_F(StubLibrary, DISABLED_FIPParametersWrittenBack) {
  NRV_MethodWrapper::FIPParams p;
  p.vlan = "Any";
  p.fcMap = "0x0EFC01";
  p.cinVlanId = 9;
  EXPECT_EQ(0u, NRV_MethodWrapper::nrvSetFIPParams(local(1), p));
  EXPECT_EQ("setfcf 0 1002;setfip 982017 9;", m_calls());

  p.vlan = "4001";
  EXPECT_EQ(0u, NRV_MethodWrapper::nrvSetFIPParams(local(), p));
  EXPECT_EQ("setfcf 32 4001;setfip 982017 9;", m_calls());

  for (const char* bad : {"0EFC01", "0x0EFC01z", "0x1234567"}) {
    p.fcMap = bad;
    EXPECT_EQ(kNrvFailure, NRV_MethodWrapper::nrvSetFIPParams(local(), p)) << bad;
  }
  p.fcMap.clear();
  p.vlan = "4096";
  EXPECT_EQ(kNrvFailure, NRV_MethodWrapper::nrvSetFIPParams(local(), p));
  EXPECT_EQ("", m_calls());
}

TEST_F(StubLibrary, DISABLED_CEEParametersGoToTheirOwnWriter) {
  const struct {
    const char* key;
    const char* call;
  } routes[] = {
      {"dcbxstate", "dcbx 1 5;"},         {"txstate", "lldp 2 5;"},
      {"rxstate", "lldp 3 5;"},           {"txportdesc", "tlv 4 5;"},
      {"txsysdesc", "tlv 6 5;"},          {"txsysname", "tlv 5 5;"},
      {"txsyscap", "tlv 7 5;"},           {"pfcenabled", "pfc 8 4;"},
      {"fcoepriority", "pgsetting 5 5;"}, {"iscsipriority", "pgsetting 6 5;"},
      {"rocepriority", "pgsetting 7 5;"},
  };
  for (const auto& r : routes) {
    EXPECT_EQ(0u, NRV_MethodWrapper::nrvcimSetCEEParams(local(), r.key, 5)) << r.key;
    EXPECT_EQ(r.call, m_calls()) << r.key;
  }
  EXPECT_EQ(kNrvFailure, NRV_MethodWrapper::nrvcimSetCEEParams(local(), "DCBXSTATE", 5));
  EXPECT_EQ("", m_calls());
}

TEST_F(StubLibrary, DISABLED_MissingFeaturesAnswerNotSupported) {
  // The stub offers neither priority groups (400) nor channel management (435).
  const RM_PG_PRIORITY_BITMAPS groups{};
  const RM_PG_BANDWIDTH bandwidth{};
  EXPECT_EQ(NRV_MethodWrapper::kNotSupported,
            NRV_MethodWrapper::nrvcimSetCeePriority(local(), groups, 0));
  EXPECT_EQ(NRV_MethodWrapper::kNotSupported, NRV_MethodWrapper::nrvcimSetPgBW(local(), bandwidth));
  EXPECT_EQ(NRV_MethodWrapper::kNotSupported, NRV_MethodWrapper::SetCMMode(local(), 2));
  EXPECT_EQ("", m_calls());
}

TEST_F(StubLibrary, DISABLED_DumpFileNamesAskAgainWithRoomForAll) {
  std::vector<std::string> files;
  EXPECT_EQ(0u, NRV_MethodWrapper::GetDumpFileNames(local(), files));
  EXPECT_EQ("dumpnames 4 0;dumpnames 6 0;", m_calls());
  ASSERT_EQ(6u, files.size());
  EXPECT_EQ("dump0.fat", files[0]);
  EXPECT_EQ("dump5.fat", files[5]);
}

TEST_F(StubLibrary, DISABLED_TablesGrowToTheReportedCount) {
  std::vector<RM_ROUTE_ENTRY> routes;
  EXPECT_EQ(0u, NRV_MethodWrapper::discoverRoute(local(), routes));
  ASSERT_EQ(40u, routes.size());
  EXPECT_EQ(1, routes[0].destination.address[0]);
  EXPECT_EQ(40, routes[39].gateway.address[15]);
}

TEST_F(StubLibrary, DISABLED_ACountBeyondTheBufferIsNotBelieved) {
  // The stub claims 1000 dead ports in a buffer of 16.
  std::vector<std::string> ports;
  EXPECT_EQ(0u, NRV_MethodWrapper::GetDeadNICPorts(ports));
  ASSERT_EQ(1u, ports.size());
  EXPECT_EQ("02-11-22-33-44-55", ports[0]);
}

TEST_F(StubLibrary, DISABLED_DriverParameterCountsAreHeldToTheRecordsGiven) {
  std::vector<RM_DRIVER_PARAM> params;
  // 1000 claimed after filling the 52 records there was room for.
  EXPECT_EQ(0u, NRV_MethodWrapper::ReadDriverParams(local(), true, params));
  EXPECT_EQ(52u, params.size());
  EXPECT_EQ(51u, params.back().currentValue);
  // Four thousand million asked for: not allocated, the call fails.
  EXPECT_EQ(7u, NRV_MethodWrapper::ReadDriverParams(local(), false, params));
  EXPECT_TRUE(params.empty());
  EXPECT_EQ(1, m_log.count("ERROR: nrvcimGetDriverParams: RM_GetDriverParams call failed (a) (7)"));
}

TEST_F(StubLibrary, DISABLED_CoreDumpOfADeadPort) {
  const HBA_NAME dead{{0x02, 0x11, 0x22, 0x33, 0x44, 0x55, 0x00, 0x00}};
  EXPECT_EQ(0u, NRV_MethodWrapper::nrvcimGetCoreDump(dead, "dead"));
  EXPECT_EQ("coredump 4 0;", m_calls());
  const HBA_NAME stranger{{0x02, 0x11, 0x22, 0x33, 0x44, 0x56, 0x00, 0x00}};
  EXPECT_EQ(1u, NRV_MethodWrapper::nrvcimGetCoreDump(stranger, "dead"));
  EXPECT_EQ("", m_calls());
}

TEST_F(StubLibrary, DISABLED_LibraryVersionsByCode) {
  std::string rmapi, dfc, tiro;
  EXPECT_EQ(0u, NRV_MethodWrapper::GetLibraryVersion(102, rmapi));
  EXPECT_EQ(0u, NRV_MethodWrapper::GetLibraryVersion(104, dfc));
  EXPECT_EQ(0u, NRV_MethodWrapper::GetTIROLibVersion(tiro));
  EXPECT_EQ("12.4.270.9", rmapi);
  EXPECT_EQ("dfc 5.2", dfc);
  EXPECT_EQ("3.1", tiro);
}

namespace {
std::vector<bool> g_sanChanges;
void recordSanChange(bool rebuildNow) { g_sanChanges.push_back(rebuildNow); }
}  // namespace

TEST_F(StubLibrary, DISABLED_SanChangesReachTheirHandlerOnlyOnSuccess) {
  g_sanChanges.clear();
  NRV_MethodWrapper::setSanChangeHandler(recordSanChange);
  EXPECT_EQ(0u, NRV_MethodWrapper::TargetLogout(local(), "iqn.2001-05.com.example:t1", 1, ""));
  EXPECT_EQ(1, m_log.count("TargetLogout: Logout done. Refreshing SAN Data.", NRV_DBG));
  RM_ISCSI_LOGIN_OPTIONS options{};
  const RM_ISCSI_AUTH auth{};
  EXPECT_EQ(0u, NRV_MethodWrapper::AddTargetPortal(local(), "10.0.0.9", 3260, options, auth));
  // Not in the stub: the forwarder's failure changes nothing.
  EXPECT_EQ(1u, NRV_MethodWrapper::RemoveTarget(local(), "iqn.2001-05.com.example:t1"));
  EXPECT_EQ(0, m_log.count("RemoveTarget: Target removed. Refreshing SAN Data."));
  EXPECT_EQ((std::vector<bool>{true, false}), g_sanChanges);
  NRV_MethodWrapper::setSanChangeHandler(nullptr);
}
