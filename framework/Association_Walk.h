// How one association instance answers a references or associators request
// about a source object: whether it refers to the source, and which of its
// ends are the far ends.  The generic fallbacks and the providers that answer
// from an index share these rules, so both give the same answers.
//
// Contract: pure functions of their arguments; nothing is kept or owned.
#pragma once

#include <vector>

#include "framework/Instance.h"

namespace cimple {

// True when `s` names something ("" and null mean "not given").
inline bool name_given(const char* s) { return s != nullptr && *s != '\0'; }

// Calls `visit` with each single, not embedded reference of an association
// class, in declaration order, until it answers false.
template <class Visit>
void for_each_single_reference(const Meta_Class* mc, Visit&& visit) {
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (!(mf->flags & FLAG_REFERENCE) || is_embedded(mf)) continue;
    auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
    if (!is_reference_array(mr) && !visit(mr)) return;
  }
}

// True when `mr` of `association` points at `source`: its declared class is
// the source's class or an ancestor, and its target is key_eq to the source.
bool refers_to(const Instance* association, const Meta_Reference* mr, const Instance* source);

// False when no instance of `association` can refer to an object of class
// `source` (no single reference declares the class or an ancestor of it):
// a request from such an object has an empty answer.
bool may_refer_to(const Meta_Class* association, const Meta_Class* source);

// References: true when a single reference of `association` (named `role`,
// when given) refers to `source`.
bool references_source(const Instance* association, const Instance* source, const char* role);

// Associators: the far ends of `association` seen from `source`, filtered by
// result class and result role, in declaration order; empty when no end
// (named `role`, when given) is the source.
std::vector<const Meta_Reference*> far_ends(const Instance* association, const Instance* source,
                                            const char* result_class, const char* role, const char* result_role);

}  // namespace cimple
