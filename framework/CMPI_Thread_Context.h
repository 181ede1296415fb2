// cimple::CMPI_Thread_Context: the thread context of a CMPI call (or of a
// thread started during one): the broker, the CIMOM's context and the
// adapter, through which the up-calls of cimple::cimom reach the CIMOM.
//
// Contract: borrows the broker and the CMPI context (the CIMOM keeps them
// alive for the call, or for the attached thread's life); the adapter must
// outlive the context.  Each up-call fails (null or -1) when the name space
// or the model is missing or a conversion fails.
#pragma once

#include "cmpift.h"
#include "framework/Thread_Context.h"

namespace cimple {

class CMPI_Adapter;

class CMPI_Thread_Context : public Thread_Context {
 public:
  CMPI_Thread_Context(const CMPIBroker* broker, const CMPIContext* context, CMPI_Adapter* adapter);

  const CMPIBroker* broker() const { return broker_; }
  const CMPIContext* context() const { return context_; }
  CMPI_Adapter* adapter() const { return adapter_; }

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
  const Meta_Repository* repository() const;

  const CMPIBroker* broker_;
  const CMPIContext* context_;
  CMPI_Adapter* adapter_;
};

}  // namespace cimple
