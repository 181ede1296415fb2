// Concurrent clients: several threads share one host and hammer enumerations, gets, method
// calls with up-calls and associations; every answer must be complete and nothing may leak or
// race. Shutdown waits for the calls in flight.
#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "HostTestSupport.h"
#include "host/Host.h"
#include "host/ObjectRegistry.h"

namespace nrv::host {
namespace {

constexpr int kThreads = 6;
constexpr int kRounds = 40;

PathData path(const std::string& text) { return std::get<PathData>(parsePath(text, "root/test")); }

TEST(HostThreadsTest, ParallelClientsGetCompleteAnswers) {
  Host host(test::testProvider(), Host::Options{test::platformFile()});
  // Every MI is made before the clients run: the standard's MI stubs store the broker in the
  // library's global on each factory call, which would race with a call already running.
  ASSERT_TRUE(host.invokeMethod(path("TST_Widget.InstanceID=\"W1\""), "SpawnThread").ok());
  ASSERT_TRUE(host.associators(path("TST_Gadget.Tag=\"G1\"")).ok());
  ASSERT_TRUE(host.enumerateInstanceNames("root/test", "TST_Gadget").ok());
  ASSERT_TRUE(host.enumerateInstances("root/test", "TST_Widget").ok());
  std::atomic<int> bad{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&, t] {
      for (int i = 0; i < kRounds; ++i) {
        switch ((t + i) % 5) {
          case 0: {
            Result r = host.enumerateInstances("root/test", "TST_Widget");
            if (!r.ok() || r.instances.size() != 3) ++bad;
            break;
          }
          case 1: {
            Result r = host.enumerateInstanceNames("root/test", "TST_Gadget");
            if (!r.ok() || r.paths.size() != 2) ++bad;
            break;
          }
          case 2: {
            Result r = host.associators(path("TST_Gadget.Tag=\"G1\""));
            if (!r.ok() || r.instances.size() != 2) ++bad;
            break;
          }
          case 3: {
            Result r = host.invokeMethod(path("TST_Widget.InstanceID=\"W1\""), "SpawnThread");
            if (!r.ok() || r.returnValue.scalar.uint32 != 1) ++bad;
            break;
          }
          default: {
            Result r = host.getInstance(path("TST_Widget.InstanceID=\"W2\""));
            if (!r.ok() || r.instances.size() != 1) ++bad;
            break;
          }
        }
      }
    });
  }
  for (auto& th : threads) th.join();
  EXPECT_EQ(bad.load(), 0);
  EXPECT_EQ(ObjectRegistry::instance().liveCount(host.broker()), 0u);
}

TEST(HostThreadsTest, ShutdownWaitsForCallsInFlight) {
  Host host(test::testProvider(), Host::Options{test::platformFile()});
  std::atomic<int> okCalls{0}, refused{0}, wrong{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&] {
      // Every client keeps calling until the host refuses it.
      for (;;) {
        Result r = host.enumerateInstances("root/test", "TST_Widget");
        if (r.ok() && r.instances.size() == 3) {
          ++okCalls;
        } else if (r.rc == CMPI_RC_ERR_FAILED && r.message == "host is shut down") {
          ++refused;
          return;
        } else {
          ++wrong;
        }
      }
    });
  }
  while (okCalls.load() < kThreads) std::this_thread::yield();
  host.shutdown();
  for (auto& th : threads) th.join();
  EXPECT_EQ(wrong.load(), 0);
  EXPECT_EQ(refused.load(), kThreads);
  EXPECT_EQ(host.cleanupRecords().size(), 1u);
}

}  // namespace
}  // namespace nrv::host
