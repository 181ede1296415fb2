// When the agent fetches and what a fetch rebuilds: the first read, the
// cache timeout measured from the end of the last fetch, SAN requests, the
// refresh settings, the clearing groups and the driver-log readers.
#include <sys/resource.h>

#include <fstream>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "AgentFixture.h"
#include "logging/Log.h"
#include "agent/Catalogue_Maps.h"
#include "derivedObjects/Catalogue_Provider.h"
#include "schema/Classes.h"
#include "tests/common/Special_Files.h"

namespace nrv_test {
namespace {

using namespace cimple;

// Every map of the agent with the class it is bound to: one table row per class keeps the
// per-class checks below loops rather than hundreds of expanded assertions.
struct Bound_Map {
  const char* name;
  Instance_Map* map;
  const Meta_Class* own_class;
};

std::vector<Bound_Map> every_map(ProviderAgent& agent) {
#define NRV_TEST_BOUND_MAP(C) {#C, &agent_map<C>(agent), &C::static_meta_class},
  return {NRV_FOR_EACH_PROVIDER_CLASS(NRV_TEST_BOUND_MAP) NRV_HOST_MAPS(NRV_TEST_BOUND_MAP)};
#undef NRV_TEST_BOUND_MAP
}

class FetchTest : public AgentTest {
 protected:
  // Loads the agent through a Chip provider and runs the first fetch.
  ProviderAgent& start(const std::string& config = "") {
    if (!config.empty()) write_file(sysroot_path(kNrvConfigFile), config);
    chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
    disk = make_slot<Catalogue_Provider<NRVTAVO_LogicalDisk>, NRVTAVO_LogicalDisk>();
    EXPECT_EQ(chip->load(), LOAD_OK);
    EXPECT_EQ(disk->load(), LOAD_OK);
    return *ProviderAgent::peekInstance();
  }

  // Pretends the last fetch ended `minutes` ago.
  static void age_catalogue(ProviderAgent& agent, uint64_t minutes) {
    std::lock_guard<std::mutex> lock(agent.m_BuildMutex);
    const Datetime now = Datetime::now();
    agent.m_LoadedTime = Datetime::timestamp(now.usec() - minutes * 60000000ULL, now.utc_offset());
  }

  void TearDown() override {
    if (chip) chip->unload();
    if (disk) disk->unload();
    chip.reset();
    disk.reset();
    AgentTest::TearDown();
  }

  std::unique_ptr<ProviderSlot> chip, disk;
};

TEST_F(FetchTest, TheFirstReadFetchesBothPartsAndWaitsForThem) {
  ProviderAgent& agent = start();
  EXPECT_FALSE(agent.m_bIsAdapterMapsReady);
  Collected chips;
  EXPECT_EQ(chip->enumerate(chips), ENUM_INSTANCES_OK);
  EXPECT_EQ(chips.closing, ENUM_INSTANCES_OK);
  EXPECT_TRUE(one_generation(chips, 6));
  EXPECT_TRUE(capture.contains("PERF: TimeOut"));
  EXPECT_TRUE(capture.contains("PERF: ---Created DataFetch_Handler thread -- BuildCimpleInfo END---"));
  EXPECT_TRUE(capture.contains("NRVTAVO_Chip_Provider::enum_instances()"));
  wait_fetch_idle(agent);
  // Defaults: adapter refresh off, SAN refresh on; the first fetch builds both.
  FakeCatalogue& fake = FakeCatalogue::get();
  EXPECT_EQ(fake.adapterDataBuilds, 1);
  EXPECT_EQ(fake.adapterMapUpdates, 1);
  EXPECT_EQ(fake.sanMapUpdates, 1);
  EXPECT_TRUE(agent.m_bIsSANMapsReady);
  EXPECT_FALSE(agent.m_bBuildAdapterData);
  EXPECT_FALSE(agent.m_LoadedTime == Datetime());
}

TEST_F(FetchTest, TheCacheTimeoutRunsFromTheEndOfTheLastFetch) {
  ProviderAgent& agent = start();
  Collected first;
  chip->enumerate(first);
  wait_fetch_idle(agent);
  FakeCatalogue& fake = FakeCatalogue::get();

  age_catalogue(agent, 9);
  capture.reset();
  agent.BuildCimpleInfo();
  EXPECT_TRUE(capture.contains("PERF: Refresh Not yet required"));
  EXPECT_TRUE(capture.contains("PERF: ---No timeout BuildCimpleInfo END---"));
  EXPECT_EQ(fake.adapterDataBuilds, 1);

  age_catalogue(agent, 10);
  capture.reset();
  Collected second;
  chip->enumerate(second);
  wait_fetch_idle(agent);
  EXPECT_TRUE(capture.contains("PERF: TimeOut"));
  EXPECT_TRUE(capture.contains("PERF: Clearing the previous thread...with join"));
  EXPECT_EQ(fake.adapterDataBuilds, 2);  // a timeout rebuilds the adapter part
  EXPECT_TRUE(one_generation(second, 6));
}

TEST_F(FetchTest, TheConfiguredTimeoutIsUsed) {
  ProviderAgent& agent = start("NRV_PROVIDER_CACHE_TIMEOUT = 2\n");
  EXPECT_EQ(agent.m_CacheTimeout, 2);
  agent.BuildCimpleInfo();
  wait_fetch_idle(agent);
  age_catalogue(agent, 2);
  capture.reset();
  agent.BuildCimpleInfo();
  wait_fetch_idle(agent);
  bool logged_timeout = false;
  for (const auto& e : capture.entries())
    logged_timeout |= e.message.rfind("loadedtime = ", 0) == 0 && e.message.find("; cache timeout = 2") != std::string::npos;
  EXPECT_TRUE(logged_timeout);
  EXPECT_TRUE(capture.contains("PERF: TimeOut"));
  EXPECT_EQ(FakeCatalogue::get().adapterDataBuilds, 2);
}

TEST_F(FetchTest, ASANReadRequestsOnlyTheSANPart) {
  ProviderAgent& agent = start("NRV_PROVIDER_REFRESH_SANDATA = FALSE\n");
  FakeCatalogue& fake = FakeCatalogue::get();
  Collected chips;
  chip->enumerate(chips);
  wait_fetch_idle(agent);
  EXPECT_EQ(fake.sanMapUpdates, 0);
  EXPECT_FALSE(agent.m_bIsSANMapsReady);

  Collected disks;
  EXPECT_EQ(disk->enumerate(disks), ENUM_INSTANCES_OK);
  EXPECT_TRUE(one_generation(disks, 4));
  wait_fetch_idle(agent);
  EXPECT_EQ(fake.sanMapUpdates, 1);
  EXPECT_EQ(fake.adapterDataBuilds, 1);  // the adapter part was left alone
  EXPECT_EQ(fake.adapterMapUpdates, 1);
  EXPECT_FALSE(agent.m_bBuildSANData);

  // Once the SAN maps are ready a SAN read fetches nothing more.
  Collected again;
  disk->enumerate(again);
  wait_fetch_idle(agent);
  EXPECT_EQ(fake.sanMapUpdates, 1);
}

TEST_F(FetchTest, AdapterRefreshRebuildsTheAdapterPartOnEveryFetch) {
  ProviderAgent& agent = start("NRV_PROVIDER_REFRESH_ADAPTERDATA = TRUE\nNRV_PROVIDER_REFRESH_SANDATA = FALSE\n");
  Collected chips;
  chip->enumerate(chips);
  wait_fetch_idle(agent);
  Collected disks;
  disk->enumerate(disks);  // a SAN request, but adapter refresh is on
  wait_fetch_idle(agent);
  EXPECT_EQ(FakeCatalogue::get().adapterDataBuilds, 2);
  EXPECT_TRUE(one_generation(disks, 4));
}

TEST_F(FetchTest, AReadDuringAFetchJoinsItInsteadOfStartingAnother) {
  ProviderAgent& agent = start();
  FakeCatalogue& fake = FakeCatalogue::get();
  fake.adapterDataGate.close();
  agent.BuildCimpleInfo();
  fake.adapterDataGate.await_arrivals(1);

  Collected chips;
  std::thread reader([&] { chip->enumerate(chips); });
  while (capture.count("DataFetch_Handler thread already running-BuildCimpleInfo") == 0) std::this_thread::yield();
  fake.adapterDataGate.open();
  reader.join();
  wait_fetch_idle(agent);
  EXPECT_TRUE(one_generation(chips, 6));
  EXPECT_EQ(fake.adapterDataBuilds, 1);
}

// Every map but the survivors is emptied, whichever group the lists put it in.
TEST_F(FetchTest, ClearingEmptiesTheGroupsAndKeepsTheSurvivors) {
  ProviderAgent& agent = start();
  std::set<std::string> survivors;
#define NRV_TEST_SURVIVOR(C) survivors.insert(#C);
  NRV_SURVIVOR_MAPS(NRV_TEST_SURVIVOR)
#undef NRV_TEST_SURVIVOR
  const std::vector<Bound_Map> maps = every_map(agent);
  {
    std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
    for (const Bound_Map& m : maps) ASSERT_GE(m.map->insert(create(m.own_class, false)), 0) << m.name;
  }
  capture.reset();
  agent.ClearMaps();
  for (const Bound_Map& m : maps) EXPECT_EQ(m.map->size(), survivors.count(m.name)) << m.name;
  EXPECT_TRUE(survivors.count("NRVTAVO_ConcreteJob"));
  EXPECT_TRUE(survivors.count("NRVTAVO_iSCSISettingService"));

  long at = 0;
  for (const char* text :
       {"Entered ClearMaps()", "PERF: Entered clearAdapterMaps()", "Clearing Record Log maps", "Clearing NIC maps",
        "Clearing SoftwareUpdate maps", "Clearing Software Update maps", "Clearing NRV CDM maps",
        "Done with Clearing CDM maps", "Clearing NRVTAVO FCOE maps", "Done with Clearing FCOE maps",
        "Clearing NRVTAVO iSCSI maps", "Done with Clearing iSCSI maps", "Exiting clearAdapterMaps()",
        "PERF: Entered FCoE clearSANMaps()", "PERF: Entered iSCSI clearSANMaps()", "Exiting clearSANMaps()",
        "Exiting ClearMaps()"}) {
    const long found = capture.find(text, at);
    EXPECT_GE(found, at) << text;
    if (found >= 0) at = found + 1;
  }
}

// Every class has its map, bound by class; SAN classes read the SAN catalogue.
TEST_F(FetchTest, EveryProviderClassHasItsOwnMap) {
  ProviderAgent& agent = start();
  for (const Bound_Map& m : every_map(agent)) EXPECT_EQ(m.map->meta_class(), m.own_class) << m.name;
  EXPECT_EQ(catalogue_of<NRVTAVO_LogicalDisk>, Catalogue::SAN);
  EXPECT_EQ(catalogue_of<NRVTAVO_iSCSISession>, Catalogue::SAN);
  EXPECT_EQ(catalogue_of<NRVTAVO_HostedISCSIAccesspoint>, Catalogue::SAN);
  EXPECT_EQ(catalogue_of<NRVTAVO_Chip>, Catalogue::Adapter);
  EXPECT_EQ(catalogue_of<NRVTAVO_ISCSISessionFailures>, Catalogue::Adapter);
  int san = 0;
#define NRV_TEST_COUNT_SAN(C) san += catalogue_of<C> == Catalogue::SAN;
  NRV_FOR_EACH_PROVIDER_CLASS(NRV_TEST_COUNT_SAN)
#undef NRV_TEST_COUNT_SAN
  EXPECT_EQ(san, 34);  // 11 classes and 23 associations
}

TEST_F(FetchTest, DriverLogsKeepTheNewestLinesOfTheirDriverUpTo200) {
  ProviderAgent& agent = start();
  std::string messages;
  for (int i = 0; i < 250; ++i) messages += "Dec  6 kernel: nvfc line " + std::to_string(i) + "\n";
  messages += "Dec  6 kernel: nvnic link up\nDec  6 kernel: unrelated\n";
  write_file(sysroot_path(kNrvSystemLogFile), messages);

  agent.logFCDriverEvents();
  agent.logNICDriverEvents();
  agent.logISCSIDriverEvents();
  const auto fc = agent.m_FCDriverLog.lines();
  ASSERT_EQ(fc.size(), 200u);
  EXPECT_EQ(fc.front(), "Dec  6 kernel: nvfc line 249");
  EXPECT_EQ(fc.back(), "Dec  6 kernel: nvfc line 50");
  EXPECT_EQ(agent.m_NICDriverLog.lines(), std::vector<std::string>{"Dec  6 kernel: nvnic link up"});
  EXPECT_TRUE(agent.m_ISCSIDriverLog.lines().empty());
  EXPECT_TRUE(capture.contains("Reading Events for nvfc"));
  EXPECT_TRUE(capture.contains("Finished reading Events for nviscsi"));
  EXPECT_TRUE(capture.contains("Logging of FCoE-FC Driver Log Ends"));
  EXPECT_TRUE(capture.contains("Logging of TAVO - NIC Driver Log Ends"));
  EXPECT_TRUE(capture.contains("Logging of TAVO - iSCSI Driver Log Ends"));

  remove_file(sysroot_path(kNrvSystemLogFile));
  agent.logISCSIDriverEvents();  // no system log: nothing added, no failure
  EXPECT_TRUE(agent.m_ISCSIDriverLog.lines().empty());
  for (const Special_Case& c : kSpecialFiles) {
    ASSERT_TRUE(make_special(sysroot_path(kNrvSystemLogFile), c.kind));
    Hang_Guard guard(std::string("reading a system log that is a ") + c.name);
    agent.logISCSIDriverEvents();
    EXPECT_TRUE(agent.m_ISCSIDriverLog.lines().empty()) << c.name;
  }
  ::rmdir(sysroot_path(kNrvSystemLogFile).c_str());
  remove_file(sysroot_path(kNrvSystemLogFile));
}

// Run in a child, whose peak memory use is its own.
TEST_F(FetchTest, DISABLED_ChildAHugeSystemLogIsReadInLittleMemory) {
  ProviderAgent& agent = start();
  const int lines = 200000;  // some 32 MiB, every line the FC driver's
  {
    std::ofstream out(sysroot_path(kNrvSystemLogFile), std::ios::binary | std::ios::trunc);
    const std::string filler(120, '.');
    for (int i = 0; i < lines; ++i) out << "Dec  6 kernel: nvfc " << filler << " line " << i << "\n";
  }
  struct rusage before {};
  ::getrusage(RUSAGE_SELF, &before);
  agent.logFCDriverEvents();
  struct rusage after {};
  ::getrusage(RUSAGE_SELF, &after);
  const auto fc = agent.m_FCDriverLog.lines();
  ASSERT_EQ(fc.size(), 200u);
  EXPECT_NE(fc.front().find(" line " + std::to_string(lines - 1)), std::string::npos);
#if !defined(__SANITIZE_ADDRESS__)
  // ASan's quarantine and shadow memory keep freed chunks resident, so the
  // peak says nothing about the reader there; the plain build checks it.
  EXPECT_LT(after.ru_maxrss - before.ru_maxrss, 16 * 1024) << "KiB more at the peak";
#endif
  remove_file(sysroot_path(kNrvSystemLogFile));
}

TEST(DriverLogMemory, AHugeSystemLogIsReadInLittleMemory) {
  EXPECT_EQ(run_in_child("FetchTest.DISABLED_ChildAHugeSystemLogIsReadInLittleMemory", NRV_AGENT_STUB_DIR), 0);
}

}  // namespace
}  // namespace nrv_test
