// A data fetch whose thread cannot be started: it is never run on the
// caller's thread (which may hold m_DataMutex, and a fetch takes the ready
// locks before it), readers do not wait for ever, and the next request
// starts it.  Thread creation is made to fail by wrapping pthread_create at
// link time (see CMakeLists.txt).
#include <pthread.h>

#include <atomic>
#include <cerrno>

#include "AgentFixture.h"
#include "derivedObjects/Catalogue_Provider.h"
#include "logging/Log.h"
#include "schema/Classes.h"
#include "tests/common/Special_Files.h"

namespace {
std::atomic<bool> g_refuse_threads{false};
}

extern "C" int __real_pthread_create(pthread_t*, const pthread_attr_t*, void* (*)(void*), void*);
extern "C" int __wrap_pthread_create(pthread_t* thread, const pthread_attr_t* attr, void* (*start)(void*),
                                     void* arg) {
  if (g_refuse_threads) return EAGAIN;
  return __real_pthread_create(thread, attr, start, arg);
}

namespace nrv_test {
namespace {

using namespace cimple;

class FetchStartTest : public AgentTest {
 protected:
  void TearDown() override {
    g_refuse_threads = false;
    if (chip) chip->unload();
    chip.reset();
    AgentTest::TearDown();
  }
  std::unique_ptr<ProviderSlot> chip;
};

TEST_F(FetchStartTest, AFetchThatCannotStartIsLeftForTheNextRequest) {
  chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
  ASSERT_EQ(chip->load(), LOAD_OK);
  ProviderAgent& agent = *ProviderAgent::peekInstance();
  FakeCatalogue& fake = FakeCatalogue::get();

  g_refuse_threads = true;
  {
    Hang_Guard guard("a request whose fetch cannot start");
    // As a method that changed the adapter does: m_DataMutex held.
    {
      std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
      EXPECT_EQ(agent.BuildCimpleInfo(), 0);
    }
    EXPECT_EQ(fake.adapterDataBuilds, 0) << "the fetch ran on the caller's thread";
    EXPECT_FALSE(agent.m_bIsDataFetchRunning);
    // A reader gets the catalogue as it is instead of waiting for ever.
    Collected none;
    EXPECT_EQ(chip->enumerate(none), ENUM_INSTANCES_OK);
    EXPECT_TRUE(none.instances.empty());
    EXPECT_EQ(fake.adapterDataBuilds, 0);
  }
  EXPECT_EQ(capture.count("Unable to create DataFetch_Handler thread; the catalogue is rebuilt at the next request",
                          NRV_ERR),
            2);

  g_refuse_threads = false;
  Collected chips;
  EXPECT_EQ(chip->enumerate(chips), ENUM_INSTANCES_OK);
  EXPECT_TRUE(one_generation(chips, 6));
  EXPECT_EQ(fake.adapterDataBuilds, 1);
}

}  // namespace
}  // namespace nrv_test
