// Faults named in a site file reach the module's calls (the module's fault
// tests use the rest of the rules): a status for the n-th call.
#include <gtest/gtest.h>

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

TEST_F(FaultInjection, FailingInitLib) {
  load(R"([{"function": "LRM_InitLib", "status": 1}])");
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_InitLib), 1u);
}

}  // namespace
}  // namespace nrvsim_test
