// Provider_Base, the do-nothing provider every provider class derives from,
// and provider_proc<P>, the one procedure that turns operation codes into
// calls on a provider class P.  A provider overrides (hides) only the
// operations it implements; the rest answer their UNSUPPORTED code.
#pragma once

#include <exception>
#include <span>

#include "framework/Provider.h"

namespace cimple {

// One extrinsic method of a provider: its CIM name and the member that
// serves it, given the target object and the method-call record (whose
// slots are the method's parameters, return_value last).
template <class P>
struct Method_Entry {
  const char* name;
  int (P::*serve)(const Instance* self, Instance* call);
};

class Provider_Base {
 public:
  int load() { return LOAD_OK; }
  int unload() { return UNLOAD_OK; }
  int get_instance(const Instance*, Instance*&) { return GET_INSTANCE_UNSUPPORTED; }
  int enum_instances(const Instance*, const Handler&) { return ENUM_INSTANCES_OK; }
  int create_instance(Instance*) { return CREATE_INSTANCE_UNSUPPORTED; }
  int delete_instance(const Instance*) { return DELETE_INSTANCE_UNSUPPORTED; }
  int modify_instance(const Instance*, const Instance*) { return MODIFY_INSTANCE_UNSUPPORTED; }
  int enum_associator_names(const Instance*, const char*, const char*, const char*, const Handler&) {
    return ENUM_ASSOCIATOR_NAMES_UNSUPPORTED;
  }
  int enum_references(const Instance*, const Instance*, const char*, const Handler&) {
    return ENUM_REFERENCES_UNSUPPORTED;
  }
  int enum_associators(const Instance*, const char*, const char*, const char*, const Handler&) {
    return ENUM_ASSOCIATORS_UNSUPPORTED;
  }
  // Providers with extrinsic methods define their own `methods()`.
  static std::span<const Method_Entry<Provider_Base>> methods() { return {}; }
};

namespace detail {

template <class P>
int invoke_method(P* provider, const Instance* self, Instance* call) {
  if (call == nullptr || call->meta_class == nullptr) return -1;
  const char* name = call->meta_class->name;
  for (const auto& entry : P::methods())
    if (equal_nocase(entry.name, name)) return (static_cast<P*>(provider)->*entry.serve)(self, call);
  return -1;
}

// Association operations: UNSUPPORTED goes back at once, anything else is
// followed by the closing handler call.
inline int close_association(int result, int unsupported, const Handler& handler) {
  if (result == unsupported) return result;
  handler(nullptr, result);
  return result;
}

inline Handler handler_of(void* proc, void* data) { return Handler{reinterpret_cast<Handler_Proc>(proc), data}; }

// Runs one enumerating operation of a provider: a provider that throws
// answers -1, so the closing handler call that follows still happens and the
// handler's owner learns the enumeration failed.
template <class Work>
int guarded(Work&& work) noexcept {
  try {
    return work();
  } catch (...) {
    return -1;
  }
}

template <class P>
int dispatch(const Provider_Registration* registration, int operation, void* a0, void* a1, void* a2, void* a3,
             void* a4, void* a5, void* a6) {
  P* provider = static_cast<P*>(a0);
  const bool association = (registration->meta_class->flags & FLAG_ASSOCIATION) != 0;
  const auto* instance = static_cast<const Instance*>(a1);
  switch (operation) {
    case OPERATION_GET_META_CLASS:
      *static_cast<const Meta_Class**>(a0) = registration->meta_class;
      return 0;
    case OPERATION_CREATE_PROVIDER:
      *static_cast<P**>(a0) = new P;
      return 0;
    case OPERATION_DESTROY_PROVIDER:
      delete provider;
      return 0;
    case OPERATION_LOAD:
      return provider->load();
    case OPERATION_UNLOAD:
      return provider->unload();
    case OPERATION_GET_INSTANCE:
      return provider->get_instance(instance, *static_cast<Instance**>(a2));
    case OPERATION_ENUM_INSTANCES: {
      Handler handler = handler_of(a2, a3);
      int result = guarded([&] { return provider->enum_instances(instance, handler); });
      handler(nullptr, result);
      return result;
    }
    case OPERATION_CREATE_INSTANCE:
      return provider->create_instance(static_cast<Instance*>(a1));
    case OPERATION_DELETE_INSTANCE:
      return provider->delete_instance(instance);
    case OPERATION_MODIFY_INSTANCE:
      return provider->modify_instance(instance, static_cast<const Instance*>(a2));
    case OPERATION_INVOKE_METHOD:
      return invoke_method(provider, instance, static_cast<Instance*>(a2));
    case OPERATION_GET_REPOSITORY:
      *static_cast<const Meta_Repository**>(a0) = registration->meta_class->meta_repository;
      return 0;
    case OPERATION_ENUM_ASSOCIATOR_NAMES:
      if (!association) return -1;
      return close_association(guarded([&] {
                                 return provider->enum_associator_names(
                                     instance, static_cast<const char*>(a2), static_cast<const char*>(a3),
                                     static_cast<const char*>(a4), handler_of(a5, a6));
                               }),
                               ENUM_ASSOCIATOR_NAMES_UNSUPPORTED, handler_of(a5, a6));
    case OPERATION_ENUM_REFERENCES:
      if (!association) return -1;
      return close_association(guarded([&] {
                                 return provider->enum_references(instance, static_cast<const Instance*>(a2),
                                                                  static_cast<const char*>(a3), handler_of(a4, a5));
                               }),
                               ENUM_REFERENCES_UNSUPPORTED, handler_of(a4, a5));
    case OPERATION_ENUM_ASSOCIATORS:
      if (!association) return -1;
      return close_association(guarded([&] {
                                 return provider->enum_associators(
                                     instance, static_cast<const char*>(a2), static_cast<const char*>(a3),
                                     static_cast<const char*>(a4), handler_of(a5, a6));
                               }),
                               ENUM_ASSOCIATORS_UNSUPPORTED, handler_of(a5, a6));
    default:  // indications and unknown codes
      return -1;
  }
}

}  // namespace detail

// The provider procedure of provider class P.  Never lets an exception
// escape into the CIMOM: a provider that throws answers -1.
template <class P>
int provider_proc(const Provider_Registration* registration, int operation, void* a0, void* a1, void* a2, void* a3,
                  void* a4, void* a5, void* a6, void*) {
  if (registration == nullptr) return -1;
  try {
    return detail::dispatch<P>(registration, operation, a0, a1, a2, a3, a4, a5, a6);
  } catch (const std::exception&) {
    return -1;
  } catch (...) {
    return -1;
  }
}

}  // namespace cimple
