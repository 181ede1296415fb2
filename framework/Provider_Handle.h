// Provider_Handle: the adapter's view of one provider (registration,
// procedure, provider object).  It passes operations through and supplies the
// generic fallbacks that let a provider implement only enum_instances: get
// instance by enumeration and key comparison, and references and associator
// names by enumerating the association.
//
// The handle does not own the provider object: create_provider() makes it and
// destroy_provider() deletes it; the caller brackets the handle's use with them.
#pragma once

#include <array>

#include "framework/Provider.h"

namespace cimple {

class Provider_Handle {
 public:
  explicit Provider_Handle(const Provider_Registration* registration)
      : registration_(registration), proc_(registration->proc) {}
  Provider_Handle(const Provider_Handle&) = delete;
  Provider_Handle& operator=(const Provider_Handle&) = delete;

  const Provider_Registration* registration() const { return registration_; }
  void* provider() const { return provider_; }

  int create_provider() { return call(OPERATION_CREATE_PROVIDER, &provider_); }
  int destroy_provider();
  int load() { return call(OPERATION_LOAD, provider_); }
  int unload() { return call(OPERATION_UNLOAD, provider_); }
  const Meta_Class* meta_class() const;
  const Meta_Repository* repository() const;

  // Operation 5, falling back on enumeration and key_eq when unsupported.
  int get_instance(const Instance* model, Instance*& instance);
  int enum_instances(const Instance* model, Handler_Proc proc, void* data);
  int create_instance(Instance* instance) { return call(OPERATION_CREATE_INSTANCE, provider_, instance); }
  int delete_instance(const Instance* instance) { return call(OPERATION_DELETE_INSTANCE, provider_, instance); }
  int modify_instance(const Instance* model, const Instance* instance) {
    return call(OPERATION_MODIFY_INSTANCE, provider_, model, instance);
  }
  int invoke_method(const Instance* target, Instance* call_record) {
    return call(OPERATION_INVOKE_METHOD, provider_, target, call_record);
  }
  int enable_indications(void* callback, void* data) {
    return call(OPERATION_ENABLE_INDICATIONS, provider_, callback, data);
  }
  int disable_indications() { return call(OPERATION_DISABLE_INDICATIONS, provider_); }

  // Association operations (null strings mean "not given").
  int enum_references(const Instance* instance, const Instance* model, const char* role, Handler_Proc proc,
                      void* data);
  int enum_associator_names(const Instance* instance, const char* result_class, const char* role,
                            const char* result_role, Handler_Proc proc, void* data);
  int enum_associators(const Instance* instance, const char* result_class, const char* role,
                       const char* result_role, Handler_Proc proc, void* data);

 private:
  template <class... Args>
  int call(int operation, Args... args) const;

  const Provider_Registration* registration_;
  Provider_Proc proc_;
  void* provider_ = nullptr;
};

// Packs up to eight operation arguments into the procedure's void* slots.
template <class... Args>
int Provider_Handle::call(int operation, Args... args) const {
  static_assert(sizeof...(Args) <= 8, "the procedure takes eight arguments at most");
  std::array<void*, 8> slots{};
  size_t i = 0;
  ((slots[i++] = const_cast<void*>(reinterpret_cast<const void*>(args))), ...);
  return proc_(registration_, operation, slots[0], slots[1], slots[2], slots[3], slots[4], slots[5], slots[6],
               slots[7]);
}

}  // namespace cimple
