// iSCSI settings through the management library: a portal's login and
// authentication properties round-trip.
#include <gtest/gtest.h>

#include <cstring>

#include "SimLibrary.h"
#include "sim/SimSite.h"

namespace nrvsim_test {
namespace {

class IscsiSettings : public ::testing::Test {
 protected:
  void SetUp() override {
    ASSERT_TRUE(lrmapi().ok()) << dlerror();
    ASSERT_TRUE(nrvsim::SimSite::instance().reload(sample_site()));
    RM_ADAPTER_INSTANCE pair{0, 2};  // the converged card's first iSCSI function
    RM_LOCAL_HBA_INFO_V4 info{};
    ASSERT_EQ(SIM_CALL(lrmapi(), RM_GetLocalHBAInfoV4, &pair, &info), 0u);
    ASSERT_TRUE(info.protocolMask & RM_PROTOCOL_ISCSI);
    port_ = info.wwpn;
  }
  HBA_NAME port_{};
};

TEST_F(IscsiSettings, PortalPropertiesRoundTrip) {
  const RM_IP_ADDRESS portal{{10, 20, 40, 200}, 3260, 0, 0};  // from the sample site
  RM_ISCSI_PORTAL_PROPERTIES props{};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_GetSendTargetPortalProperties, port_, &portal, &props), 0u);
  props.loginOptions.headerDigest = 1;
  props.auth.method = RM_AUTH_ONE_WAY_CHAP;
  std::strcpy(props.auth.targetChapName, "array-chap");
  props.auth.hasTargetChapName = 1;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_SetSendTargetPortalProperties, port_, &props), 0u);
  RM_ISCSI_PORTAL_PROPERTIES back{};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_GetSendTargetPortalProperties, port_, &portal, &back), 0u);
  EXPECT_EQ(back.loginOptions.headerDigest, 1);
  EXPECT_EQ(back.auth.method, RM_AUTH_ONE_WAY_CHAP);
  EXPECT_STREQ(back.auth.targetChapName, "array-chap");
}

}  // namespace
}  // namespace nrvsim_test
