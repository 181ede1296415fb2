// The libraries are called from several threads at once (the data-fetch
// thread and CIMOM request threads); state changes and reads must not race.
#include <gtest/gtest.h>

#include <atomic>
#include <cstring>
#include <thread>
#include <vector>

#include "SimLibrary.h"
#include "sim/SimSite.h"

namespace nrvsim_test {
namespace {

TEST(Threads, ConcurrentReadsAndChangesStayConsistent) {
  ASSERT_TRUE(lrmapi().ok());
  ASSERT_TRUE(hbaapi().ok());
  ASSERT_TRUE(nrvsim::SimSite::instance().reload(sample_site()));
  RM_ADAPTER_INSTANCE pair{0, 2};  // first iSCSI function
  RM_LOCAL_HBA_INFO_V4 info{};
  ASSERT_EQ(SIM_CALL(lrmapi(), RM_GetLocalHBAInfoV4, &pair, &info), 0u);
  const HBA_NAME iscsi = info.wwpn;

  std::atomic<int> failures{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&, t] {
      for (int i = 0; i < 50; ++i) {
        if (t % 2 == 0) {
          const std::string target = "iqn.2024-01.com.example:t" + std::to_string(t) + "-" + std::to_string(i);
          const RM_IP_ADDRESS portal{{10, 20, 40, 9}, 3260, 0, 0};
          if (SIM_CALL(lrmapi(), LRM_iSCSI_AddTarget, iscsi, 1, target.c_str(), &portal, nullptr, nullptr) != 0)
            ++failures;
        } else {
          std::vector<unsigned char> blob(RM_PORT_STATISTICS_SIZE);
          HBA_UINT32 size = RM_PORT_STATISTICS_SIZE;
          if (SIM_CALL(lrmapi(), LRM_GetPortStatistics, iscsi, blob.data(), &size) != 0) ++failures;
          char name[256] = {};
          if (SIM_CALL(hbaapi(), HBA_GetAdapterName, 0, name) != 0) ++failures;
          const HBA_HANDLE h = SIM_CALL(hbaapi(), HBA_OpenAdapter, name);
          if (h == 0) ++failures;
          HBA_PORTATTRIBUTES port{};
          if (SIM_CALL(hbaapi(), HBA_GetAdapterPortAttributes, h, 0, &port) != 0) ++failures;
          SIM_CALL(hbaapi(), HBA_CloseAdapter, h);
        }
      }
    });
  }
  for (auto& th : threads) th.join();
  EXPECT_EQ(failures.load(), 0);
  std::vector<unsigned char> buf(8 + 516 * 200);
  HBA_UINT32 size = static_cast<HBA_UINT32>(buf.size());
  ASSERT_EQ(SIM_CALL(lrmapi(), LRM_iSCSI_GetTargets, iscsi, 0, buf.data(), &size), 0u);
  HBA_UINT32 count = 0;
  std::memcpy(&count, buf.data(), 4);
  EXPECT_EQ(count, 3u + 2 * 50);
}

}  // namespace
}  // namespace nrvsim_test
