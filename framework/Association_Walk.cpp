#include "framework/Association_Walk.h"

namespace cimple {

namespace {

bool class_named_or_ancestor(const char* name, const Meta_Class* mc) {
  for (const Meta_Class* p = mc; p; p = p->super_meta_class)
    if (equal_nocase(p->name, name)) return true;
  return false;
}

}  // namespace

std::vector<const Meta_Reference*> single_references(const Meta_Class* mc) {
  std::vector<const Meta_Reference*> refs;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (!(mf->flags & FLAG_REFERENCE) || is_embedded(mf)) continue;
    auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
    if (!is_reference_array(mr)) refs.push_back(mr);
  }
  return refs;
}

bool refers_to(const Instance* association, const Meta_Reference* mr, const Instance* source) {
  if (!is_subclass(mr->meta_class, source->meta_class)) return false;
  const Instance* target = reference_of(association, mr);
  return target != nullptr && key_eq(target, source);
}

bool references_source(const Instance* association, const Instance* source, const char* role) {
  for (const Meta_Reference* mr : single_references(association->meta_class)) {
    if (name_given(role) && !equal_nocase(mr->name, role)) continue;
    if (refers_to(association, mr, source)) return true;
  }
  return false;
}

std::vector<const Meta_Reference*> far_ends(const Instance* association, const Instance* source,
                                            const char* result_class, const char* role, const char* result_role) {
  bool has_source = false;
  std::vector<const Meta_Reference*> ends;
  for (const Meta_Reference* mr : single_references(association->meta_class)) {
    if (!has_source && refers_to(association, mr, source)) {
      // An end that is the source under another role is neither end.
      has_source = !name_given(role) || equal_nocase(mr->name, role);
      continue;
    }
    const Instance* target = reference_of(association, mr);
    if (target == nullptr) continue;
    if (name_given(result_class) && !class_named_or_ancestor(result_class, target->meta_class)) continue;
    if (name_given(result_role) && !equal_nocase(mr->name, result_role)) continue;
    ends.push_back(mr);
  }
  if (!has_source) ends.clear();
  return ends;
}

}  // namespace cimple
