// The agent with its real parts (runtime loader, method wrapper, adapter
// data set, its own builders) against the simulated adapter site: providers
// load, the catalogue is built from the site and the provider settings are
// served, and the last unload takes everything down again.
#include <gtest/gtest.h>

#include "AgentTestSupport.h"
#include "agent/NrvConfigFile.h"
#include "agent/Status_Refresh.h"
#include "data/NRV_Data.h"
#include "derivedObjects/Catalogue_Provider.h"
#include "logging/Log.h"
#include "logging/NRV_LogDataFile.h"
#include "module/Provider_For.h"
#include "schema/Classes.h"

namespace nrv_test {
namespace {

using namespace cimple;

TEST(AgentSimTest, BuildsTheCatalogueFromTheSimulatedSite) {
  remove_file(sysroot_path(kNrvConfigFile));
  remove_file(sysroot_path(kNrvDumpFile));
  LogCapture capture;
  ProviderAgent::useBuilders(ProviderAgent::defaultBuilders());
  auto settings = make_slot<Provider_For<NRVTAVO_ProviderConfigSetting>::type, NRVTAVO_ProviderConfigSetting>();
  auto disk = make_slot<Catalogue_Provider<NRVTAVO_LogicalDisk>, NRVTAVO_LogicalDisk>();
  ASSERT_EQ(settings->load(), LOAD_OK);
  ASSERT_EQ(disk->load(), LOAD_OK);
  ProviderAgent& agent = *ProviderAgent::peekInstance();
  EXPECT_FALSE(capture.contains("Error : In Loading Library "));

  Collected published;
  EXPECT_EQ(settings->enumerate(published), ENUM_INSTANCES_OK);
  EXPECT_EQ(published.instances.size(), 3u);
  Collected disks;
  EXPECT_EQ(disk->enumerate(disks), ENUM_INSTANCES_OK);
  wait_fetch_idle(agent);
  {
    std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
    ASSERT_NE(agent.m_pData, nullptr);
    EXPECT_GT(agent.m_pData->getAdapterCount(), 0u);
  }
  EXPECT_TRUE(capture.contains("PERF: Building SAN Data..."));
  EXPECT_TRUE(capture.contains("PERF: Updating SAN Maps..."));

  EXPECT_EQ(settings->unload(), UNLOAD_OK);
  EXPECT_EQ(disk->unload(), UNLOAD_OK);
  EXPECT_EQ(ProviderAgent::peekInstance(), nullptr);
  EXPECT_EQ(capture.count("Norvane Provider Unloaded", NRV_INFO), 1);
}

// The driver-parameter refresh rewrites the current values of the instances it
// finds, global ones from the driver's list and local ones from the port's.
TEST(AgentSimTest, DriverParameterReadsRefreshTheCurrentValues) {
  ProviderAgent::useBuilders(ProviderAgent::defaultBuilders());
  using Provider = Provider_For<NRVTAVO_DriverParameterSettingData>::type;
  auto settings = make_slot<Provider, NRVTAVO_DriverParameterSettingData>();
  ASSERT_EQ(settings->load(), LOAD_OK);
  ProviderAgent& agent = *ProviderAgent::peekInstance();
  Collected first;
  EXPECT_EQ(settings->enumerate(first), ENUM_INSTANCES_OK);
  wait_fetch_idle(agent);
  struct Row {
    const char* id;
    uint32 site_value;
  };
  const Row rows[] = {
      {"NRV:FCoE Current Global Driver Parameter:lun-queue-depth", 30},
      {"NRV:FCoE Current Local Driver Parameter:10000090FA5C2E12:lun-queue-depth", 32},
      {"NRV:FCoE Maximum Global Driver Parameter:lun-queue-depth", 7},  // not a current value: kept
  };
  {
    std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
    agent.m_NRVTAVO_DriverParameterSettingData_map.clear();
    for (const Row& row : rows) {
      auto* setting = NRVTAVO_DriverParameterSettingData::create(true);
      setting->InstanceID.set(row.id);
      setting->Value.set(7);
      ASSERT_GE(agent.m_NRVTAVO_DriverParameterSettingData_map.insert(setting), 0);
    }
  }
  resetStatusRefreshTimes();
  Collected refreshed;
  EXPECT_EQ(settings->enumerate(refreshed), ENUM_INSTANCES_OK);
  ASSERT_EQ(refreshed.instances.size(), std::size(rows));
  for (size_t i = 0; i < std::size(rows); ++i) {
    auto* setting = static_cast<NRVTAVO_DriverParameterSettingData*>(refreshed.instances[i]);
    EXPECT_EQ(setting->Value.value, rows[i].site_value) << rows[i].id;
  }
  EXPECT_EQ(settings->unload(), UNLOAD_OK);
}

}  // namespace
}  // namespace nrv_test
