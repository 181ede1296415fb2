// ObjectRegistry: live-handle table, thread arenas and their release.
#include "host/ObjectRegistry.h"

namespace nrv::host {

namespace {

thread_local Arena* tCurrentArena = nullptr;

// The calling thread's last few look-ups, good while no object has been removed since: a
// provider that fills an instance with arrays goes back and forth between a handful of
// objects.
struct RecentLookups {
  static constexpr std::size_t kSize = 4;
  struct Entry {
    const void* handle = nullptr;
    EncObject* object = nullptr;
  };
  Entry entries[kSize];
  std::size_t next = 0;
  std::uint64_t removals = 0;

  EncObject* find(const void* handle, std::uint64_t now) {
    if (removals != now) {
      *this = RecentLookups{};
      removals = now;
      return nullptr;
    }
    for (const Entry& e : entries)
      if (e.handle == handle) return e.object;
    return nullptr;
  }
  void remember(const void* handle, EncObject* object, std::uint64_t now) {
    if (removals != now) *this = RecentLookups{};
    removals = now;
    entries[next] = {handle, object};
    next = (next + 1) % kSize;
  }
};
thread_local RecentLookups tRecent;

// Arenas pushed by attachThread, with the arena each one displaced.
struct AttachedArena {
  std::unique_ptr<Arena> arena;
  Arena* previous;
};
thread_local std::vector<AttachedArena> tAttached;

}  // namespace

Arena::~Arena() { ObjectRegistry::instance().freeArena(this); }

ObjectRegistry& ObjectRegistry::instance() {
  // Never destroyed: objects may still be released by module code during process exit.
  static ObjectRegistry* registry = new ObjectRegistry();
  return *registry;
}

Arena* ObjectRegistry::currentArena() { return tCurrentArena; }

void ObjectRegistry::add(std::unique_ptr<EncObject> object, bool detached) {
  Arena* arena = detached ? nullptr : tCurrentArena;
  object->arena_ = arena;
  const void* handle = object->handle();
  EncObject* raw = object.get();
  std::lock_guard<std::mutex> lock(mu_);
  if (arena != nullptr) arena->handles_.push_back(handle);
  live_[handle] = std::move(object);
  // A new object is about to be used by the thread that made it.
  tRecent.remember(handle, raw, removals_.load(std::memory_order_relaxed));
}

EncObject* ObjectRegistry::lookup(const void* handle) {
  if (handle == nullptr) return nullptr;
  if (EncObject* o = tRecent.find(handle, removals_.load(std::memory_order_acquire))) return o;
  std::lock_guard<std::mutex> lock(mu_);
  auto it = live_.find(handle);
  if (it == live_.end()) return nullptr;
  tRecent.remember(handle, it->second.get(), removals_.load(std::memory_order_relaxed));
  return it->second.get();
}

bool ObjectRegistry::contains(const void* handle) { return lookup(handle) != nullptr; }

bool ObjectRegistry::release(const void* handle) {
  std::unique_ptr<EncObject> doomed;
  {
    std::lock_guard<std::mutex> lock(mu_);
    auto it = live_.find(handle);
    if (it == live_.end()) return false;
    doomed = std::move(it->second);
    live_.erase(it);
    removals_.fetch_add(1, std::memory_order_release);
  }
  // Destroyed outside the lock: an object may own further registry objects.
  return true;
}

void ObjectRegistry::freeArena(Arena* arena) {
  std::vector<std::unique_ptr<EncObject>> doomed;
  {
    std::lock_guard<std::mutex> lock(mu_);
    for (const void* handle : arena->handles_) {
      auto it = live_.find(handle);
      // The address may have been released and reused by an object of another arena.
      if (it != live_.end() && it->second->arena_ == arena) {
        doomed.push_back(std::move(it->second));
        live_.erase(it);
      }
    }
    arena->handles_.clear();
    if (!doomed.empty()) removals_.fetch_add(1, std::memory_order_release);
  }
}

void ObjectRegistry::freeOwner(const void* owner) {
  std::vector<std::unique_ptr<EncObject>> doomed;
  {
    std::lock_guard<std::mutex> lock(mu_);
    for (auto it = live_.begin(); it != live_.end();) {
      if (it->second->owner_ == owner) {
        doomed.push_back(std::move(it->second));
        it = live_.erase(it);
      } else {
        ++it;
      }
    }
    if (!doomed.empty()) removals_.fetch_add(1, std::memory_order_release);
  }
}

std::size_t ObjectRegistry::liveCount() {
  std::lock_guard<std::mutex> lock(mu_);
  return live_.size();
}

std::size_t ObjectRegistry::liveCount(const void* owner) {
  std::lock_guard<std::mutex> lock(mu_);
  std::size_t n = 0;
  for (const auto& [handle, object] : live_) n += object->owner_ == owner ? 1 : 0;
  return n;
}

ArenaScope::ArenaScope() : previous_(tCurrentArena) { tCurrentArena = &arena_; }

ArenaScope::~ArenaScope() { tCurrentArena = previous_; }

void attachThreadArena() {
  AttachedArena entry{std::make_unique<Arena>(), tCurrentArena};
  tCurrentArena = entry.arena.get();
  tAttached.push_back(std::move(entry));
}

bool detachThreadArena() {
  if (tAttached.empty()) return false;
  AttachedArena entry = std::move(tAttached.back());
  tAttached.pop_back();
  tCurrentArena = entry.previous;
  return true;  // entry.arena frees its objects here
}

}  // namespace nrv::host
