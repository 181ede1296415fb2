#include "framework/Provider_Handle.h"

#include "framework/Association_Walk.h"

namespace cimple {

namespace {

// Handler state of the get-instance fallback.
struct Get_Instance_Search {
  const Instance* model;
  Instance* found = nullptr;
};

bool find_matching(Instance* instance, int, void* data) {
  auto* search = static_cast<Get_Instance_Search*>(data);
  if (instance == nullptr) return false;  // closing call
  if (search->found == nullptr && key_eq(instance, search->model)) {
    search->found = instance;
    return false;
  }
  unref(instance);
  return true;
}

struct References_Walk {
  const Instance* source;
  const char* role;
  Handler_Proc proc;
  void* data;
};

bool pass_references(Instance* association, int, void* data) {
  auto* walk = static_cast<References_Walk*>(data);
  if (association == nullptr) return false;
  if (references_source(association, walk->source, walk->role)) return walk->proc(association, 0, walk->data);
  unref(association);
  return true;
}

struct Associator_Walk {
  const Instance* source;
  const char* result_class;
  const char* role;
  const char* result_role;
  Handler_Proc proc;
  void* data;
};

bool pass_associators(Instance* association, int, void* data) {
  auto* walk = static_cast<Associator_Walk*>(data);
  if (association == nullptr) return false;
  bool go_on = true;
  for (const Meta_Reference* mr :
       far_ends(association, walk->source, walk->result_class, walk->role, walk->result_role)) {
    Instance* far_end = reference_of(association, mr);
    ref(far_end);
    if (!(go_on = walk->proc(far_end, 0, walk->data))) break;
  }
  unref(association);
  return go_on;
}

// The result of a fallback from the enumeration it ran: only a successful
// enumeration succeeds (a provider that threw answered -1).
int map_enumeration(int result, int failed, int access_denied) {
  if (result == ENUM_INSTANCES_OK) return 0;
  return result == ENUM_INSTANCES_ACCESS_DENIED ? access_denied : failed;
}

}  // namespace

int Provider_Handle::destroy_provider() {
  int result = call(OPERATION_DESTROY_PROVIDER, provider_);
  provider_ = nullptr;
  return result;
}

const Meta_Class* Provider_Handle::meta_class() const {
  const Meta_Class* mc = nullptr;
  call(OPERATION_GET_META_CLASS, &mc);
  return mc;
}

const Meta_Repository* Provider_Handle::repository() const {
  const Meta_Repository* repository = nullptr;
  call(OPERATION_GET_REPOSITORY, &repository);
  return repository;
}

int Provider_Handle::enum_instances(const Instance* model, Handler_Proc proc, void* data) {
  return call(OPERATION_ENUM_INSTANCES, provider_, model, proc, data);
}

int Provider_Handle::get_instance(const Instance* model, Instance*& instance) {
  int result = call(OPERATION_GET_INSTANCE, provider_, model, &instance);
  if (result != GET_INSTANCE_UNSUPPORTED) return result;
  Get_Instance_Search search{model};
  result = map_enumeration(enum_instances(model, find_matching, &search), GET_INSTANCE_FAILED,
                           GET_INSTANCE_ACCESS_DENIED);
  if (result != 0 || search.found == nullptr) {
    unref(search.found);
    return result != 0 ? result : GET_INSTANCE_NOT_FOUND;
  }
  instance = search.found;
  return GET_INSTANCE_OK;
}

int Provider_Handle::enum_references(const Instance* instance, const Instance* model, const char* role,
                                     Handler_Proc proc, void* data) {
  const Meta_Class* mc = meta_class();
  if (mc == nullptr || !(mc->flags & FLAG_ASSOCIATION)) return ENUM_REFERENCES_FAILED;
  int result = call(OPERATION_ENUM_REFERENCES, provider_, instance, model, role, proc, data);
  if (result != ENUM_REFERENCES_UNSUPPORTED) return result;
  References_Walk walk{instance, role, proc, data};
  result = map_enumeration(enum_instances(model, pass_references, &walk), ENUM_REFERENCES_FAILED,
                           ENUM_REFERENCES_ACCESS_DENIED);
  proc(nullptr, result, data);
  return result;
}

int Provider_Handle::enum_associator_names(const Instance* instance, const char* result_class, const char* role,
                                           const char* result_role, Handler_Proc proc, void* data) {
  const Meta_Class* mc = meta_class();
  if (mc == nullptr || !(mc->flags & FLAG_ASSOCIATION)) return ENUM_ASSOCIATOR_NAMES_FAILED;
  int result = call(OPERATION_ENUM_ASSOCIATOR_NAMES, provider_, instance, result_class, role, result_role, proc,
                    data);
  if (result == ENUM_ASSOCIATOR_NAMES_ACCESS_DENIED) return ENUM_ASSOCIATOR_NAMES_FAILED;
  if (result != ENUM_ASSOCIATOR_NAMES_UNSUPPORTED) return result;
  Instance* model = create(mc, false);
  set_null_flags(model, false, true, 1);
  Associator_Walk walk{instance, result_class, role, result_role, proc, data};
  result = map_enumeration(enum_instances(model, pass_associators, &walk), ENUM_ASSOCIATOR_NAMES_FAILED,
                           ENUM_ASSOCIATOR_NAMES_ACCESS_DENIED);
  unref(model);
  proc(nullptr, result, data);
  return result;
}

int Provider_Handle::enum_associators(const Instance* instance, const char* result_class, const char* role,
                                      const char* result_role, Handler_Proc proc, void* data) {
  return call(OPERATION_ENUM_ASSOCIATORS, provider_, instance, result_class, role, result_role, proc, data);
}

}  // namespace cimple
