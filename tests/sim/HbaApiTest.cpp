// The HBA API library as the module's SAN discovery calls it, at smoke
// level: adapter names, SCSI inquiry answers and closed handles.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

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

TEST_F(HbaApi, ClosedHandleIsRefused) {
  const HBA_HANDLE h = open(0);
  SIM_CALL(hbaapi(), HBA_CloseAdapter, h);
  handle_ = 0;
  HBA_ADAPTERATTRIBUTES attrs{};
  EXPECT_EQ(SIM_CALL(hbaapi(), HBA_GetAdapterAttributes, h, &attrs),
            static_cast<HBA_STATUS>(HBA_STATUS_ERROR_INVALID_HANDLE));
}

}  // namespace
}  // namespace nrvsim_test
