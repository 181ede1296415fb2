#include "framework/Association_Walk.h"

namespace cimple {

namespace {

bool class_named_or_ancestor(const char* name, const Meta_Class* mc) {
  for (const Meta_Class* p = mc; p; p = p->super_meta_class)
    if (equal_nocase(p->name, name)) return true;
  return false;
}

}  // namespace

bool may_refer_to(const Meta_Class* association, const Meta_Class* source) {
  bool may = false;
  for_each_single_reference(association, [&](const Meta_Reference* mr) {
    may = is_subclass(mr->meta_class, source);
    return !may;
  });
  return may;
}

bool refers_to(const Instance* association, const Meta_Reference* mr, const Instance* source) {
  if (!is_subclass(mr->meta_class, source->meta_class)) return false;
  const Instance* target = reference_of(association, mr);
  return target != nullptr && key_eq(target, source);
}

bool references_source(const Instance* association, const Instance* source, const char* role) {
  bool found = false;
  for_each_single_reference(association->meta_class, [&](const Meta_Reference* mr) {
    if (!name_given(role) || equal_nocase(mr->name, role)) found = refers_to(association, mr, source);
    return !found;
  });
  return found;
}

std::vector<const Meta_Reference*> far_ends(const Instance* association, const Instance* source,
                                            const char* result_class, const char* role, const char* result_role) {
  bool has_source = false;
  std::vector<const Meta_Reference*> ends;
  for_each_single_reference(association->meta_class, [&](const Meta_Reference* mr) {
    if (!has_source && refers_to(association, mr, source)) {
      // An end that is the source under another role is neither end.
      has_source = !name_given(role) || equal_nocase(mr->name, role);
      return true;
    }
    const Instance* target = reference_of(association, mr);
    if (target == nullptr) return true;
    if (name_given(result_class) && !class_named_or_ancestor(result_class, target->meta_class)) return true;
    if (name_given(result_role) && !equal_nocase(mr->name, result_role)) return true;
    ends.push_back(mr);
    return true;
  });
  if (!has_source) ends.clear();
  return ends;
}

}  // namespace cimple
