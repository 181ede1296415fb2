// The real module loaded and unloaded again and again in one host process,
// as a CIMOM that unloads idle providers does: each cycle builds the agent,
// serves a catalogue request (a fetch on the agent's thread) and lets the
// agent and the module go.  Under AddressSanitizer the leak check at exit
// sees whatever a cycle left behind (the module is unmapped, so nothing it
// still points to is reachable); in a plain build the resident size must not
// grow.
#include <dlfcn.h>
#include <unistd.h>

#include <cstdlib>
#include <fstream>
#include <string>

#include <gtest/gtest.h>

#include "host/Host.h"

namespace {

long resident_kib() {
  long pages = 0, resident = 0;
  std::ifstream("/proc/self/statm") >> pages >> resident;
  return resident * (::sysconf(_SC_PAGESIZE) / 1024);
}

void load_serve_unload(const std::string& module) {
  nrv::host::Host host(module);
  ASSERT_TRUE(host.moduleLoaded()) << host.loadError();
  const nrv::host::Result settings = host.enumerateInstances("root/norvane", "NRVTAVO_ProviderConfigSetting");
  ASSERT_TRUE(settings.ok()) << settings.errorText();
  ASSERT_EQ(3u, settings.instances.size());
  host.shutdown();
}

TEST(ModuleCycles, ThreeHundredLoadsAndUnloadsLeaveNothingBehind) {
  const char* module = std::getenv("NRV_MODULE");
  ASSERT_NE(module, nullptr);
  ASSERT_NE(std::getenv("NRV_HOST_UNLOAD_MODULE"), nullptr) << "the host would keep the module mapped";
  constexpr int kWarmUp = 30, kCycles = 300;
  for (int i = 0; i < kWarmUp; ++i) ASSERT_NO_FATAL_FAILURE(load_serve_unload(module)) << "cycle " << i;
  const long before = resident_kib();
  for (int i = kWarmUp; i < kCycles; ++i) ASSERT_NO_FATAL_FAILURE(load_serve_unload(module)) << "cycle " << i;
  const long after = resident_kib();
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
  // The sanitizers' shadow of each new mapping and their allocator caches
  // grow with every cycle; their leak check stands in for this measure.
  (void)before;
  (void)after;
#else
  // An agent, its maps or its fetch thread's stack left behind per cycle
  // would be far more.
  EXPECT_LT(after - before, 4 * 1024) << "KiB of resident growth over " << kCycles - kWarmUp << " cycles";
#endif
  EXPECT_EQ(dlopen(module, RTLD_NOW | RTLD_NOLOAD), nullptr) << "the module is still mapped";
}

}  // namespace
