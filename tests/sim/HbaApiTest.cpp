// The HBA API library as the module's SAN discovery calls it: adapter names,
// port names that match the management library's identifiers, the target
// mapping with its grow protocol, and real SCSI answers.
#include <gtest/gtest.h>

#include <cstring>
#include <fstream>
#include <sstream>
#include <string>

#include "SimLibrary.h"
#include "sim/SimSite.h"

namespace nrvsim_test {
namespace {

class HbaApi : public ::testing::Test {
 protected:
  void SetUp() override {
    ASSERT_TRUE(hbaapi().ok()) << dlerror();
    ASSERT_TRUE(nrvsim::SimSite::instance().reload(sample_site()));
    ASSERT_EQ(SIM_CALL(hbaapi(), HBA_LoadLibrary), 0u);
  }
  void TearDown() override {
    if (handle_) SIM_CALL(hbaapi(), HBA_CloseAdapter, handle_);
  }

  HBA_HANDLE open(HBA_UINT32 index) {
    char name[256] = {};
    EXPECT_EQ(SIM_CALL(hbaapi(), HBA_GetAdapterName, index, name), 0u);
    handle_ = SIM_CALL(hbaapi(), HBA_OpenAdapter, name);
    EXPECT_NE(handle_, 0u);
    return handle_;
  }

  std::vector<HBA_FCPSCSIENTRY> mapping(HBA_HANDLE h) {
    std::vector<unsigned char> buf(8 + 304 * 16);
    auto* m = reinterpret_cast<HBA_FCPTARGETMAPPING*>(buf.data());
    m->NumberOfEntries = 16;
    EXPECT_EQ(SIM_CALL(hbaapi(), HBA_GetFcpTargetMapping, h, m), 0u);
    return std::vector<HBA_FCPSCSIENTRY>(m->entry, m->entry + m->NumberOfEntries);
  }

  HBA_HANDLE handle_ = 0;
};

TEST_F(HbaApi, OneAdapterPerFcoeFunction) {
  EXPECT_EQ(SIM_CALL(hbaapi(), HBA_GetNumberOfAdapters), 2u);
  char name[256] = {};
  ASSERT_EQ(SIM_CALL(hbaapi(), HBA_GetAdapterName, 1, name), 0u);
  EXPECT_STREQ(name, "com.norvane-TV-5202C-1");
  EXPECT_EQ(SIM_CALL(hbaapi(), HBA_GetAdapterName, 2, name), static_cast<HBA_STATUS>(HBA_STATUS_ERROR_ILLEGAL_INDEX));
  char unknown[] = "com.norvane-nothing-9";
  EXPECT_EQ(SIM_CALL(hbaapi(), HBA_OpenAdapter, unknown), 0u);
}

TEST_F(HbaApi, PortNameMatchesTheManagementLibrarysIdentifier) {
  const HBA_HANDLE h = open(0);
  HBA_ADAPTERATTRIBUTES attrs{};
  ASSERT_EQ(SIM_CALL(hbaapi(), HBA_GetAdapterAttributes, h, &attrs), 0u);
  EXPECT_EQ(attrs.NumberOfPorts, 1u);
  EXPECT_STREQ(attrs.SerialNumber, "NV52C4213A07719");
  HBA_PORTATTRIBUTES port{};
  ASSERT_EQ(SIM_CALL(hbaapi(), HBA_GetAdapterPortAttributes, h, 0, &port), 0u);
  RM_ADAPTER_INSTANCE pair{0, 4};  // the card's first FCoE function
  RM_LOCAL_HBA_INFO_V4 info{};
  ASSERT_EQ(SIM_CALL(lrmapi(), RM_GetLocalHBAInfoV4, &pair, &info), 0u);
  EXPECT_EQ(std::memcmp(port.PortWWN.wwn, info.wwpn.wwn, 8), 0);
  EXPECT_EQ(port.PortState, static_cast<HBA_PORTSTATE>(HBA_PORTSTATE_ONLINE));
}

TEST_F(HbaApi, MappingTooSmallAnswersSevenWithTheCount) {
  const HBA_HANDLE h = open(0);
  std::vector<unsigned char> buf(8 + 304);
  auto* m = reinterpret_cast<HBA_FCPTARGETMAPPING*>(buf.data());
  m->NumberOfEntries = 1;
  EXPECT_EQ(SIM_CALL(hbaapi(), HBA_GetFcpTargetMapping, h, m), static_cast<HBA_STATUS>(HBA_STATUS_ERROR_MORE_DATA));
  EXPECT_EQ(m->NumberOfEntries, 8u);
  const auto entries = mapping(h);
  ASSERT_EQ(entries.size(), 8u);
  EXPECT_EQ(entries[1].FcpId.FcpLun, static_cast<HBA_UINT64>(1ull << 48));
  EXPECT_EQ(entries[4].FcpId.FcpLun, static_cast<HBA_UINT64>((0x4000ull | 300) << 48));  // flat space
  EXPECT_STREQ(entries[5].ScsiId.OSDeviceName, "/dev/st0");
}

TEST_F(HbaApi, StandardInquiryAndVpdPages) {
  const HBA_HANDLE h = open(0);
  const auto entries = mapping(h);
  unsigned char rsp[255], sense[128];
  auto inquiry = [&](const HBA_FCPSCSIENTRY& e, int evpd, int page) {
    std::memset(rsp, 0xEE, sizeof rsp);
    return SIM_CALL(hbaapi(), HBA_SendScsiInquiry, h, e.FcpId.PortWWN, e.FcpId.FcpLun, evpd, page, rsp,
                    sizeof rsp, sense, sizeof sense);
  };
  ASSERT_EQ(inquiry(entries[0], 0, 0), 0u);
  EXPECT_EQ(rsp[0] & 0x1F, 0x00);
  EXPECT_EQ(std::string(reinterpret_cast<char*>(rsp + 8), 8), "DGC     ");
  EXPECT_EQ(std::string(reinterpret_cast<char*>(rsp + 16), 16), "VRAID           ");
  EXPECT_EQ(std::string(reinterpret_cast<char*>(rsp + 32), 4), "0533");
  ASSERT_EQ(inquiry(entries[5], 0, 0), 0u);
  EXPECT_EQ(rsp[0] & 0x1F, 0x01);  // tape
  ASSERT_EQ(inquiry(entries[0], 1, 0x80), 0u);
  EXPECT_EQ(rsp[1], 0x80);
  EXPECT_STREQ(reinterpret_cast<char*>(rsp + 4), "CKM00183101234");
  ASSERT_EQ(inquiry(entries[0], 1, 0x83), 0u);
  EXPECT_EQ(rsp[1], 0x83);
  EXPECT_EQ(rsp[5] & 0x0F, 3);  // NAA designator
  EXPECT_EQ(rsp[7], 16);
  EXPECT_EQ(rsp[8] >> 4, 6);
}

TEST_F(HbaApi, ReadCapacityIsBigEndianAndTapesRefuseIt) {
  const HBA_HANDLE h = open(0);
  const auto entries = mapping(h);
  unsigned char rsp[255] = {}, sense[128] = {};
  ASSERT_EQ(SIM_CALL(hbaapi(), HBA_SendReadCapacity, h, entries[0].FcpId.PortWWN, entries[0].FcpId.FcpLun, rsp,
                     sizeof rsp, sense, sizeof sense),
            0u);
  const uint32_t last = (uint32_t{rsp[0]} << 24) | (rsp[1] << 16) | (rsp[2] << 8) | rsp[3];
  const uint32_t block = (uint32_t{rsp[4]} << 24) | (rsp[5] << 16) | (rsp[6] << 8) | rsp[7];
  EXPECT_EQ(last, 2147483647u);  // 2^31 blocks
  EXPECT_EQ(block, 512u);
  EXPECT_EQ(SIM_CALL(hbaapi(), HBA_SendReadCapacity, h, entries[5].FcpId.PortWWN, entries[5].FcpId.FcpLun, rsp,
                     sizeof rsp, sense, sizeof sense),
            static_cast<HBA_STATUS>(HBA_STATUS_SCSI_CHECK_CONDITION));
  EXPECT_EQ(sense[0], 0x70);
  EXPECT_EQ(sense[2], 0x05);  // ILLEGAL REQUEST
}

TEST_F(HbaApi, ClosedHandleIsRefused) {
  const HBA_HANDLE h = open(0);
  SIM_CALL(hbaapi(), HBA_CloseAdapter, h);
  handle_ = 0;
  HBA_ADAPTERATTRIBUTES attrs{};
  EXPECT_EQ(SIM_CALL(hbaapi(), HBA_GetAdapterAttributes, h, &attrs),
            static_cast<HBA_STATUS>(HBA_STATUS_ERROR_INVALID_HANDLE));
}

TEST_F(HbaApi, ChangedWwnShowsInPortAttributes) {
  RM_ADAPTER_INSTANCE pair{0, 4};
  RM_LOCAL_HBA_INFO_V4 info{};
  ASSERT_EQ(SIM_CALL(lrmapi(), RM_GetLocalHBAInfoV4, &pair, &info), 0u);
  const HBA_NAME fresh{{0x10, 0x00, 0x00, 0x90, 0xfa, 0x5c, 0x2e, 0xef}};
  HBA_UINT32 op = 0;
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_ChangeWWN, info.wwpn, 0, fresh, info.wwnn, &op), 0u);
  const HBA_HANDLE h = open(0);
  HBA_PORTATTRIBUTES port{};
  ASSERT_EQ(SIM_CALL(hbaapi(), HBA_GetAdapterPortAttributes, h, 0, &port), 0u);
  EXPECT_EQ(std::memcmp(port.PortWWN.wwn, fresh.wwn, 8), 0);
}

TEST_F(HbaApi, FunctionHiddenFromTheHbaApiHasNoAdapter) {
  std::ifstream in(sample_site());
  std::ostringstream text;
  text << in.rdbuf();
  std::string site = text.str();
  const std::string second = "\"kind\": \"fcoe\", \"port\": 1,";
  ASSERT_NE(site.find(second), std::string::npos);
  site.replace(site.find(second), second.size(), "\"kind\": \"fcoe\", \"hba_api\": false, \"port\": 1,");
  ASSERT_TRUE(nrvsim::SimSite::instance().reload(write_site("sim_hidden_site.json", site)));
  EXPECT_EQ(SIM_CALL(hbaapi(), HBA_GetNumberOfAdapters), 1u);
  // The management library still lists it.
  EXPECT_EQ(SIM_CALL(lrmapi(), RM_GetNumberOfLocalAdapters), 10u);
}

TEST_F(HbaApi, CallbacksRegisterAndRemoveOnce) {
  const HBA_HANDLE h = open(0);
  HBA_CALLBACKHANDLE cb = nullptr;
  auto noop = +[](void*, HBA_WWN, HBA_UINT32, HBA_UINT32) {};
  ASSERT_EQ(SIM_CALL(hbaapi(), HBA_RegisterForAdapterPortEvents, noop, nullptr, h, HBA_WWN{}, &cb), 0u);
  EXPECT_EQ(SIM_CALL(hbaapi(), HBA_RemoveCallback, cb), 0u);
  EXPECT_NE(SIM_CALL(hbaapi(), HBA_RemoveCallback, cb), 0u);
}

}  // namespace
}  // namespace nrvsim_test
