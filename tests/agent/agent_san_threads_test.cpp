// A SAN rebuild whose logical units answer slowly does not hold up readers of
// the adapter catalogue: with one unit's INQUIRY delayed by the simulator, an
// adapter-catalogue enumeration started during the rebuild completes while
// the rebuild is still waiting for that unit.
#include <gtest/gtest.h>

#include <thread>

#include "derivedObjects/Catalogue_Provider.h"
#include "logging/Log.h"
#include "san_test_support.h"
#include "schema/Classes.h"

namespace nrv_test {
namespace {

using namespace cimple;
using nlohmann::json;

// The FC units of the sample site, and the place of the delayed one (LUN 2
// behind the second FCoE port, the eleventh unit scanned).
constexpr int kFcUnits = 13;
constexpr int kUnitsBeforeTheSlowOne = 10;

TEST(SanThreadsTest, AdapterReadersDoNotWaitForSlowLogicalUnits) {
  json site = sample_site();
  // The first INQUIRY of that unit in the second scan (three per scan).
  site["faults"] = json::parse(R"([{"function": "HBA_SendScsiInquiry", "lun": 2, "call": 4, "count": 1,
                                    "adapter": "10:00:00:90:fa:5c:2e:16", "delay_ms": 4000}])");
  EXPECT_EQ(run_over_site(site, "SanThreadsTest.DISABLED_Child"), 0);
}

TEST(SanThreadsTest, DISABLED_Child) {
  auto san = load_san_catalogue();
  ASSERT_NE(san, nullptr);
  ProviderAgent& agent = *ProviderAgent::peekInstance();
  auto chips = make_slot<Catalogue_Provider<NRVTAVO_PCIDevice>, NRVTAVO_PCIDevice>();
  ASSERT_EQ(chips->load(), LOAD_OK);
  ASSERT_EQ(count<NRVTAVO_StorageVolume>(agent), 7u);

  LogCapture log;
  agent.m_bBuildSANData = true;
  agent.BuildCimpleInfo();
  // Wait until the scan has reached the slow unit.
  while (log.count("End Creating Target...") < kUnitsBeforeTheSlowOne) std::this_thread::yield();

  Collected devices;
  EXPECT_EQ(chips->enumerate(devices), ENUM_INSTANCES_OK);
  EXPECT_FALSE(devices.instances.empty());
  // The enumeration is done; the scan is not, and the SAN maps are not yet replaced.
  EXPECT_LT(log.count("End Creating Target..."), kFcUnits);
  EXPECT_FALSE(log.contains("PERF: Updating SAN Maps..."));
  EXPECT_FALSE(agent.m_bIsSANMapsReady);

  wait_fetch_idle(agent);
  EXPECT_EQ(log.count("End Creating Target..."), kFcUnits);
  EXPECT_TRUE(agent.m_bIsSANMapsReady);
  EXPECT_EQ(count<NRVTAVO_StorageVolume>(agent), 7u);
  EXPECT_EQ(chips->unload(), UNLOAD_OK);
  EXPECT_EQ(san->unload(), UNLOAD_OK);
}

}  // namespace
}  // namespace nrv_test
