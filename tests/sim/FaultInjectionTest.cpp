// Faults named in a site file reach the module's calls: a status for the n-th
// call, for one adapter or LUN, and a delay.
#include <gtest/gtest.h>

#include <chrono>
#include <fstream>
#include <sstream>

#include "SimLibrary.h"
#include "sim/SimSite.h"

namespace nrvsim_test {
namespace {

// The sample site with `faults` (a JSON array) added.
std::string site_with_faults(const std::string& name, const std::string& faults) {
  std::ifstream in(sample_site());
  std::ostringstream s;
  s << in.rdbuf();
  std::string text = s.str();
  const size_t brace = text.rfind('}');
  text.insert(brace, ",\n\"faults\": " + faults + "\n");
  return write_site(name, text);
}

class FaultInjection : public ::testing::Test {
 protected:
  void load(const std::string& faults) {
    ASSERT_TRUE(nrvsim::SimSite::instance().reload(site_with_faults("sim_fault_site.json", faults)))
        << nrvsim::SimSite::instance().error();
  }
  void TearDown() override { nrvsim::SimSite::instance().reload(sample_site()); }
};

TEST_F(FaultInjection, NthCallOfAnOperationUnderEitherName) {
  load(R"([{"function": "RM_GetHBAAttributes", "status": 190, "call": 2}])");
  RM_ADAPTER_INSTANCE pair{0, 0};
  RM_LOCAL_HBA_INFO_V4 info{};
  ASSERT_EQ(SIM_CALL(lrmapi(), RM_GetLocalHBAInfoV4, &pair, &info), 0u);
  std::vector<unsigned char> blob(RM_HBA_ATTRIBUTES_SIZE);
  auto get = [&] {
    HBA_UINT32 size = RM_HBA_ATTRIBUTES_SIZE;
    return SIM_CALL(lrmapi(), LRM_GetHBAAttributes, info.wwpn, blob.data(), &size);
  };
  EXPECT_EQ(get(), 0u);
  EXPECT_EQ(get(), RM_STATUS_ITEM_NOT_OFFERED);
  EXPECT_EQ(get(), 0u);
}

TEST_F(FaultInjection, StaleMappingThreeTimesThenFine) {
  load(R"([{"function": "HBA_GetFcpTargetMapping", "status": 8, "call": 1, "count": 3}])");
  char name[256] = {};
  ASSERT_EQ(SIM_CALL(hbaapi(), HBA_GetAdapterName, 0, name), 0u);
  const HBA_HANDLE h = SIM_CALL(hbaapi(), HBA_OpenAdapter, name);
  std::vector<unsigned char> buf(8 + 304 * 8);
  auto* m = reinterpret_cast<HBA_FCPTARGETMAPPING*>(buf.data());
  for (int i = 0; i < 3; ++i) {
    m->NumberOfEntries = 8;
    EXPECT_EQ(SIM_CALL(hbaapi(), HBA_GetFcpTargetMapping, h, m), static_cast<HBA_STATUS>(HBA_STATUS_ERROR_STALE_DATA));
    SIM_CALL(hbaapi(), HBA_RefreshInformation, h);
  }
  m->NumberOfEntries = 8;
  EXPECT_EQ(SIM_CALL(hbaapi(), HBA_GetFcpTargetMapping, h, m), 0u);
  SIM_CALL(hbaapi(), HBA_CloseAdapter, h);
}

TEST_F(FaultInjection, CheckConditionForOneLunOnly) {
  load(R"([{"function": "HBA_SendScsiInquiry", "status": 9, "lun": 2, "adapter": "10:00:00:90:fa:5c:2e:12"}])");
  char name[256] = {};
  ASSERT_EQ(SIM_CALL(hbaapi(), HBA_GetAdapterName, 0, name), 0u);
  const HBA_HANDLE h = SIM_CALL(hbaapi(), HBA_OpenAdapter, name);
  const HBA_WWN target{{0x50, 0x06, 0x01, 0x60, 0x3e, 0xa0, 0x12, 0x34}};
  unsigned char rsp[255], sense[128];
  auto inquiry = [&](uint64_t lun) {
    return SIM_CALL(hbaapi(), HBA_SendScsiInquiry, h, target, static_cast<HBA_UINT64>(lun << 48), 0, 0, rsp,
                    sizeof rsp, sense, sizeof sense);
  };
  EXPECT_EQ(inquiry(1), 0u);
  for (int i = 0; i < 3; ++i) EXPECT_EQ(inquiry(2), 9u);
  EXPECT_EQ(inquiry(3), 0u);
  SIM_CALL(hbaapi(), HBA_CloseAdapter, h);
}

TEST_F(FaultInjection, OpenFailsForOneAdapterOnly) {
  load(R"([{"function": "HBA_OpenAdapter", "status": 0, "adapter": "10:00:00:90:fa:5c:2e:16"}])");
  char first[256] = {}, second[256] = {};
  ASSERT_EQ(SIM_CALL(hbaapi(), HBA_GetAdapterName, 0, first), 0u);
  ASSERT_EQ(SIM_CALL(hbaapi(), HBA_GetAdapterName, 1, second), 0u);
  const HBA_HANDLE h = SIM_CALL(hbaapi(), HBA_OpenAdapter, first);
  EXPECT_NE(h, 0u);
  EXPECT_EQ(SIM_CALL(hbaapi(), HBA_OpenAdapter, second), 0u);
  SIM_CALL(hbaapi(), HBA_CloseAdapter, h);
}

TEST_F(FaultInjection, DelayIsSpentAndTheAnswerIsStillReal) {
  load(R"([{"function": "RM_GetNumberOfLocalAdapters", "delay_ms": 30}])");
  const auto start = std::chrono::steady_clock::now();
  EXPECT_EQ(SIM_CALL(lrmapi(), RM_GetNumberOfLocalAdapters), 10u);
  EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(30));
}

TEST_F(FaultInjection, FailingInitLib) {
  load(R"([{"function": "LRM_InitLib", "status": 1}])");
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_InitLib), 1u);
}

}  // namespace
}  // namespace nrvsim_test
