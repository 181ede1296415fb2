#include "framework/Thread_Context.h"

#include <pthread.h>

namespace cimple {

namespace {

pthread_key_t _thread_context_key;
pthread_once_t _thread_context_key_once = PTHREAD_ONCE_INIT;

void make_key() { pthread_key_create(&_thread_context_key, nullptr); }

pthread_key_t key() {
  pthread_once(&_thread_context_key_once, make_key);
  return _thread_context_key;
}

}  // namespace

void Thread_Context::push(Thread_Context* context) {
  if (context == nullptr) return;
  context->prev_ = top();
  pthread_setspecific(key(), context);
}

Thread_Context* Thread_Context::pop() {
  Thread_Context* current = top();
  if (current == nullptr) return nullptr;
  pthread_setspecific(key(), current->prev_);
  current->prev_ = nullptr;
  return current;
}

Thread_Context* Thread_Context::top() { return static_cast<Thread_Context*>(pthread_getspecific(key())); }

}  // namespace cimple
