// Concurrency of the agent: many readers while fetches are forced from
// every direction, the wait that must survive a spurious wake-up, and loads
// and unloads racing on the reference count.  Labelled "threads": run under
// ThreadSanitizer as well.
#include <atomic>
#include <thread>
#include <vector>

#include "AgentFixture.h"
#include "logging/Log.h"
#include "derivedObjects/Catalogue_Provider.h"
#include "schema/Classes.h"

namespace nrv_test {
namespace {

using namespace cimple;

class AgentThreadsTest : public AgentTest {
 protected:
  void SetUp() override {
    AgentTest::SetUp();
    chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
    disk = make_slot<Catalogue_Provider<NRVTAVO_LogicalDisk>, NRVTAVO_LogicalDisk>();
  }
  void TearDown() override {
    chip.reset();
    disk.reset();
    AgentTest::TearDown();
  }

  // Readers on both catalogues while one thread keeps forcing fetches: by a
  // reached timeout, by the rebuild flags and by SAN requests.  Every
  // snapshot must be one whole generation of the fake catalogue.
  void run_readers_against_forced_fetches(const std::string& config) {
    if (!config.empty()) write_file(sysroot_path(kNrvConfigFile), config);
    ASSERT_EQ(chip->load(), LOAD_OK);
    ASSERT_EQ(disk->load(), LOAD_OK);
    ProviderAgent& agent = *ProviderAgent::peekInstance();
    FakeCatalogue::get().chips = 12;
    FakeCatalogue::get().disks = 9;

    constexpr int kReaders = 6;
    constexpr int kReadsEach = 40;
    constexpr int kForcedFetches = 60;
    std::atomic<int> partial{0}, failed{0};
    std::atomic<bool> readers_done{false};

    std::thread forcer([&] {
      for (int i = 0; i < kForcedFetches && !readers_done; ++i) {
        switch (i % 3) {
          case 0: {
            std::lock_guard<std::mutex> lock(agent.m_BuildMutex);
            agent.m_LoadedTime = Datetime();  // the cache timed out
            break;
          }
          case 1:
            agent.m_bBuildAdapterData = true;
            break;
          default:
            agent.requestSANData();
            break;
        }
        agent.BuildCimpleInfo();
        std::this_thread::yield();
      }
    });
    std::vector<std::thread> readers;
    for (int r = 0; r < kReaders; ++r) {
      readers.emplace_back([&, r] {
        for (int i = 0; i < kReadsEach; ++i) {
          Collected got;
          const bool san = (i + r) % 2 == 0;
          if ((san ? disk : chip)->enumerate(got) != ENUM_INSTANCES_OK) ++failed;
          if (!one_generation(got, san ? 9 : 12)) ++partial;
        }
      });
    }
    for (std::thread& t : readers) t.join();
    readers_done = true;
    forcer.join();
    wait_fetch_idle(agent);

    EXPECT_EQ(failed, 0);
    EXPECT_EQ(partial, 0) << "a reader saw a catalogue that was not whole";
    EXPECT_GE(FakeCatalogue::get().adapterMapUpdates, 1);
    EXPECT_GE(FakeCatalogue::get().sanMapUpdates, 1);
    EXPECT_EQ(chip->unload(), UNLOAD_OK);
    EXPECT_EQ(disk->unload(), UNLOAD_OK);
  }

  std::unique_ptr<ProviderSlot> chip, disk;
};

TEST_F(AgentThreadsTest, ReadersNeverSeeAPartialCatalogueWithDefaultSettings) {
  run_readers_against_forced_fetches("");
}

TEST_F(AgentThreadsTest, ReadersNeverSeeAPartialCatalogueWhenSANDataIsBuiltOnRequestOnly) {
  // Every SAN read then depends on its request being served, even one made
  // while a fetch that skipped the SAN part is finishing.
  run_readers_against_forced_fetches("NRV_PROVIDER_REFRESH_SANDATA = FALSE\n");
}

TEST_F(AgentThreadsTest, ReadersNeverSeeAPartialCatalogueWithBothRefreshesOn) {
  run_readers_against_forced_fetches("NRV_PROVIDER_REFRESH_ADAPTERDATA = TRUE\n");
}

TEST_F(AgentThreadsTest, AWakeUpWithoutTheReadyFlagDoesNotReleaseAReader) {
  FakeCatalogue& fake = FakeCatalogue::get();
  ASSERT_EQ(chip->load(), LOAD_OK);
  ProviderAgent& agent = *ProviderAgent::peekInstance();
  fake.adapterDataGate.close();
  agent.BuildCimpleInfo();
  fake.adapterDataGate.await_arrivals(1);  // first fetch held before the maps exist

  Collected got;
  std::thread reader([&] { chip->enumerate(got); });
  while (capture.count("DataFetch_Handler thread already running-BuildCimpleInfo") == 0) std::this_thread::yield();
  // Wake the reader again and again while the flag is still false, as a
  // spurious wake-up or a stray broadcast would.
  for (int i = 0; i < 50; ++i) {
    {
      std::lock_guard<std::mutex> lock(agent.m_AdapterMapsReadyMutex);
      agent.m_AdapterMapsReadyCond.notify_all();
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
  }
  fake.adapterDataGate.open();
  reader.join();
  EXPECT_TRUE(one_generation(got, 6)) << "the reader copied the maps before they were filled";
  EXPECT_EQ(chip->unload(), UNLOAD_OK);
}

TEST_F(AgentThreadsTest, LoadsAndUnloadsRaceOnTheReferenceCount) {
  constexpr int kThreads = 4;
  constexpr int kRounds = 8;
  std::atomic<int> bad{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&] {
      auto own = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
      for (int i = 0; i < kRounds; ++i) {
        if (own->load() != LOAD_OK) {
          ++bad;
          continue;
        }
        Collected got;
        own->enumerate(got);
        if (!one_generation(got, 6)) ++bad;
        own->unload();
      }
    });
  }
  for (std::thread& t : threads) t.join();
  EXPECT_EQ(bad, 0);
  EXPECT_EQ(ProviderAgent::refCount(), 0);
  EXPECT_EQ(ProviderAgent::peekInstance(), nullptr);
}

}  // namespace
}  // namespace nrv_test
