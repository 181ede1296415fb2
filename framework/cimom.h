// cimple::cimom: up-calls from provider code to the object manager that is
// driving the current thread (through its Thread_Context): get, enumerate,
// create, modify and delete instances, and the requesting user's name.
//
// Contract: each call fails (null, -1 or false) when the thread has no
// context, when an argument is missing, or when a conversion fails.  Returned
// instances belong to the caller.
#pragma once

#include <memory>
#include <string>

#include "framework/Thread_Context.h"

namespace cimple {
namespace cimom {

Instance* get_instance(const char* name_space, const Instance* model);
// Null on failure; otherwise a cursor over instances of the model's class.
std::unique_ptr<Instance_Cursor> enum_instances(const char* name_space, const Instance* model);
int create_instance(const char* name_space, const Instance* instance);
int modify_instance(const char* name_space, const Instance* instance);
int delete_instance(const char* name_space, const Instance* instance);
bool get_username(std::string& user);
// Asks the adapter of the current call to refuse (false) or accept (true)
// being unloaded at its next non-terminating cleanup; nothing on a thread
// started during a call, which belongs to no adapter.
void allow_unload(bool flag);

}  // namespace cimom
}  // namespace cimple
