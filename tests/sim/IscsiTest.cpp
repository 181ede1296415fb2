// iSCSI settings through the management library: portals, login and
// authentication properties, target properties and ping.
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
  const char* netapp_ = "iqn.1992-08.com.netapp:sn.4082367740:vs.3";
};

TEST_F(IscsiSettings, ExistingPortalAnswers116WithItsDigests) {
  const RM_IP_ADDRESS portal{{10, 20, 40, 77}, 3260, 0, 0};
  RM_ISCSI_LOGIN_OPTIONS options{0, 1, 1, 1};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_AddSendTargetPortal, port_, &portal, 0, &options, nullptr), 0u);
  RM_ISCSI_LOGIN_OPTIONS again{0, 1, 0, 0};
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_AddSendTargetPortal, port_, &portal, 0, &again, nullptr),
            RM_STATUS_ISCSI_DIGEST_MISMATCH);
  EXPECT_EQ(again.headerDigest, 1);
  EXPECT_EQ(again.dataDigest, 1);
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_RemoveSendTargetPortal, port_, &portal), 0u);
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_AddSendTargetPortal, port_, &portal, 0, &again, nullptr), 0u);
}

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

TEST_F(IscsiSettings, TargetLoginAuthKeepsUnpresentedStrings) {
  RM_ISCSI_LOGIN_OPTIONS options{};
  RM_ISCSI_AUTH auth{};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_GetTargetLoginAuthProperties, port_, netapp_, &options, &auth), 0u);
  auth.method = RM_AUTH_MUTUAL_CHAP;
  std::strcpy(auth.initiatorChapName, "db01");
  auth.hasInitiatorChapName = 1;
  std::strcpy(auth.targetSecret, "secret-not-presented");
  auth.hasTargetSecret = 0;
  options.dataDigest = 1;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_SetTargetLoginAuthProperties, port_, netapp_, &options, &auth), 0u);
  RM_ISCSI_AUTH back{};
  RM_ISCSI_LOGIN_OPTIONS opts_back{};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_GetTargetLoginAuthProperties, port_, netapp_, &opts_back, &back), 0u);
  EXPECT_EQ(back.method, RM_AUTH_MUTUAL_CHAP);
  EXPECT_STREQ(back.initiatorChapName, "db01");
  EXPECT_EQ(back.hasTargetSecret, 0);
  EXPECT_EQ(opts_back.dataDigest, 1);
}

TEST_F(IscsiSettings, ExtendedTimeoutAboveRangeIsExplained) {
  RM_ISCSI_TARGET_PROPERTIES props{};
  props.extendedTimeOut = 3201;
  EXPECT_NE(SIM_CALL(lrmapi(), LRM_iSCSI_SetTargetProperties, port_, netapp_, &props), 0u);
  EXPECT_NE(props.statusDetail, 0);
  RM_ISCSI_TARGET_PROPERTIES ok{};
  ok.extendedTimeOut = 120;
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_SetTargetProperties, port_, netapp_, &ok), 0u);
}

TEST_F(IscsiSettings, PingReachesPortalsAndTheOwnSubnetOnly) {
  HBA_UINT8 reachable = 9;
  const RM_IP_ADDRESS portal{{10, 20, 40, 210}, 3260, 0, 0};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_Ping, port_, &portal, &reachable), 0u);
  EXPECT_EQ(reachable, 1);
  const RM_IP_ADDRESS far{{192, 0, 2, 1}, 3260, 0, 0};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_Ping, port_, &far, &reachable), 0u);
  EXPECT_EQ(reachable, 0);
}

TEST_F(IscsiSettings, BootTargetIsFlaggedInTheTargetList) {
  const RM_IP_ADDRESS portal{{10, 20, 40, 240}, 3260, 0, 0};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_AddBootTarget, port_, 0, "iqn.2024-02.com.example:boot", &portal, nullptr,
                     nullptr),
            0u);
  std::vector<unsigned char> buf(8 + 8 * 516);
  HBA_UINT32 size = static_cast<HBA_UINT32>(buf.size());
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_GetTargets, port_, 0, buf.data(), &size), 0u);
  const unsigned char* last = buf.data() + 8 + 3 * 516;
  EXPECT_STREQ(reinterpret_cast<const char*>(last), "iqn.2024-02.com.example:boot");
  EXPECT_EQ(last[512] & 0x01, 0x01);
  EXPECT_EQ(last[512] & 0x40, 0);  // not logged in
}

}  // namespace
}  // namespace nrvsim_test
