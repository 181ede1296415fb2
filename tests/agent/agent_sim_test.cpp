// The agent with its real parts (runtime loader, method wrapper, adapter
// data set, its own builders) against the simulated adapter site: providers
// load, the catalogue is built from the site and the provider settings are
// served, and the last unload takes everything down again.
#include <gtest/gtest.h>

#include "AgentTestSupport.h"
#include "agent/NrvConfigFile.h"
#include "data/NRV_Data.h"
#include "agent/Catalogue_Provider.h"
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

}  // namespace
}  // namespace nrv_test
