// The management library as the module's discovery and services call it:
// enumeration, information records, attribute blobs, statistics, VPD, iSCSI
// lists and changes that persist within the process.
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

TEST_F(ManagementLibrary, SmallBufferGetsSevenAndTheSizeNeeded) {
  const HBA_NAME nic = first_of(RM_PROTOCOL_NIC);
  unsigned char small[16];
  HBA_UINT32 size = sizeof small;
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_GetPortAttributes, nic, small, &size), RM_STATUS_ERROR_BUFFER_TOO_SMALL);
  EXPECT_GT(size, sizeof small);
  EXPECT_LE(size, RM_PORT_ATTRIBUTES_SIZE);
}

TEST_F(ManagementLibrary, StatisticsOfEveryFunctionFitTheCallersBuffer) {
  for (const auto& f : functions()) {
    std::vector<unsigned char> blob(RM_PORT_STATISTICS_SIZE);
    HBA_UINT32 size = RM_PORT_STATISTICS_SIZE;
    ASSERT_EQ(SIM_CALL(lrmapi(), LRM_GetPortStatistics, f.wwpn, blob.data(), &size), 0u);
    HBA_UINT32 status = 1;
    attribute<HBA_UINT64>(blob, RM_PS_1025, &status);
    EXPECT_EQ(status, 0u);
  }
}

TEST_F(ManagementLibrary, UnknownNameAndUnofferedOperation) {
  const HBA_NAME nobody{{0x10, 0, 0, 0, 0, 0, 0, 0x99}};
  HBA_UINT32 size = RM_HBA_ATTRIBUTES_SIZE;
  std::vector<unsigned char> blob(size);
  EXPECT_NE(SIM_CALL(lrmapi(), LRM_GetHBAAttributes, nobody, blob.data(), &size), 0u);
  HBA_UINT32 local = 1;
  EXPECT_EQ(SIM_CALL(lrmapi(), RM_IsLocalHBA, nobody, &local), 0u);
  EXPECT_EQ(local, 0u);
  HBA_UINT32 qsize = 64;
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_GetVMInfo, first_of(RM_PROTOCOL_NIC), blob.data(), &qsize),
            RM_STATUS_ITEM_NOT_OFFERED);
  EXPECT_EQ(SIM_CALL(lrmapi(), NrvGetBoardNumber, nobody), -1);
  EXPECT_EQ(SIM_CALL(lrmapi(), NrvGetBoardNumber, functions().back().wwpn), 1);
}

TEST_F(ManagementLibrary, VpdWalkYieldsProductNameThenKeywords) {
  std::vector<unsigned char> buf(RM_VPD_SIZE);
  HBA_UINT32 size = RM_VPD_SIZE;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_GetVPD, first_of(RM_PROTOCOL_NIC), buf.data(), &size), 0u);
  std::vector<std::pair<std::string, std::string>> entries;
  char kw[RM_VPD_KEYWORD_SIZE];
  char value[RM_VPD_VALUE_SIZE];
  for (void* c = buf.data(); (c = SIM_CALL(lrmapi(), RM_GetNextVpdEntry, c, kw, value)) != nullptr;)
    entries.emplace_back(kw, value);
  ASSERT_GE(entries.size(), 2u);
  EXPECT_EQ(entries[0].first, "\x82\x82");
  EXPECT_EQ(entries[0].second, "Norvane TAVO 5202C 2-port 10GbE Converged Network Adapter");
  EXPECT_EQ(entries[1], (std::pair<std::string, std::string>{"PN", "TV5202C-N1"}));
}

TEST_F(ManagementLibrary, FruVpdCarriesBinaryUuidAndCardFunction) {
  std::vector<unsigned char> buf(RM_VPD_V2_SIZE);
  HBA_UINT32 size = RM_VPD_V2_SIZE;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_GetVPDV2, first_of(RM_PROTOCOL_FCOE), 1, buf.data(), &size), 0u);
  char kw[RM_VPD_KEYWORD_SIZE];
  char value[RM_VPD_VALUE_SIZE];
  bool uu = false, cf = false;
  for (void* c = buf.data(); (c = SIM_CALL(lrmapi(), RM_GetNextVpdEntry, c, kw, value)) != nullptr;) {
    if (std::string(kw) == "UU") uu = static_cast<unsigned char>(value[0]) == 0x6a && value[15] == 0x19;
    if (std::string(kw) == "CF") cf = value[0] == 64;
  }
  EXPECT_TRUE(uu);
  EXPECT_TRUE(cf);
}

TEST_F(ManagementLibrary, SffRecordPlacesReadingsAndVendorTexts) {
  std::vector<unsigned char> rec(RM_SFF_DATA_SIZE);
  HBA_UINT32 size = RM_SFF_DATA_SIZE;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_GetSffData, first_of(RM_PROTOCOL_FCOE), rec.data(), &size), 0u);
  float temp = 0;
  std::memcpy(&temp, &rec[596], 4);
  EXPECT_FLOAT_EQ(temp, 38.5f);
  int16_t low_alarm = 0;
  std::memcpy(&low_alarm, &rec[298], 2);
  EXPECT_EQ(low_alarm / 256.0, -5.0);
  EXPECT_EQ(std::string(reinterpret_cast<char*>(&rec[620]), 7), "NORVANE");
  EXPECT_EQ(std::string(reinterpret_cast<char*>(&rec[680]), 6), "250612");
  // The 10GBASE-T card has no pluggable module.
  size = RM_SFF_DATA_SIZE;
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_GetSffData, functions().back().wwpn, rec.data(), &size),
            RM_STATUS_ITEM_NOT_OFFERED);
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

TEST_F(ManagementLibrary, SessionInformationNamesTargetAndConnections) {
  const HBA_NAME port = first_of(RM_PROTOCOL_ISCSI);
  std::vector<unsigned char> list(8 + 2 * 32);  // two sessions
  HBA_UINT32 size = static_cast<HBA_UINT32>(list.size());
  const char* target = "iqn.1992-08.com.netapp:sn.4082367740:vs.3";
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_GetSessions, port, target, list.data(), &size), 0u);
  std::vector<unsigned char> info(672);
  size = 672;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_GetSessionInfo, port, list.data() + 8, info.data(), &size), 0u);
  uint64_t isid = 0;
  uint16_t tsih = 0, connections = 0;
  std::memcpy(&isid, &info[0], 8);
  std::memcpy(&tsih, &info[8], 2);
  std::memcpy(&connections, &info[10], 2);
  EXPECT_EQ(isid, 0x400001370001ull);
  EXPECT_EQ(tsih, 29);
  EXPECT_EQ(connections, 2);
  EXPECT_STREQ(reinterpret_cast<char*>(&info[24]), target);
}

TEST_F(ManagementLibrary, WwnChangeIsSeenByLaterCalls) {
  const HBA_NAME old = first_of(RM_PROTOCOL_FCOE);
  const HBA_NAME fresh{{0x10, 0x00, 0x00, 0x90, 0xfa, 0x5c, 0x2e, 0xee}};
  const HBA_NAME node{{0x20, 0x00, 0x00, 0x90, 0xfa, 0x5c, 0x2e, 0xee}};
  HBA_UINT32 op = 99;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_ChangeWWN, old, 1, fresh, node, &op), 0u);
  HBA_UINT32 local = 1;
  SIM_CALL(lrmapi(), RM_IsLocalHBA, old, &local);
  EXPECT_EQ(local, 0u);
  SIM_CALL(lrmapi(), RM_IsLocalHBA, fresh, &local);
  EXPECT_EQ(local, 1u);
  HBA_NAME p{}, n{};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_ReadWWN, fresh, 2, &p, &n, nullptr), 0u);
  EXPECT_EQ(std::memcmp(&p, &old, 8), 0);  // factory name kept
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_RestoreWWN, fresh, 0, &op), 0u);
  SIM_CALL(lrmapi(), RM_IsLocalHBA, old, &local);
  EXPECT_EQ(local, 1u);
  // A name another function uses is refused.
  EXPECT_NE(SIM_CALL(lrmapi(), LRM_ChangeWWN, old, 0, functions()[5].wwpn, node, &op), 0u);
}

TEST_F(ManagementLibrary, DriverParametersAnswerSevenThenChangeWithinRange) {
  const HBA_NAME fcoe = first_of(RM_PROTOCOL_FCOE);
  HBA_UINT32 count = 1;
  std::vector<unsigned char> recs(132 * 8);
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_GetDriverParamsGlobal, fcoe, recs.data(), &count), RM_STATUS_ERROR_BUFFER_TOO_SMALL);
  EXPECT_EQ(count, 4u);
  count = 8;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_GetDriverParamsGlobal, fcoe, recs.data(), &count), 0u);
  EXPECT_STREQ(reinterpret_cast<char*>(&recs[132]), "lun-queue-depth");
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_SetDriverParam, fcoe, 1, 0, "lun-queue-depth", "64"), 0u);
  EXPECT_NE(SIM_CALL(lrmapi(), LRM_SetDriverParam, fcoe, 1, 0, "lun-queue-depth", "500"), 0u);
  EXPECT_NE(SIM_CALL(lrmapi(), LRM_SetDriverParam, fcoe, 1, 0, "link-speed", "8"), 0u);  // not changeable
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_GetDriverParamsGlobal, fcoe, recs.data(), &count), 0u);
  uint32_t current = 0;
  std::memcpy(&current, &recs[132 + 44], 4);
  EXPECT_EQ(current, 64u);
}

TEST_F(ManagementLibrary, DiagnosticsFinishAndBeaconStatesPersist) {
  const HBA_NAME nic = first_of(RM_PROTOCOL_NIC);
  HBA_UINT32 handle = 0;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_DiagLoopBackTestV3, nic, 3, 100, 0, &handle, 0, "A5A5"), 0u);
  RM_DIAG_RESULT result{};
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_DiagGetResults, nic, handle, &result), 0u);
  EXPECT_EQ(result.state, RM_DIAG_STATE_FINISHED);
  EXPECT_EQ(result.cyclesComplete, 100u);
  EXPECT_STREQ(result.resultText, "Success");
  EXPECT_NE(SIM_CALL(lrmapi(), LRM_DiagGetResults, nic, handle, &result), 0u);  // results are read once
  // Cable tests need a 10GBASE-T port; the converged card has SFP+ cages.
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_DiagRunTDR, nic, &handle), RM_STATUS_NOT_SUPPORTED);
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_DiagRunTDR, functions().back().wwpn, &handle), 0u);

  HBA_UINT32 state = 0;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_DiagBeaconState, nic, &state), 0u);
  EXPECT_EQ(state, 2u);
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_DiagBeacon, nic, 3), 0u);
  SIM_CALL(lrmapi(), LRM_DiagBeaconState, nic, &state);
  EXPECT_EQ(state, 3u);
  EXPECT_NE(SIM_CALL(lrmapi(), LRM_DiagBeacon, nic, 7), 0u);
}

TEST_F(ManagementLibrary, InitLibReportsTheSitesStatus) {
  EXPECT_EQ(SIM_CALL(lrmapi(), LRM_InitLib), 0u);
  EXPECT_EQ(SIM_CALL(lrmapi(), RM_InitLib), 0u);
  char text[RM_STATUS_STRING_SIZE];
  SIM_CALL(lrmapi(), RM_StatusString, RM_STATUS_ITEM_NOT_OFFERED, text, sizeof text);
  EXPECT_STRNE(text, "");
  SIM_CALL(lrmapi(), RM_StatusString, 12345, text, sizeof text);
  EXPECT_STREQ(text, "");
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
