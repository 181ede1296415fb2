// Several clients at once against one host and the test module: readers,
// writers, association walks and methods interleave for a bounded number of
// rounds; every answer stays correct.  No associators here: their fetches up-call
// the host while the association adapter's lock is held, and the host's
// provider-table lock, the adapters' shared record lock (held by factories
// and cleanups) and that adapter lock then form an order cycle that only a
// cleanup racing a call on the same provider could close.
#include <atomic>
#include <thread>

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

}  // namespace
}  // namespace e2e
