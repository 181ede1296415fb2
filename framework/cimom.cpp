#include "framework/cimom.h"

namespace cimple {
namespace cimom {

Instance* get_instance(const char* name_space, const Instance* model) {
  Thread_Context* context = Thread_Context::top();
  return context ? context->get_instance(name_space, model) : nullptr;
}

std::unique_ptr<Instance_Cursor> enum_instances(const char* name_space, const Instance* model) {
  Thread_Context* context = Thread_Context::top();
  return context ? context->enum_instances(name_space, model) : nullptr;
}

int create_instance(const char* name_space, const Instance* instance) {
  Thread_Context* context = Thread_Context::top();
  return context ? context->create_instance(name_space, instance) : -1;
}

int modify_instance(const char* name_space, const Instance* instance) {
  Thread_Context* context = Thread_Context::top();
  return context ? context->modify_instance(name_space, instance) : -1;
}

int delete_instance(const char* name_space, const Instance* instance) {
  Thread_Context* context = Thread_Context::top();
  return context ? context->delete_instance(name_space, instance) : -1;
}

bool get_username(std::string& user) {
  Thread_Context* context = Thread_Context::top();
  return context ? context->get_username(user) : false;
}

void allow_unload(bool flag) {
  if (Thread_Context* context = Thread_Context::top()) context->allow_unload(flag);
}

}  // namespace cimom
}  // namespace cimple
