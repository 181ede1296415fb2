// Setting calls: FIP and FCF lists, DCB state, QoS and adapter attributes
// written by number; what is written is what later reads return.
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
    tenbaset_ = name_of(9);
  }
  static HBA_NAME name_of(HBA_UINT32 instance) {
    RM_ADAPTER_INSTANCE pair{0, instance};
    RM_LOCAL_HBA_INFO_V4 info{};
    EXPECT_EQ(SIM_CALL(lrmapi(), RM_GetLocalHBAInfoV4, &pair, &info), 0u);
    return info.wwpn;
  }
  HBA_NAME nic_{}, fcoe_{}, tenbaset_{};
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

TEST_F(Settings, FcfListGrowsFromAnEmptyCapacity) {
  std::vector<unsigned char> buf(sizeof(RM_FCF_LIST_HEADER) + sizeof(RM_FCF_ENTRY));
  RM_FCF_LIST_HEADER header{0, 0};
  std::memcpy(buf.data(), &header, sizeof header);
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_CNA_FCOE_GetFcfList, fcoe_, buf.data()), RM_STATUS_ERROR_BUFFER_TOO_SMALL);
  std::memcpy(&header, buf.data(), sizeof header);
  ASSERT_EQ(header.count, 1u);
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_CNA_FCOE_GetFcfList, fcoe_, buf.data()), 0u);
  RM_FCF_ENTRY entry{};
  std::memcpy(&entry, buf.data() + sizeof header, sizeof entry);
  const unsigned char fabric[8] = {0x10, 0x00, 0x50, 0xeb, 0x1a, 0x33, 0x7c, 0x40};
  EXPECT_EQ(std::memcmp(entry.fabricName.wwn, fabric, 8), 0);
  EXPECT_EQ(entry.vlanBitmap[1002 / 8], 1u << (1002 % 8));
}

TEST_F(Settings, CeeParametersAreABlobThatFollowsChanges) {
  const RM_CEE_ITEM item{RM_CEE_FCOE_PRIORITY, 6};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_CNA_SetPGSetting, nic_, &item, sizeof item), 0u);
  std::vector<unsigned char> blob(RM_CEE_PARAMS_SIZE);
  HBA_UINT32 size = RM_CEE_PARAMS_SIZE;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_CNA_GetCEE_Params, nic_, blob.data(), &size), 0u);
  HBA_UINT16 len = 0;
  HBA_UINT32 status = 1;
  void* p = SIM_CALL(lrmapi(), RM_GetAttributeValue, blob.data(), RM_CEE_FCOE_PRIORITY, &len, &status);
  ASSERT_NE(p, nullptr);
  HBA_UINT32 value = 0;
  std::memcpy(&value, p, sizeof value);
  EXPECT_EQ(value, 6u);
  const RM_CEE_ITEM wrong{RM_CEE_DCBX_STATE, 1};  // not a priority item
  EXPECT_NE(SIM_CALL(lrmapi(), LRM_CNA_SetPGSetting, nic_, &wrong, sizeof wrong), 0u);
  // The 10GBASE-T card does not offer DCB.
  size = RM_CEE_PARAMS_SIZE;
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_CNA_GetCEE_Params, tenbaset_, blob.data(), &size), RM_STATUS_ITEM_NOT_OFFERED);
}

TEST_F(Settings, GroupBandwidthsMustAddUpAndPrioritiesBelongToOneGroup) {
  RM_PG_BANDWIDTH bad{{50, 30, 10, 0, 0, 0, 0, 0}};
  EXPECT_NE(SIM_CALL(lrmapi(), LRM_CNA_SetPGBandwidth, nic_, &bad, sizeof bad), 0u);
  RM_PG_BANDWIDTH good{{50, 30, 20, 0, 0, 0, 0, 0}};
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_CNA_SetPGBandwidth, nic_, &good, sizeof good), 0u);
  RM_PG_PRIORITY_BITMAPS overlap{{0x03, 0x02, 0, 0, 0, 0, 0, 0}, 0, {}};
  EXPECT_NE(SIM_CALL(lrmapi(), LRM_CNA_SetPGPriorityBitmapsExt, nic_, &overlap, sizeof overlap), 0u);
  RM_PG_PRIORITY_BITMAPS groups{{0x0F, 0xF0, 0, 0, 0, 0, 0, 0}, 0, {}};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_CNA_SetPGPriorityBitmapsExt, nic_, &groups, sizeof groups), 0u);
  RM_PG_PRIORITY_BITMAPS back{};
  HBA_UINT32 size = sizeof back;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_CNA_GetPGPriorityBitmaps, nic_, &back, &size), 0u);
  EXPECT_EQ(back.groups[1], 0xF0);
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

TEST_F(Settings, QosLimitsPersist) {
  const RM_QOS_LIMITS limits{100000000, 50000, 0, 0};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_SetQoS, name_of(2), &limits, sizeof limits), 0u);
  RM_QOS_LIMITS back{};
  HBA_UINT32 size = sizeof back;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_GetQoS, name_of(2), &back, &size), 0u);
  EXPECT_EQ(back.maxIOsPerSecond, 50000u);
}

}  // namespace
}  // namespace nrvsim_test
