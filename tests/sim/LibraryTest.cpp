// The management library as the module's discovery and services call it, at
// smoke level: enumeration, information records, attribute blobs, a change
// that persists within the process, and a refused site.
#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "SimLibrary.h"
#include "sim/SimSite.h"

namespace nrvsim_test {
namespace {

class ManagementLibrary : public ::testing::Test {
 protected:
  void SetUp() override {
    ASSERT_TRUE(lrmapi().ok()) << dlerror();
    ASSERT_TRUE(nrvsim::SimSite::instance().reload(sample_site()));
  }

  std::vector<RM_LOCAL_HBA_INFO_V4> functions() {
    HBA_UINT32 count = 64;
    std::vector<HBA_UINT32> list(count);
    EXPECT_EQ(SIM_CALL(lrmapi(), RM_GetAllLocalHBAInstances, &count, list.data()), 0u);
    std::vector<RM_LOCAL_HBA_INFO_V4> out;
    for (HBA_UINT32 i = 0; i < count; ++i) {
      RM_ADAPTER_INSTANCE pair{0, list[i]};
      RM_LOCAL_HBA_INFO_V4 info{};
      EXPECT_EQ(SIM_CALL(lrmapi(), RM_GetLocalHBAInfoV4, &pair, &info), 0u);
      out.push_back(info);
    }
    return out;
  }

  HBA_NAME first_of(HBA_UINT32 mask) {
    for (const auto& f : functions())
      if (f.protocolMask & mask) return f.wwpn;
    ADD_FAILURE() << "no function with mask " << mask;
    return HBA_NAME{};
  }

  template <class T>
  T attribute(std::vector<unsigned char>& blob, HBA_UINT16 number, HBA_UINT32* status = nullptr) {
    HBA_UINT16 len = 0;
    HBA_UINT32 st = 0;
    void* p = SIM_CALL(lrmapi(), RM_GetAttributeValue, blob.data(), number, &len, &st);
    if (status) *status = st;
    T value{};
    if (p) std::memcpy(&value, p, sizeof value);
    return value;
  }

  std::string text_attribute(std::vector<unsigned char>& blob, HBA_UINT16 number) {
    HBA_UINT16 len = 0;
    HBA_UINT32 st = 0;
    void* p = SIM_CALL(lrmapi(), RM_GetAttributeValue, blob.data(), number, &len, &st);
    return p ? std::string(static_cast<char*>(p), len) : "<absent>";
  }
};

TEST_F(ManagementLibrary, EnumerationAnswersSevenWithTheCountNeeded) {
  HBA_UINT32 count = 1;
  HBA_UINT32 one = 0;
  EXPECT_EQ(SIM_CALL(lrmapi(), RM_GetAllLocalHBAInstances, &count, &one), RM_STATUS_ERROR_BUFFER_TOO_SMALL);
  EXPECT_EQ(count, 10u);
  EXPECT_EQ(SIM_CALL(lrmapi(), RM_GetNumberOfLocalAdapters), 10u);
}

TEST_F(ManagementLibrary, InformationRecordsCarryKindModelAndFunction) {
  const auto all = functions();
  ASSERT_EQ(all.size(), 10u);
  int nic = 0, iscsi = 0, fcoe = 0;
  for (const auto& f : all) {
    nic += (f.protocolMask & RM_PROTOCOL_NIC) != 0;
    iscsi += (f.protocolMask & RM_PROTOCOL_ISCSI) != 0;
    fcoe += (f.protocolMask & RM_PROTOCOL_FCOE) != 0;
  }
  EXPECT_EQ(nic, 6);
  EXPECT_EQ(iscsi, 2);
  EXPECT_EQ(fcoe, 2);
  EXPECT_STREQ(all[0].modelName, "TV-5202C");
  EXPECT_EQ(all[4].functionNumber, 4);
  // A NIC function is named by its MAC and two zero bytes.
  const unsigned char nic0[8] = {0x00, 0x90, 0xfa, 0x5c, 0x2e, 0x10, 0, 0};
  EXPECT_EQ(std::memcmp(all[0].wwpn.wwn, nic0, 8), 0);
  // The V3 record is the V4 record's prefix.
  RM_ADAPTER_INSTANCE pair{0, 4};
  RM_LOCAL_HBA_INFO_V3 v3{};
  ASSERT_EQ(SIM_CALL(lrmapi(), RM_GetLocalHBAInfoV3, &pair, &v3), 0u);
  EXPECT_EQ(std::memcmp(&v3, &all[4], sizeof v3), 0);
  RM_ADAPTER_INSTANCE missing{0, 99};
  RM_LOCAL_HBA_INFO_V4 none{};
  EXPECT_NE(SIM_CALL(lrmapi(), RM_GetLocalHBAInfoV4, &missing, &none), 0u);
}

TEST_F(ManagementLibrary, HbaAttributeBlobIsReadByNumber) {
  const HBA_NAME fcoe = first_of(RM_PROTOCOL_FCOE);
  std::vector<unsigned char> blob(RM_HBA_ATTRIBUTES_SIZE);
  HBA_UINT32 size = RM_HBA_ATTRIBUTES_SIZE;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_GetHBAAttributes, fcoe, blob.data(), &size), 0u);
  EXPECT_LE(size, RM_HBA_ATTRIBUTES_FLASH_QUERY_SIZE);
  EXPECT_EQ(text_attribute(blob, RM_HA_SERIAL_NUMBER), "NV52C4213A07719");
  EXPECT_EQ(text_attribute(blob, RM_HA_MODEL), "TV-5202C");
  EXPECT_EQ(attribute<HBA_UINT32>(blob, RM_HA_BOARD_TEMPERATURE), 52u);
  EXPECT_EQ(attribute<HBA_UINT32>(blob, RM_HA_PCI_FUNCTION_NUMBER), 4u);
  EXPECT_EQ(text_attribute(blob, RM_HA_IEEE_ADDRESS).size(), 6u);
  HBA_UINT32 status = 0;
  attribute<HBA_UINT32>(blob, 9999, &status);
  EXPECT_EQ(status, RM_STATUS_ITEM_NOT_OFFERED);
}

TEST_F(ManagementLibrary, IscsiTargetListGrowsOnceAndAddedTargetsPersist) {
  const HBA_NAME port = first_of(RM_PROTOCOL_ISCSI);
  std::vector<unsigned char> buf(8 + 516);
  HBA_UINT32 size = static_cast<HBA_UINT32>(buf.size());
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_GetTargets, port, 0, buf.data(), &size), RM_STATUS_ERROR_BUFFER_TOO_SMALL);
  HBA_UINT32 count = 0;
  std::memcpy(&count, buf.data(), 4);
  EXPECT_EQ(count, 3u);

  const RM_IP_ADDRESS portal{{10, 20, 40, 230}, 3260, 0, 0};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_AddTarget, port, 1, "iqn.2024-01.com.example:t9", &portal, nullptr, nullptr),
            0u);
  buf.assign(8 + 8 * 516, 0);
  size = static_cast<HBA_UINT32>(buf.size());
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_GetTargets, port, 0, buf.data(), &size), 0u);
  std::memcpy(&count, buf.data(), 4);
  ASSERT_EQ(count, 4u);
  const unsigned char* last = buf.data() + 8 + 3 * 516;
  EXPECT_STREQ(reinterpret_cast<const char*>(last), "iqn.2024-01.com.example:t9");
  EXPECT_TRUE(last[512] & 0x40);  // logged in: has sessions

  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_TargetLogout, port, "iqn.2024-01.com.example:t9", nullptr), 0u);
  size = static_cast<HBA_UINT32>(buf.size());
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_GetTargets, port, 0, buf.data(), &size), 0u);
  EXPECT_FALSE(last[512] & 0x40);
}

TEST_F(ManagementLibrary, RefusedSiteFailsEveryCallWithoutCrashing) {
  const std::string bad = write_site("sim_bad_site.json", "{\"cards\": [ { \"model\": 3 } ] }");
  EXPECT_FALSE(nrvsim::SimSite::instance().reload(bad));
  EXPECT_NE(nrvsim::SimSite::instance().error().find("$.cards[0].model"), std::string::npos);
  EXPECT_GT(SIM_CALL(lrmapi(), LRM_InitLib), 0u);
  EXPECT_EQ(SIM_CALL(lrmapi(), RM_GetNumberOfLocalAdapters), 0u);
  HBA_UINT32 count = 4, list[4];
  EXPECT_NE(SIM_CALL(lrmapi(), RM_GetAllLocalHBAInstances, &count, list), 0u);
  EXPECT_EQ(SIM_CALL(hbaapi(), HBA_GetNumberOfAdapters), 0u);
}

}  // namespace
}  // namespace nrvsim_test
