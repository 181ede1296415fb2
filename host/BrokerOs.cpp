// BrokerOs: the broker's operating-system encapsulation services (CMPIBrokerExtFT) over POSIX
// threads. Mutexes are recursive, as provider code that nests calls expects.
#include <pthread.h>
#include <time.h>
#include <unistd.h>

#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <new>

#include "host/Broker.h"

namespace nrv::host {

namespace {

static_assert(sizeof(pthread_t) <= sizeof(void*), "thread ids travel as CMPI_THREAD_TYPE");
static_assert(sizeof(pthread_once_t) == sizeof(int), "threadOnce takes an int once-flag");

char* resolveFileName(const char* filename) {
  if (filename == nullptr) return nullptr;
  const size_t n = std::strlen(filename);
  // The caller frees the name with free(), as the standard says.
  char* out = static_cast<char*>(std::malloc(n + 4));
  if (out == nullptr) return nullptr;
  std::memcpy(out, "lib", 3);
  std::memcpy(out + 3, filename, n + 1);
  char* full = static_cast<char*>(std::realloc(out, n + 7));
  if (full == nullptr) {
    std::free(out);
    return nullptr;
  }
  std::memcpy(full + 3 + n, ".so", 4);
  return full;
}

CMPI_THREAD_TYPE newThread(CMPIThreadFunc function, void* parm, int detached) {
  if (function == nullptr) return nullptr;
  pthread_attr_t attr;
  pthread_attr_init(&attr);
  if (detached != 0) pthread_attr_setdetachstate(&attr, PTHREAD_CREATE_DETACHED);
  pthread_t tid{};
  const int err = pthread_create(&tid, &attr, function, parm);
  pthread_attr_destroy(&attr);
  if (err != 0) return nullptr;
  return reinterpret_cast<CMPI_THREAD_TYPE>(static_cast<uintptr_t>(tid));
}

pthread_t tidOf(CMPI_THREAD_TYPE thread) {
  return static_cast<pthread_t>(reinterpret_cast<uintptr_t>(thread));
}

int joinThread(CMPI_THREAD_TYPE thread, CMPI_THREAD_RETURN* retval) {
  return pthread_join(tidOf(thread), retval);
}

int exitThread(CMPI_THREAD_RETURN rc) { pthread_exit(rc); }

int cancelThread(CMPI_THREAD_TYPE thread) { return pthread_cancel(tidOf(thread)); }

int threadSleep(CMPIUint32 msec) {
  timespec ts{static_cast<time_t>(msec / 1000), static_cast<long>(msec % 1000) * 1000000L};
  while (nanosleep(&ts, &ts) != 0) {
  }
  return 0;
}

int threadOnce(int* once, CMPIThreadOnceFunc function) {
  if (once == nullptr || function == nullptr) return EINVAL;
  return pthread_once(reinterpret_cast<pthread_once_t*>(once), function);
}

int createThreadKey(CMPI_THREAD_KEY_TYPE* key, CMPIThreadKeyCleanupFunc cleanup) {
  return key == nullptr ? EINVAL : pthread_key_create(key, cleanup);
}
int destroyThreadKey(CMPI_THREAD_KEY_TYPE key) { return pthread_key_delete(key); }
void* getThreadSpecific(CMPI_THREAD_KEY_TYPE key) { return pthread_getspecific(key); }
int setThreadSpecific(CMPI_THREAD_KEY_TYPE key, void* value) {
  return pthread_setspecific(key, value);
}

CMPI_MUTEX_TYPE newMutex(int) {
  auto* m = new (std::nothrow) pthread_mutex_t;
  if (m == nullptr) return nullptr;
  pthread_mutexattr_t attr;
  pthread_mutexattr_init(&attr);
  pthread_mutexattr_settype(&attr, PTHREAD_MUTEX_RECURSIVE);
  pthread_mutex_init(m, &attr);
  pthread_mutexattr_destroy(&attr);
  return m;
}
void destroyMutex(CMPI_MUTEX_TYPE m) {
  if (m == nullptr) return;
  pthread_mutex_destroy(static_cast<pthread_mutex_t*>(m));
  delete static_cast<pthread_mutex_t*>(m);
}
void lockMutex(CMPI_MUTEX_TYPE m) {
  if (m != nullptr) pthread_mutex_lock(static_cast<pthread_mutex_t*>(m));
}
void unlockMutex(CMPI_MUTEX_TYPE m) {
  if (m != nullptr) pthread_mutex_unlock(static_cast<pthread_mutex_t*>(m));
}

CMPI_COND_TYPE newCondition(int) {
  auto* c = new (std::nothrow) pthread_cond_t;
  if (c != nullptr) pthread_cond_init(c, nullptr);
  return c;
}
void destroyCondition(CMPI_COND_TYPE c) {
  if (c == nullptr) return;
  pthread_cond_destroy(static_cast<pthread_cond_t*>(c));
  delete static_cast<pthread_cond_t*>(c);
}
int condWait(CMPI_COND_TYPE c, CMPI_MUTEX_TYPE m) {
  if (c == nullptr || m == nullptr) return EINVAL;
  return pthread_cond_wait(static_cast<pthread_cond_t*>(c), static_cast<pthread_mutex_t*>(m));
}
int timedCondWait(CMPI_COND_TYPE c, CMPI_MUTEX_TYPE m, struct timespec* wait) {
  if (c == nullptr || m == nullptr || wait == nullptr) return EINVAL;
  return pthread_cond_timedwait(static_cast<pthread_cond_t*>(c),
                                static_cast<pthread_mutex_t*>(m), wait);
}
int signalCondition(CMPI_COND_TYPE c) {
  return c == nullptr ? EINVAL : pthread_cond_signal(static_cast<pthread_cond_t*>(c));
}

}  // namespace

const CMPIBrokerExtFT kBrokerExtFT = {
    CMPIVersion200,    resolveFileName,   newThread,        joinThread,     exitThread,
    cancelThread,      threadSleep,       threadOnce,       createThreadKey, destroyThreadKey,
    getThreadSpecific, setThreadSpecific, newMutex,         destroyMutex,   lockMutex,
    unlockMutex,       newCondition,      destroyCondition, condWait,       timedCondWait,
    signalCondition,
};

}  // namespace nrv::host
