// Library slots, their opening and closing, and the forwarders' lookup rule.
#include "access/NRV_Runtime_Loader.h"

#include <dlfcn.h>

#include <atomic>
#include <cstring>
#include <mutex>

#include "access/NRV_ForwarderResolver.h"
#include "logging/Log.h"

namespace cimple {
namespace loader_detail {

// Indexed by slot (0..3); index 4 is the pseudo-slot of DOZER_CloseAdapter.
std::atomic<int> g_unavailable[5] = {0, 0, 0, 0, 1};

namespace {

std::atomic<void*> g_handles[NRV_Runtime_Loader::kSlotCount];
// Bumped on every unload so that a lookup racing an unload drops its result.
std::atomic<unsigned> g_generation{0};
// Serialises load and unload; forwarders never take it.
std::mutex g_slotMutex;
std::string g_fileNames[NRV_Runtime_Loader::kSlotCount];

void* lookup(int slot, const char* name, const void* self) {
  // An empty slot passes a null handle: the process-wide default scope.
  void* p = dlsym(g_handles[slot].load(std::memory_order_acquire), name);
  // Only a library may answer; a forwarder visible in the default scope would
  // otherwise call itself forever.
  return p == self ? nullptr : p;
}

void store(Forwarder& f, void* p, unsigned generation) {
  f.cache.store(p, std::memory_order_release);
  if (g_generation.load(std::memory_order_acquire) != generation) {
    void* expected = p;
    f.cache.compare_exchange_strong(expected, nullptr, std::memory_order_acq_rel);
  }
}

}  // namespace

void* resolve(Forwarder& f, const void* self) noexcept {
  const unsigned generation = g_generation.load(std::memory_order_acquire);
  if (!primaryUnavailable(f.primary)) {
    void* p = lookup(f.primary, f.firstName, self);
    store(f, p, generation);
    return p;
  }
  if (g_unavailable[NRV_Runtime_Loader::kRmApiSlot].load(std::memory_order_relaxed)) return nullptr;
  // Fallback: the cache is written but never consulted on this path.
  void* p = lookup(NRV_Runtime_Loader::kRmApiSlot, f.firstName, self);
  store(f, p, generation);
  if (p) return p;
  p = lookup(NRV_Runtime_Loader::kRmApiSlot, f.secondName, self);
  store(f, p, generation);
  return p;
}

}  // namespace loader_detail

using namespace loader_detail;

std::string NRV_Runtime_Loader::libraryFileName(const char* baseName) {
  std::string name = "lib";
  name += baseName;
  if (std::strncmp(baseName, "HBA", 3) != 0) name += ".so";
  return name;
}

int NRV_Runtime_Loader::loadLibrary(int slot, const char* baseName) {
  if (slot < 0 || slot >= kSlotCount || baseName == nullptr) return 0;
  std::lock_guard<std::mutex> lock(g_slotMutex);
  if (g_handles[slot].load(std::memory_order_acquire) != nullptr) return 1;
  const std::string fileName = libraryFileName(baseName);
  void* h = dlopen(fileName.c_str(), RTLD_NOW);
  if (h == nullptr) {
    const char* why = dlerror();
    NRV_LOG(NRV_ERR, "dlopen failed :%s", why ? why : "");
    return 0;
  }
  g_fileNames[slot] = fileName;
  g_handles[slot].store(h, std::memory_order_release);
  return 1;
}

int NRV_Runtime_Loader::loadLibraries() {
  if (!loadLibrary(kHbaApiSlot, "HBAAPI.so.2") && !loadLibrary(kHbaApiSlot, "HBAAPI.so"))
    g_unavailable[kHbaApiSlot].store(1, std::memory_order_relaxed);
  if (loadLibrary(kLrmApiSlot, "lrmapi")) return 0;
  g_unavailable[kLrmApiSlot].store(1, std::memory_order_relaxed);
  if (loadLibrary(kRmApiSlot, "rmapi")) return 0;
  g_unavailable[kRmApiSlot].store(1, std::memory_order_relaxed);
  return 1;
}

int NRV_Runtime_Loader::unloadLibraries() {
  std::lock_guard<std::mutex> lock(g_slotMutex);
  // Forget every resolved pointer before the code behind it goes away.
  g_generation.fetch_add(1, std::memory_order_acq_rel);
  Forwarder* all = forwarders();
  for (int i = 0, n = forwarderCount(); i < n; ++i)
    all[i].cache.store(nullptr, std::memory_order_release);
  for (int slot = 0; slot < kSlotCount; ++slot) {
    void* h = g_handles[slot].exchange(nullptr, std::memory_order_acq_rel);
    if (h != nullptr && dlclose(h) != 0) {
      const char* why = dlerror();
      NRV_LOG(NRV_ERR, "dlclose for lib %s failed with %s\n", g_fileNames[slot].c_str(),
              why ? why : "");
    }
    g_fileNames[slot].clear();
  }
  return 0;
}

void* NRV_Runtime_Loader::handle(int slot) {
  if (slot < 0 || slot >= kSlotCount) return nullptr;
  return g_handles[slot].load(std::memory_order_acquire);
}

std::string NRV_Runtime_Loader::fileName(int slot) {
  if (slot < 0 || slot >= kSlotCount) return {};
  std::lock_guard<std::mutex> lock(g_slotMutex);
  return g_fileNames[slot];
}

bool NRV_Runtime_Loader::isUnavailable(int slot) {
  if (slot < 0 || slot >= kSlotCount) return true;
  return g_unavailable[slot].load(std::memory_order_relaxed) != 0;
}

}  // namespace cimple
