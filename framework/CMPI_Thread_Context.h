// cimple::CMPI_Thread_Context: the thread context of a CMPI call (or of a
// thread started during one): the broker, the CIMOM's context and the
// adapter, through which the up-calls of cimple::cimom reach the CIMOM.
//
// Contract: borrows the broker and the CMPI context (the CIMOM keeps them
// alive for the call, or for the attached thread's life).  The context of a
// call also borrows its adapter, which outlives the call.  A context made
// for a thread started during a call holds only what stays valid for the
// module's life (the broker, the static repository, the context the broker
// prepared for that thread): the provider that started the thread may be
// cleaned up while it runs.  Each up-call fails (null or -1) when the name
// space or the model is missing or a conversion fails.
#pragma once

#include "cmpift.h"
#include "framework/Thread_Context.h"

namespace cimple {

class CMPI_Adapter;

class CMPI_Thread_Context : public Thread_Context {
 public:
  // The context of a call to `adapter` (its repository must be known).
  CMPI_Thread_Context(const CMPIBroker* broker, const CMPIContext* context, CMPI_Adapter* adapter);
  // A context of no adapter: a started thread's.
  CMPI_Thread_Context(const CMPIBroker* broker, const CMPIContext* context, const Meta_Repository* repository);

  const CMPIBroker* broker() const { return broker_; }
  const CMPIContext* context() const { return context_; }
  // Null in a started thread's context.
  CMPI_Adapter* adapter() const { return adapter_; }
  const Meta_Repository* repository() const { return repository_; }

  Instance* get_instance(const char* name_space, const Instance* model) override;
  std::unique_ptr<Instance_Cursor> enum_instances(const char* name_space, const Instance* model) override;
  int create_instance(const char* name_space, const Instance* instance) override;
  int modify_instance(const char* name_space, const Instance* instance) override;
  int delete_instance(const char* name_space, const Instance* instance) override;
  bool get_username(std::string& user) override;
  void allow_unload(bool flag) override;

  Thread_Context* new_thread_context() override;
  void thread_attach() override;
  void thread_detach() override;

 private:
  const CMPIBroker* broker_;
  const CMPIContext* context_;
  CMPI_Adapter* adapter_;
  const Meta_Repository* repository_;
};

}  // namespace cimple
