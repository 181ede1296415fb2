// Setting calls (FIP parameters, adapter attributes written by number): what
// is written is what later reads return.
#include <gtest/gtest.h>

#include <cstring>

#include "SimLibrary.h"
#include "access/RM_SettingRecords.h"
#include "sim/SimSite.h"

namespace nrvsim_test {
namespace {

class Settings : public ::testing::Test {
 protected:
  void SetUp() override {
    ASSERT_TRUE(lrmapi().ok()) << dlerror();
    ASSERT_TRUE(nrvsim::SimSite::instance().reload(sample_site()));
    nic_ = name_of(0);
    fcoe_ = name_of(4);
  }
  static HBA_NAME name_of(HBA_UINT32 instance) {
    RM_ADAPTER_INSTANCE pair{0, instance};
    RM_LOCAL_HBA_INFO_V4 info{};
    EXPECT_EQ(SIM_CALL(lrmapi(), RM_GetLocalHBAInfoV4, &pair, &info), 0u);
    return info.wwpn;
  }
  HBA_NAME nic_{}, fcoe_{};
};

TEST_F(Settings, FipParametersRoundTripOnFcoeOnly) {
  RM_FIP_PARAMS fip{};
  HBA_UINT32 size = sizeof fip;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_CNA_FCOE_GetFIPParams, fcoe_, &fip, &size), 0u);
  EXPECT_EQ(fip.fcMap[0], 0x0E);
  EXPECT_EQ(fip.fcMap[1], 0xFC);
  fip.cinVlanId = 1003;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_CNA_FCOE_SetFIPParams, fcoe_, &fip, sizeof fip), 0u);
  RM_FIP_PARAMS back{};
  size = sizeof back;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_CNA_FCOE_GetFIPParams, fcoe_, &back, &size), 0u);
  EXPECT_EQ(back.cinVlanId, 1003u);
  size = sizeof back;
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_CNA_FCOE_GetFIPParams, nic_, &back, &size), RM_STATUS_ITEM_NOT_OFFERED);
}

TEST_F(Settings, AttributeWrittenByNumberShowsInTheNextBlob) {
  const HBA_UINT32 on = 1;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_SetAdapterAttribute, fcoe_, RM_PA_PFC_THROTTLE, &on, sizeof on), 0u);
  std::vector<unsigned char> blob(RM_PORT_ATTRIBUTES_SIZE);
  HBA_UINT32 size = RM_PORT_ATTRIBUTES_SIZE;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_GetPortAttributes, fcoe_, blob.data(), &size), 0u);
  HBA_UINT16 len = 0;
  HBA_UINT32 status = 1;
  void* p = SIM_CALL(lrmapi(), RM_GetAttributeValue, blob.data(), RM_PA_PFC_THROTTLE, &len, &status);
  ASSERT_NE(p, nullptr);
  HBA_UINT32 value = 0;
  std::memcpy(&value, p, sizeof value);
  EXPECT_EQ(value, 1u);
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_SetNetbootParams, nic_, 'E', "ibft"), 0u);
  blob.assign(RM_HBA_ATTRIBUTES_SIZE, 0);
  size = RM_HBA_ATTRIBUTES_SIZE;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_GetHBAAttributes, nic_, blob.data(), &size), 0u);
  p = SIM_CALL(lrmapi(), RM_GetAttributeValue, blob.data(), RM_HA_NETBOOT_METHOD, &len, &status);
  ASSERT_NE(p, nullptr);
  EXPECT_EQ(std::string(static_cast<char*>(p), len), "ibft");
}

}  // namespace
}  // namespace nrvsim_test
