// cimple::Mutex: the recursive mutex that serialises every CMPI call of one
// provider, and Auto_Mutex, its scope guard.  Recursive because a provider
// may re-enter the framework (an up-call, an indication) on the same thread.
#pragma once

#include <mutex>

namespace cimple {

class Mutex {
 public:
  Mutex() = default;
  Mutex(const Mutex&) = delete;
  Mutex& operator=(const Mutex&) = delete;

  void lock() { mutex_.lock(); }
  void unlock() { mutex_.unlock(); }
  bool try_lock() { return mutex_.try_lock(); }

 private:
  std::recursive_mutex mutex_;
};

class Auto_Mutex {
 public:
  explicit Auto_Mutex(Mutex& mutex) : mutex_(mutex) { mutex_.lock(); }
  Auto_Mutex(const Auto_Mutex&) = delete;
  Auto_Mutex& operator=(const Auto_Mutex&) = delete;
  ~Auto_Mutex() { mutex_.unlock(); }

 private:
  Mutex& mutex_;
};

}  // namespace cimple
