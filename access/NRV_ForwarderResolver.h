// The lookup rule shared by every forwarder: which library slot is asked for
// which symbol name, and the per-forwarder cache of the resolved pointer.
//
// Contract: internal to access/.  A Forwarder record lives in static storage
// for the life of the process; its cache is written by any thread and cleared
// by NRV_Runtime_Loader::unloadLibraries.
#pragma once

#include <atomic>

namespace cimple::loader_detail {

// Primary slot of a forwarder; kNoPrimary marks DOZER_CloseAdapter, whose
// rule is the fallback lookup alone, on every call.
enum PrimarySlot : int { kHbaPrimary = 0, kMgmtPrimary = 1, kQosPrimary = 3, kNoPrimary = 4 };

struct Forwarder {
  int primary;                    // PrimarySlot
  const char* firstName;          // N1
  const char* secondName;         // N2 (same as N1 for single-name functions)
  std::atomic<void*> cache;       // last lookup result (null included)
};

// Unavailability flags by primary slot; entry kNoPrimary is always set.
extern std::atomic<int> g_unavailable[5];

inline bool primaryUnavailable(int primary) noexcept {
  return g_unavailable[primary].load(std::memory_order_relaxed) != 0;
}

// Looks the function up by the full rule and stores the result in the cache;
// null when it is unavailable.  `self` is the calling forwarder, which is never
// accepted as a lookup result.
void* resolve(Forwarder& f, const void* self) noexcept;

// The fast path: one flag test, one cache load; otherwise the full rule.
inline void* target(Forwarder& f, const void* self) noexcept {
  if (!primaryUnavailable(f.primary)) {
    if (void* p = f.cache.load(std::memory_order_acquire)) return p;
  }
  return resolve(f, self);
}

// Every forwarder record, for clearing the caches on unload.
Forwarder* forwarders() noexcept;
int forwarderCount() noexcept;

}  // namespace cimple::loader_detail
