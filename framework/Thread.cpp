#include "framework/Thread.h"

#include <cerrno>
#include <memory>

#include "framework/Thread_Context.h"
#include "framework/Trace_File.h"

namespace cimple {

namespace {

struct Thread_Start {
  Thread_Proc proc;
  void* arg;
  Thread_Context* context;  // owned; null runs the function bare
};

void* thread_main(void* data) {
  std::unique_ptr<Thread_Start> start(static_cast<Thread_Start*>(data));
  Thread_Context* context = start->context;
  if (context == nullptr) return start->proc(start->arg);
  Thread_Context::push(context);
  context->thread_attach();
  void* result = start->proc(start->arg);
  context->thread_detach();
  Thread_Context* popped = Thread_Context::pop();
  if (popped != context) {
    // The function broke the stack discipline; unwind to our own context so
    // it is not left dangling in the thread-specific slot.
    CIMPLE_ERR("thread function left %s thread context on the stack", popped ? "a foreign" : "no");
    while (popped != nullptr && popped != context) popped = Thread_Context::pop();
  }
  delete context;
  return result;
}

}  // namespace

int Thread::start(pthread_t* id, bool detached, Thread_Proc proc, void* arg) {
  if (proc == nullptr) return EINVAL;
  Thread_Context* current = Thread_Context::top();
  auto* start = new Thread_Start{proc, arg, current ? current->new_thread_context() : nullptr};
  pthread_attr_t attr;
  pthread_attr_init(&attr);
  pthread_attr_setdetachstate(&attr, detached ? PTHREAD_CREATE_DETACHED : PTHREAD_CREATE_JOINABLE);
  int rc = pthread_create(id, &attr, thread_main, start);
  pthread_attr_destroy(&attr);
  if (rc != 0) {
    delete start->context;
    delete start;
  }
  return rc;
}

int Thread::create_joinable(Thread& thread, Thread_Proc proc, void* arg) {
  if (thread.started_) return EBUSY;
  int rc = start(&thread.id_, false, proc, arg);
  thread.started_ = rc == 0;
  return rc;
}

int Thread::create_detached(Thread_Proc proc, void* arg) {
  pthread_t id;
  return start(&id, true, proc, arg);
}

int Thread::join(Thread& thread, void*& value) {
  if (!thread.started_) return EINVAL;
  int rc = pthread_join(thread.id_, &value);
  if (rc == 0) thread.started_ = false;
  return rc;
}

}  // namespace cimple
