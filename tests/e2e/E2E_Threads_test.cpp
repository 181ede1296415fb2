// Several clients at once against one host and the test module: readers,
// writers, association walks and methods interleave for a bounded number of
// rounds; every answer stays correct.  No associators here: their fetches up-call
// the host while the association adapter's lock is held, and the host's
// provider-table lock, the adapters' shared record lock (held by factories
// and cleanups) and that adapter lock then form an order cycle that only a
// cleanup racing a call on the same provider could close.
#include <atomic>
#include <chrono>
#include <thread>

#include "host/EncObjects.h"
#include "host/ObjectRegistry.h"
#include "tests/e2e/E2E_Fixture.h"

namespace e2e {
namespace {

using Concurrency = E2E_Test;

TEST_F(Concurrency, ConcurrentClientsGetConsistentAnswers) {
  constexpr int kThreads = 4;
  constexpr int kRounds = 25;
  std::atomic<int> failures{0};
  auto check = [&](bool ok) {
    if (!ok) ++failures;
  };
  std::vector<std::thread> clients;
  for (int t = 0; t < kThreads; ++t) {
    clients.emplace_back([&, t] {
      for (int round = 0; round < kRounds; ++round) {
        std::string tag = "T" + std::to_string(t) + "_" + std::to_string(round);
        HostInstance card;
        card.path = card_path(tag);
        card.properties = {{"Tag", Datum::string(tag)}, {"CreationClassName", Datum::string("NRVTAVO_Card")}};
        check(host_->createInstance(card).ok());
        check(host_->getInstance(card_path(tag)).ok());
        check(host_->associatorNames(card_path("A")).paths.size() == 2);
        check(host_->referenceNames(chip_path("X")).paths.size() == 1);
        Result call = host_->invokeMethod(service_path("svc"), "RequestStateChange",
                                          {{"RequestedState", Datum::string("2")}});
        check(call.ok() && call.returnValue.asInteger() == 0);
        check(host_->enumerateInstanceNames(kNs, "NRVTAVO_Card").paths.size() >= 2);
        check(host_->deleteInstance(card_path(tag)).ok());
      }
    });
  }
  for (std::thread& client : clients) client.join();
  EXPECT_EQ(failures.load(), 0);
  EXPECT_EQ(host_->enumerateInstanceNames(kNs, "NRVTAVO_Card").paths.size(), 2u);
}

// The agent's data fetch runs on a thread that a provider's call started,
// and other providers keep the module loaded while the starting one is
// cleaned up.  The thread's up-calls after that must not reach the starting
// provider's adapter (ASan and TSan watch this test).
TEST_F(Concurrency, AStartedThreadOutlivesTheProviderThatStartedIt) {
  test::Store::Fetch& fetch = module_store().fetch;
  fetch.requested = true;
  ASSERT_TRUE(host_->enumerateInstances(kNs, "NRVTAVO_Chip").ok());
  {
    std::unique_lock<std::mutex> lock(fetch.mutex);
    ASSERT_TRUE(fetch.changed.wait_for(lock, std::chrono::seconds(60), [&] { return fetch.counted_before; }));
    EXPECT_EQ(fetch.cards_before, 2);
  }
  ClassMis chip = host_->mis("NRVTAVO_Chip");
  ASSERT_TRUE(chip.instance && chip.method);
  {
    ArenaScope scope;
    CMPIContext* context = makeContext(host_->broker(), Broker::requestContext(kNs));
    EXPECT_EQ(chip.method->ft->cleanup(chip.method, context, false).rc, CMPI_RC_OK);
    EXPECT_EQ(chip.instance->ft->cleanup(chip.instance, context, false).rc, CMPI_RC_OK);
  }
  EXPECT_FALSE(host_->enumerateInstances(kNs, "NRVTAVO_Chip").ok());  // that provider is gone
  {
    std::lock_guard<std::mutex> lock(fetch.mutex);
    fetch.go_on = true;
  }
  fetch.changed.notify_all();
  auto join = reinterpret_cast<int (*)()>(module_symbol("nrv_test_module_join_fetch"));
  ASSERT_NE(join, nullptr);
  ASSERT_EQ(join(), 0);
  EXPECT_EQ(fetch.cards_after, 2);
}

}  // namespace
}  // namespace e2e
