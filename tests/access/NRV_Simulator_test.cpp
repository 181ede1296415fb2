// The loader and the method wrapper against the simulated adapter site
// (LD_LIBRARY_PATH = the simulator's library directory): operations whose
// effect the library keeps, read back through the wrapper.
#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "TestSupport.h"
#include "access/NRV_MethodWrapper.h"
#include "access/NRV_Runtime_Loader.h"

using namespace cimple;
using nrv_test::LogCapture;

TEST(Simulator, WrapperOperationsReachTheSimulatedLibrary) {
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  EXPECT_EQ("liblrmapi.so", NRV_Runtime_Loader::fileName(NRV_Runtime_Loader::kLrmApiSlot));
  EXPECT_EQ("libHBAAPI.so.2", NRV_Runtime_Loader::fileName(NRV_Runtime_Loader::kHbaApiSlot));
  {
    NRV_MethodWrapper wrapper;
    std::string version;
    EXPECT_EQ(0u, NRV_MethodWrapper::GetLibraryVersion(102, version));
    EXPECT_FALSE(version.empty());

    HBA_UINT32 count = 1;
    std::vector<HBA_UINT32> instances(count);
    RM_STATUS status = RM_GetAllLocalHBAInstances(&count, instances.data());
    if (status == RM_STATUS_ERROR_BUFFER_TOO_SMALL) {
      instances.resize(count);
      status = RM_GetAllLocalHBAInstances(&count, instances.data());
    }
    ASSERT_EQ(0u, status);
    ASSERT_GT(count, 0u);
    RM_ADAPTER_INSTANCE pair{0, instances[0]};
    RM_LOCAL_HBA_INFO_V4 info{};
    ASSERT_EQ(0u, RM_GetLocalHBAInfoV4(&pair, &info));
    // The identifier the library hands out is local, and survives the text forms.
    EXPECT_EQ(0, NRV_MethodWrapper::Validatewwpn(info.wwpn));
    char plain[kHbaNamePlainSize];
    HBA_NAME back{};
    ASSERT_EQ(1, string2HBAName(&back, HBAName2string(info.wwpn, plain)));
    EXPECT_EQ(0, NRV_MethodWrapper::Validatewwpn(back));
    bool nic = false, iscsi = false, fcoe = false, roce = false;
    EXPECT_EQ(0u, NRV_MethodWrapper::GetCNAType(info.wwpn, nic, iscsi, fcoe, roce));
    HBA_NAME stranger{{0x99, 0x99, 0x99, 0x99, 0x99, 0x99, 0x99, 0x99}};
    EXPECT_EQ(1, NRV_MethodWrapper::Validatewwpn(stranger));
  }
  EXPECT_EQ(0, NRV_Runtime_Loader::unloadLibraries());
}

namespace {

// The simulated site with the wrapper constructed; functions by protocol.
class SimulatedSite : public ::testing::Test {
 protected:
  void SetUp() override {
    ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
    m_wrapper = std::make_unique<NRV_MethodWrapper>();
    HBA_UINT32 count = 64;
    std::vector<HBA_UINT32> instances(count);
    ASSERT_EQ(0u, RM_GetAllLocalHBAInstances(&count, instances.data()));
    for (HBA_UINT32 i = 0; i < count; ++i) {
      RM_ADAPTER_INSTANCE pair{0, instances[i]};
      RM_LOCAL_HBA_INFO_V4 info{};
      if (RM_GetLocalHBAInfoV4(&pair, &info) == 0) m_functions.push_back(info);
    }
  }
  void TearDown() override {
    m_wrapper.reset();
    NRV_Runtime_Loader::unloadLibraries();
  }
  // The first function carrying `protocol`; skips the test when there is none.
  bool find(HBA_UINT32 protocol, HBA_NAME& name, size_t skip = 0) {
    for (const auto& f : m_functions)
      if ((f.protocolMask & protocol) != 0 && skip-- == 0) {
        name = f.wwpn;
        return true;
      }
    return false;
  }
  std::unique_ptr<NRV_MethodWrapper> m_wrapper;
  std::vector<RM_LOCAL_HBA_INFO_V4> m_functions;
  LogCapture m_log;
};

bool holds(const std::vector<RM_IP_ADDRESS>& list, const RM_IP_ADDRESS& a) {
  for (const auto& e : list)
    if (std::memcmp(e.address, a.address, sizeof a.address) == 0 && e.port == a.port) return true;
  return false;
}

}  // namespace

TEST_F(SimulatedSite, ISNSServerAddedListedAndDeleted) {
  HBA_NAME port;
  if (!find(RM_PROTOCOL_ISCSI, port)) GTEST_SKIP() << "no iSCSI function in the site";
  RM_IP_ADDRESS server;
  ASSERT_TRUE(NRV_MethodWrapper::makeAddress("10.9.8.7", 3205, server));
  // The simulated library does not ping: the server is added all the same.
  EXPECT_EQ(0u, NRV_MethodWrapper::UpdateiSNSServer(port, "10.9.8.7", 3205, 1));
  EXPECT_EQ(1, m_log.count("iSNS server has been updated, but IP address is unreachable", NRV_WARN));
  std::vector<RM_IP_ADDRESS> servers;
  ASSERT_EQ(0u, NRV_MethodWrapper::GetiSNSServer(port, servers));
  EXPECT_TRUE(holds(servers, server));
  // The library refuses the same server twice.
  EXPECT_NE(0u, NRV_MethodWrapper::UpdateiSNSServer(port, "10.9.8.7", 3205, 1));
  EXPECT_EQ(0u, NRV_MethodWrapper::DeleteiSNSServer(port, "10.9.8.7", 3205));
  ASSERT_EQ(0u, NRV_MethodWrapper::GetiSNSServer(port, servers));
  EXPECT_FALSE(holds(servers, server));
  EXPECT_NE(0u, NRV_MethodWrapper::DeleteiSNSServer(port, "10.9.8.7", 3205));
}

TEST_F(SimulatedSite, DumpFilesFollowTheRetentionCount) {
  HBA_NAME port;
  if (!find(~0u, port)) GTEST_SKIP() << "no function in the site";
  ASSERT_EQ(0u, NRV_MethodWrapper::nrvcimDeleteDumpFiles(port));
  ASSERT_EQ(0u, NRV_MethodWrapper::SetRetentionCount(port, 6));
  HBA_UINT32 count = 0;
  ASSERT_EQ(0u, NRV_MethodWrapper::nrvcimGetRetentionCount(port, count));
  EXPECT_EQ(6u, count);
  for (int i = 0; i < 7; ++i) ASSERT_EQ(0u, NRV_MethodWrapper::nrvcimDumpDiagnostic(port, i % 2));
  ASSERT_EQ(0u, NRV_MethodWrapper::nrvcimDumpDiagnostic(port, -1));
  // More names than the first request has room for.
  std::vector<std::string> files;
  ASSERT_EQ(0u, NRV_MethodWrapper::GetDumpFileNames(port, files));
  ASSERT_EQ(6u, files.size());
  EXPECT_NE(std::string::npos, files.back().find("_fat_"));
  ASSERT_EQ(0u, NRV_MethodWrapper::nrvcimDeleteDumpFiles(port));
  ASSERT_EQ(0u, NRV_MethodWrapper::GetDumpFileNames(port, files));
  EXPECT_TRUE(files.empty());
}

TEST_F(SimulatedSite, DriverParameterChangeIsReadBack) {
  HBA_NAME port;
  if (!find(RM_PROTOCOL_FCOE, port)) GTEST_SKIP() << "no FCoE function in the site";
  std::vector<RM_DRIVER_PARAM> params;
  ASSERT_EQ(0u, NRV_MethodWrapper::ReadDriverParams(port, false, params));
  ASSERT_FALSE(params.empty());
  const RM_DRIVER_PARAM& first = params.front();
  const std::string name(first.name, strnlen(first.name, sizeof first.name));
  ASSERT_FALSE(name.empty());
  const HBA_UINT32 wanted = first.currentValue == first.minValue ? first.maxValue : first.minValue;
  ASSERT_EQ(0u, NRV_MethodWrapper::nrvcimSetDriverParam(port, false, true, name,
                                                        std::to_string(wanted)));
  ASSERT_EQ(0u, NRV_MethodWrapper::ReadDriverParams(port, false, params));
  EXPECT_EQ(wanted, params.front().currentValue);
  std::vector<RM_DRIVER_PARAM> global;
  EXPECT_EQ(0u, NRV_MethodWrapper::ReadDriverParams(port, true, global));
}

TEST_F(SimulatedSite, VitalProductDataWalk) {
  HBA_NAME port;
  if (!find(~0u, port)) GTEST_SKIP() << "no function in the site";
  std::vector<std::pair<std::string, std::string>> entries;
  ASSERT_EQ(0u, NRV_MethodWrapper::ReadVPD(port, entries));
  ASSERT_FALSE(entries.empty());
  for (const auto& e : entries) EXPECT_FALSE(e.first.empty());
}

TEST_F(SimulatedSite, NamesInUseAreRefusedBeforeTheLibraryIsAsked) {
  HBA_NAME port;
  if (!find(RM_PROTOCOL_FCOE, port)) GTEST_SKIP() << "no FCoE function in the site";
  // Another function whose name would pass as a world-wide name of its own.
  const RM_LOCAL_HBA_INFO_V4* other = nullptr;
  for (const auto& f : m_functions)
    if (std::memcmp(&f.wwpn, &port, sizeof port) != 0 && RM_ValidateWwn(f.wwpn) == 0) other = &f;
  if (other == nullptr) GTEST_SKIP() << "no second function with a world-wide name";
  HBA_NAME wwpn{}, wwnn{};
  HBA_UINT32 op = 0;
  ASSERT_EQ(0u, NRV_MethodWrapper::ReadWWN(port, 3, wwpn, wwnn, op));
  EXPECT_EQ(0, std::memcmp(&wwpn, &port, sizeof port));
  // Another function's port name.
  EXPECT_EQ(kNrvFailure, NRV_MethodWrapper::ChangeWWN(port, 0, other->wwpn, wwnn, op));
  EXPECT_EQ(1, m_log.count("ChangeWWN: Duplication of vport WWPN detected.", NRV_ERR));
  // A name the library does not accept.
  const HBA_NAME zero{};
  EXPECT_EQ(kNrvFailure, NRV_MethodWrapper::ChangeWWN(port, 0, zero, wwnn, op));
  EXPECT_EQ(1, m_log.count("The supplied 'New WWPN' is not valid", NRV_ERR));
  // The port keeps its name.
  HBA_NAME now{}, node{};
  ASSERT_EQ(0u, NRV_MethodWrapper::ReadWWN(port, 3, now, node, op));
  EXPECT_EQ(0, std::memcmp(&now, &port, sizeof port));
}

namespace {
std::vector<bool> g_sanChanges;
void recordSanChange(bool rebuildNow) { g_sanChanges.push_back(rebuildNow); }

HBA_UINT32 targetCount(const HBA_NAME& port) {
  std::vector<uint8_t> list;
  if (NRV_MethodWrapper::GetiSCSITargetList(port, 0, list) != 0 || list.size() < 4) return ~0u;
  HBA_UINT32 count = 0;
  std::memcpy(&count, list.data(), sizeof count);
  return count;
}
}  // namespace

TEST_F(SimulatedSite, StaticTargetAddedAndRemovedTellsTheCatalogue) {
  HBA_NAME port;
  if (!find(RM_PROTOCOL_ISCSI, port)) GTEST_SKIP() << "no iSCSI function in the site";
  const std::string target = "iqn.2026-12.com.norvane:wrapper-test";
  const HBA_UINT32 before = targetCount(port);
  ASSERT_NE(~0u, before);
  g_sanChanges.clear();
  NRV_MethodWrapper::setSanChangeHandler(recordSanChange);
  const RM_ISCSI_LOGIN_OPTIONS options{};
  const RM_ISCSI_AUTH auth{};
  ASSERT_EQ(0u, NRV_MethodWrapper::AddTarget(port, target, "10.20.30.40", 3260, false, false,
                                             options, auth));
  EXPECT_EQ(before + 1, targetCount(port));
  EXPECT_EQ(0u, NRV_MethodWrapper::RemoveTarget(port, target));
  EXPECT_EQ(before, targetCount(port));
  // Gone already: the library's refusal reaches no one.
  EXPECT_NE(0u, NRV_MethodWrapper::RemoveTarget(port, target));
  NRV_MethodWrapper::setSanChangeHandler(nullptr);
  EXPECT_EQ((std::vector<bool>{true, true}), g_sanChanges);
  EXPECT_EQ(1, m_log.count("AddTarget: Target added. Refreshing SAN Data."));
  EXPECT_EQ(1, m_log.count("RemoveTarget: Target removed. Refreshing SAN Data."));
}
