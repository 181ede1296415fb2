// ObjectRegistry: the process-wide table of every live CMPI encapsulated object the host has
// handed out, and the arenas that free a request's objects when the request ends.
//
// Contract: a CMPI handle is only ever dereferenced after the registry has found it, so a
// released, foreign or null handle is refused instead of crashing. Objects belong to the
// registry; an object is freed by its release(), by the end of the arena it was created in,
// or, when created outside any arena (clones, prepared thread contexts), by freeOwner() of the
// broker that made it. Arenas are per thread and strictly nested (ArenaScope).
#ifndef NRV_HOST_OBJECTREGISTRY_H
#define NRV_HOST_OBJECTREGISTRY_H

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <mutex>
#include <unordered_map>
#include <vector>

namespace nrv::host {

enum class EncKind { String, Array, DateTime, ObjectPath, Instance, Args, Context, Enumeration,
                     Result, SelectExp, Error, Memory };

class Arena;

// Base of every encapsulated object; the derived class embeds the CMPI struct and reports
// its address as the handle MIs see.
class EncObject {
 public:
  EncObject(const EncObject&) = delete;
  EncObject& operator=(const EncObject&) = delete;
  virtual ~EncObject() = default;

  virtual EncKind kind() const = 0;
  virtual const void* handle() const = 0;

  const void* owner() const { return owner_; }

 protected:
  explicit EncObject(const void* owner) : owner_(owner) {}

 private:
  friend class ObjectRegistry;
  const void* owner_;
  Arena* arena_ = nullptr;
};

// A set of objects freed together; see ArenaScope.
class Arena {
 public:
  Arena() = default;
  Arena(const Arena&) = delete;
  Arena& operator=(const Arena&) = delete;
  ~Arena();

 private:
  friend class ObjectRegistry;
  std::vector<const void*> handles_;
};

class ObjectRegistry {
 public:
  static ObjectRegistry& instance();

  // Takes ownership; the object joins the calling thread's current arena, unless detached.
  // Returns the object for the caller to use.
  template <typename T>
  T* adopt(std::unique_ptr<T> object, bool detached = false) {
    T* raw = object.get();
    add(std::move(object), detached);
    return raw;
  }

  // The live object behind a handle, if it is of kind T::kKind; else nullptr.
  template <typename T>
  T* find(const void* handle) {
    EncObject* o = lookup(handle);
    return (o != nullptr && o->kind() == T::kKind) ? static_cast<T*>(o) : nullptr;
  }

  // The live object of any kind behind a handle, or nullptr.
  EncObject* findAny(const void* handle) { return lookup(handle); }
  bool contains(const void* handle);
  // Frees the object now; false when the handle is not live.
  bool release(const void* handle);
  // Frees every live object created by this owner (broker shutdown).
  void freeOwner(const void* owner);
  std::size_t liveCount();
  std::size_t liveCount(const void* owner);

  // The calling thread's current arena (nullptr when none).
  static Arena* currentArena();

 private:
  friend class Arena;
  friend class ArenaScope;
  ObjectRegistry() = default;
  void add(std::unique_ptr<EncObject> object, bool detached);
  EncObject* lookup(const void* handle);
  void freeArena(Arena* arena);

  // Bumped by every removal: a thread's recent look-ups stay good while it is unchanged, so
  // that the many calls on a few objects (setting each property) need no lock.
  std::atomic<std::uint64_t> removals_{0};
  std::mutex mu_;
  std::unordered_map<const void*, std::unique_ptr<EncObject>> live_;
};

// Makes a fresh arena current for the calling thread for its lifetime; on exit frees every
// object still in it and restores the previous arena.
class ArenaScope {
 public:
  ArenaScope();
  ArenaScope(const ArenaScope&) = delete;
  ArenaScope& operator=(const ArenaScope&) = delete;
  ~ArenaScope();

 private:
  Arena arena_;
  Arena* previous_;
};

// Pushes and pops heap arenas on the calling thread outside of scoped code (broker
// attachThread/detachThread). Returns false on detach when the thread has none attached.
void attachThreadArena();
bool detachThreadArena();

}  // namespace nrv::host

#endif  // NRV_HOST_OBJECTREGISTRY_H
