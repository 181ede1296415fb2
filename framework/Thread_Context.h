// cimple::Thread_Context: the per-thread stack of contexts through which
// framework code reaches the object manager that called it (up-calls, the
// user name, contexts for threads it starts).  The CMPI adapter pushes one
// for every call; threads started through cimple::Thread inherit one.
//
// Contract: push() does not take ownership; whoever pushes pops and deletes.
// The stack is per thread.  Up-calls fail (null or -1) when there is no
// current context.
#pragma once

#include <memory>
#include <string>

#include "framework/Instance.h"

namespace cimple {

// One enumeration answer of an up-call, converted one element at a time.
// Closing (destroying) it releases everything the object manager handed out.
class Instance_Cursor {
 public:
  virtual ~Instance_Cursor() = default;
  // The next instance (a new reference the caller owns), or null at the end.
  virtual Instance* next() = 0;
};

class Thread_Context {
 public:
  Thread_Context() = default;
  Thread_Context(const Thread_Context&) = delete;
  Thread_Context& operator=(const Thread_Context&) = delete;
  virtual ~Thread_Context() = default;

  static void push(Thread_Context* context);
  // Restores the previous context and answers the popped one (null when the
  // stack is empty).
  static Thread_Context* pop();
  static Thread_Context* top();
  Thread_Context* prev() const { return prev_; }

  // Up-calls; each takes a name space and a model instance.
  virtual Instance* get_instance(const char* name_space, const Instance* model) = 0;
  virtual std::unique_ptr<Instance_Cursor> enum_instances(const char* name_space, const Instance* model) = 0;
  virtual int create_instance(const char* name_space, const Instance* instance) = 0;
  virtual int modify_instance(const char* name_space, const Instance* instance) = 0;
  virtual int delete_instance(const char* name_space, const Instance* instance) = 0;
  virtual bool get_username(std::string& user) = 0;
  // Lets the provider keep its module loaded past the next cleanup.
  virtual void allow_unload(bool flag) = 0;

  // Thread start: made on the starting thread (null: the new thread runs
  // bare), then attached and detached by the new thread around its work.
  virtual Thread_Context* new_thread_context() = 0;
  virtual void thread_attach() = 0;
  virtual void thread_detach() = 0;

 private:
  Thread_Context* prev_ = nullptr;
};

}  // namespace cimple
