// cimple::Thread: starts threads that carry the starting thread's object
// manager context, so that code running on them (the agent's data-fetch
// thread) can make up-calls.  The new thread attaches to the broker before
// its function runs and detaches after it returns.
//
// Contract: the function must leave the context stack as it found it.  A
// joinable thread must be joined exactly once; the Thread object does not
// join on destruction.
#pragma once

#include <pthread.h>

namespace cimple {

using Thread_Proc = void* (*)(void* arg);

class Thread {
 public:
  Thread() = default;
  Thread(const Thread&) = delete;
  Thread& operator=(const Thread&) = delete;

  // Answer 0, or the creation error (nothing is left behind then).
  static int create_joinable(Thread& thread, Thread_Proc proc, void* arg);
  static int create_detached(Thread_Proc proc, void* arg);
  // Waits for a joinable thread; answers 0 and its return value, or an error.
  static int join(Thread& thread, void*& value);

  bool joinable() const { return started_; }

 private:
  static int start(pthread_t* id, bool detached, Thread_Proc proc, void* arg);

  pthread_t id_{};
  bool started_ = false;
};

}  // namespace cimple
