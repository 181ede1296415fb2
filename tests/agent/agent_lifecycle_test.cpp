// The agent's life: providers loaded through their procedure take and drop
// it, the last unload destroys it (after any running fetch), construction
// and destruction log their texts in order, and a failed construction makes
// every load fail without stopping anything.
#include <unistd.h>

#include <thread>

#include "AgentFixture.h"
#include "derivedObjects/Catalogue_Provider.h"
#include "logging/CLogger.h"
#include "logging/Log.h"
#include "schema/NRVTAVO_Chip.h"
#include "schema/NRVTAVO_LogicalDisk.h"
#include "tests/common/Special_Files.h"

namespace nrv_test {
namespace {

using cimple::Catalogue_Provider;
using cimple::NRVTAVO_Chip;
using cimple::NRVTAVO_LogicalDisk;
using cimple::ProviderAgent;

using LifecycleTest = AgentTest;

TEST_F(LifecycleTest, ProvidersShareOneAgentUntilTheLastUnload) {
  auto chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
  auto disk = make_slot<Catalogue_Provider<NRVTAVO_LogicalDisk>, NRVTAVO_LogicalDisk>();

  ASSERT_EQ(chip->load(), cimple::LOAD_OK);
  ProviderAgent* agent = ProviderAgent::peekInstance();
  ASSERT_NE(agent, nullptr);
  EXPECT_TRUE(agent->m_bIsLoaded);
  ASSERT_EQ(disk->load(), cimple::LOAD_OK);
  EXPECT_EQ(ProviderAgent::peekInstance(), agent);
  EXPECT_EQ(ProviderAgent::refCount(), 2);
  EXPECT_TRUE(capture.contains("ProviderAgent::addRef[0]"));
  EXPECT_TRUE(capture.contains("ProviderAgent::addRef[1]"));

  EXPECT_EQ(chip->unload(), cimple::UNLOAD_OK);
  EXPECT_EQ(ProviderAgent::peekInstance(), agent);
  EXPECT_TRUE(capture.contains("NRVTAVO_Chip_Provider::unload()"));
  EXPECT_FALSE(capture.contains("Norvane Provider Unloaded"));

  EXPECT_EQ(disk->unload(), cimple::UNLOAD_OK);
  EXPECT_EQ(ProviderAgent::peekInstance(), nullptr);
  EXPECT_EQ(ProviderAgent::refCount(), 0);
  EXPECT_TRUE(capture.contains("ProviderAgent::releaseRef[1]"));
  EXPECT_EQ(capture.count("Norvane Provider Unloaded", cimple::NRV_INFO), 1);
}

TEST_F(LifecycleTest, ConstructionRegistersTheSinksAndLogsTheBanner) {
  auto chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
  ASSERT_EQ(chip->load(), cimple::LOAD_OK);
  ProviderAgent* agent = ProviderAgent::peekInstance();

  // Its file, record-log and syslog sinks beside the capture.
  EXPECT_EQ(cimple::CLogger::instance().sinkCount(), 4u);
  EXPECT_EQ(cimple::CLogger::instance().registerSink(&agent->m_FileLogger), 0);
  EXPECT_EQ(cimple::CLogger::instance().registerSink(&agent->m_CIMLogger), 0);

  const std::string banner = "Norvane Provider v10.2.107-7 Loaded[" + std::to_string(::getpid()) + "]";
  const long init = capture.find("Initializing RM API ");
  ASSERT_GE(init, 0);
  EXPECT_GT(capture.find(banner, init), init);
  EXPECT_EQ(capture.count(banner, cimple::NRV_INFO), 1);
  // No logger data file in the test root: the fault-data default applies.
  EXPECT_EQ(capture.count(" Please see the default log: " + sysroot_path(cimple::kNrvFaultDataFile),
                          cimple::NRV_CRIT),
            1);
  EXPECT_FALSE(capture.contains("Error : In Loading Library "));
  EXPECT_EQ(chip->unload(), cimple::UNLOAD_OK);
}

TEST_F(LifecycleTest, DestructionRunsItsStepsInOrderAndRewritesTheConfiguration) {
  write_file(sysroot_path(cimple::kNrvConfigFile), "NRV_PROVIDER_CACHE_TIMEOUT = 20\n");
  auto chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
  ASSERT_EQ(chip->load(), cimple::LOAD_OK);
  Collected all;
  chip->enumerate(all);  // builds the catalogue once
  capture.reset();
  ASSERT_EQ(chip->unload(), cimple::UNLOAD_OK);

  long at = 0;
  for (const char* step : {"Entering dtor ~ProviderAgent()", "Deleting Data pointer", "MethodWrapper",
                           "Clearing the ConcreteJob objects related to CDM", "Clearing all the record logs",
                           "Entered ClearMaps()", "PERF: Entered clearAdapterMaps()", "Exiting clearAdapterMaps()",
                           "PERF: Entered FCoE clearSANMaps()", "Exiting clearSANMaps()", "Exiting ClearMaps()",
                           "Norvane Provider Unloaded"}) {
    const long found = capture.find(step, at);
    EXPECT_GE(found, at) << step;
    if (found >= 0) at = found;
  }
  EXPECT_FALSE(capture.contains("Error in ProviderAgent unload. Just continue"));
  EXPECT_EQ(read_file(sysroot_path(cimple::kNrvConfigFile)),
            "##################################################\n"
            "# Norvane HBA CIM Provider Configuration Settings #\n"
            "##################################################\n"
            "NRV_PROVIDER_CACHE_TIMEOUT = 20\n"
            "NRV_PROVIDER_REFRESH_ADAPTERDATA = FALSE\n"
            "NRV_PROVIDER_REFRESH_SANDATA = TRUE\n");
}

TEST_F(LifecycleTest, AnUnloadWithoutALoadDoesNotUnbalanceTheCount) {
  auto chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
  EXPECT_EQ(chip->unload(), cimple::UNLOAD_OK);
  EXPECT_EQ(ProviderAgent::refCount(), 0);
  ASSERT_EQ(chip->load(), cimple::LOAD_OK);
  EXPECT_EQ(ProviderAgent::refCount(), 1);
  EXPECT_EQ(chip->unload(), cimple::UNLOAD_OK);
  EXPECT_EQ(ProviderAgent::peekInstance(), nullptr);
}

TEST_F(LifecycleTest, ALoadAfterTheLastUnloadBuildsAFreshAgent) {
  auto chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
  for (int round = 0; round < 2; ++round) {
    ASSERT_EQ(chip->load(), cimple::LOAD_OK);
    Collected all;
    chip->enumerate(all);
    EXPECT_TRUE(one_generation(all, 6));
    ASSERT_EQ(chip->unload(), cimple::UNLOAD_OK);
    capture.arm();
  }
  EXPECT_EQ(FakeCatalogue::get().adapterMapUpdates, 2);
}

TEST_F(LifecycleTest, UnloadingWhileAFetchRunsWaitsForIt) {
  FakeCatalogue& fake = FakeCatalogue::get();
  auto chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
  ASSERT_EQ(chip->load(), cimple::LOAD_OK);
  fake.adapterDataGate.close();
  ProviderAgent::peekInstance()->BuildCimpleInfo();
  fake.adapterDataGate.await_arrivals(1);  // the fetch is inside buildAdapterData

  std::thread unloading([&] { chip->unload(); });
  // Give the unload time to reach the join; the order below holds either way.
  std::this_thread::sleep_for(std::chrono::milliseconds(20));
  fake.adapterDataGate.open();
  unloading.join();

  const long built = capture.find("fake: adapter data built");
  ASSERT_GE(built, 0);
  EXPECT_GT(capture.find("Deleting Data pointer"), built);
  EXPECT_GT(capture.find("Norvane Provider Unloaded"), built);
  // The fetch ran to its end (the unload cleared m_bIsLoaded, so it skipped
  // its remaining builders) before the data set went.
  const long ended = capture.find("PERF: DataFetch_Handler Thread END");
  EXPECT_GT(ended, built);
  EXPECT_GT(capture.find("Deleting Data pointer"), ended);
  EXPECT_EQ(ProviderAgent::peekInstance(), nullptr);
}

// Neither file may stall the load, which holds the agent mutex that every
// other provider load waits for.
TEST_F(LifecycleTest, SpecialFilesInPlaceOfTheSettingsLeaveTheDefaultsAndAreLeftAlone) {
  const std::string config = sysroot_path(cimple::kNrvConfigFile);
  const std::string dump = sysroot_path(cimple::kNrvDumpFile);
  for (const Special_Case& c : kSpecialFiles) {
    SCOPED_TRACE(c.name);
    ASSERT_TRUE(make_special(config, c.kind));
    ASSERT_TRUE(make_special(dump, c.kind));
    capture.arm();
    capture.reset();
    auto chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
    {
      Hang_Guard guard(std::string("a provider load over settings files that are a ") + c.name);
      ASSERT_EQ(chip->load(), cimple::LOAD_OK);
      ProviderAgent* agent = ProviderAgent::peekInstance();
      EXPECT_EQ(agent->m_CacheTimeout, 10);
      EXPECT_TRUE(agent->m_bRefreshSANData);
      EXPECT_EQ(chip->unload(), cimple::UNLOAD_OK);
    }
    EXPECT_EQ(capture.count("Unable to open provider config setting file - " + config, cimple::NRV_ERR), 1);
    EXPECT_EQ(capture.count("Unable to open config data file - " + dump, cimple::NRV_ERR), 1);
    EXPECT_TRUE(is_special(config, c.kind));
    EXPECT_TRUE(is_special(dump, c.kind));
  }
  for (const std::string& path : {config, dump}) {
    ::rmdir(path.c_str());
    remove_file(path);
  }
}

// ---- construction without a usable management library, each in a child process --
// of its own (a failed agent stays for the life of the process by design).

// Without a management library there is nothing to initialise: the agent
// loads and builds what needs no library (the provider settings), so a
// client sees them, and it says what is missing.
TEST_F(LifecycleTest, DISABLED_ChildLoadsWithoutAManagementLibrary) {
  auto chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
  EXPECT_EQ(chip->load(), cimple::LOAD_OK);
  EXPECT_EQ(ProviderAgent::refCount(), 1);
  EXPECT_EQ(capture.count("Error : In Loading Library ", cimple::NRV_ERR), 1);
  EXPECT_EQ(capture.count("No management library (liblrmapi.so, librmapi.so) found: no adapter can be managed",
                          cimple::NRV_CRIT),
            1);
  EXPECT_FALSE(capture.contains("Norvane CIM Provider load failure"));
  ProviderAgent* agent = ProviderAgent::peekInstance();
  ASSERT_NE(agent, nullptr);
  EXPECT_TRUE(agent->m_bIsLoaded);
  EXPECT_EQ(agent->m_pMethodWrapper, nullptr);

  Collected all;
  EXPECT_EQ(chip->enumerate(all), cimple::ENUM_INSTANCES_OK);
  EXPECT_EQ(FakeCatalogue::get().adapterMapUpdates, 1);
  EXPECT_EQ(chip->unload(), cimple::UNLOAD_OK);
  EXPECT_EQ(ProviderAgent::peekInstance(), nullptr);
  std::_Exit(::testing::Test::HasFailure() ? 1 : 0);
}

TEST_F(LifecycleTest, DISABLED_ChildLoadFailsWhenLibraryInitialisationFails) {
  auto chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
  EXPECT_EQ(chip->load(), cimple::LOAD_FAILED);
  EXPECT_FALSE(capture.contains("Error : In Loading Library "));
  EXPECT_EQ(capture.count("Norvane CIM Provider load failure", cimple::NRV_ERR), 1);
  EXPECT_EQ(ProviderAgent::refCount(), 0);
  std::_Exit(::testing::Test::HasFailure() ? 1 : 0);
}

TEST(LifecycleFailure, LoadsWithoutAManagementLibrary) {
  EXPECT_EQ(run_in_child("LifecycleTest.DISABLED_ChildLoadsWithoutAManagementLibrary", sysroot()), 0);
}

TEST(LifecycleFailure, LoadFailsWhenLibraryInitialisationFails) {
  EXPECT_EQ(run_in_child("LifecycleTest.DISABLED_ChildLoadFailsWhenLibraryInitialisationFails",
                         NRV_AGENT_STUB_DIR, {"NRV_AGENT_STUB_INIT_STATUS=1"}),
            0);
}

}  // namespace
}  // namespace nrv_test
