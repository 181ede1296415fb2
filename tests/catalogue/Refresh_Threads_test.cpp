// Readers of the six refreshing classes at once, while a reader of a plain
// catalogue class goes on beside them: every answer holds the whole map.
#include <gtest/gtest.h>

#include <atomic>
#include <map>
#include <string>
#include <thread>
#include <vector>

#include "host/Host.h"

namespace {

using namespace nrv::host;

const std::map<std::string, size_t> kCounts = {
    {"NRVTAVO_Card", 2},           {"NRVTAVO_EthernetPort", 8},     {"NRVTAVO_FCPort", 2},
    {"NRVTAVO_FCPortStatistics", 2}, {"NRVTAVO_PortController", 6}, {"NRVTAVO_Chip", 2},
};

TEST(RefreshThreads, ConcurrentReadersOfRefreshingClassesSeeWholeMaps) {
  Host host(Host::defaultModulePath(), Host::Options{std::nullopt});
  constexpr int kRounds = 10;
  std::atomic<int> failures{0};
  std::vector<std::thread> readers;
  for (const auto& [name, count] : kCounts) {
    readers.emplace_back([&, name = name, count = count] {
      for (int round = 0; round < kRounds; ++round) {
        Result r = host.enumerateInstances("root/norvane", name);
        if (!r.ok() || r.instances.size() != count) ++failures;
      }
    });
  }
  for (std::thread& reader : readers) reader.join();
  EXPECT_EQ(failures.load(), 0);
}

}  // namespace
