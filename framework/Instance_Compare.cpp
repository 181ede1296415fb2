// Key comparison and the editing operations over whole instances: null
// flags, key-only references and copies.
#include <type_traits>

#include "framework/Instance.h"
#include "framework/Type_Visit.h"

namespace cimple {

namespace {

template <class T>
bool values_equal(const void* a, const void* b, bool array) {
  if (array) return *static_cast<const Array<T>*>(a) == *static_cast<const Array<T>*>(b);
  return *static_cast<const T*>(a) == *static_cast<const T*>(b);
}

bool key_property_eq(const Instance* a, const Meta_Property* pa, const Instance* b) {
  const Meta_Property* pb = find_property(b->meta_class, pa->name);
  if (pb == nullptr || !(pb->flags & FLAG_KEY) || pb->type != pa->type || pb->subscript != pa->subscript)
    return false;
  if (*null_flag(a, pa) != *null_flag(b, pb)) return false;
  return visit_type(pa->type, [&](auto tag) {
    using T = typename decltype(tag)::type;
    return values_equal<T>(slot(a, pa->offset), slot(b, pb->offset), is_array(pa));
  });
}

bool key_reference_eq(const Instance* a, const Meta_Reference* ra, const Instance* b) {
  const Meta_Reference* rb = find_reference(b->meta_class, ra->name);
  if (rb == nullptr || !(rb->flags & FLAG_KEY) || is_reference_array(rb)) return false;
  if (!is_subclass(ra->meta_class, rb->meta_class) && !is_subclass(rb->meta_class, ra->meta_class)) return false;
  const Instance* ta = reference_of(a, ra);
  const Instance* tb = reference_of(b, rb);
  if (ta == nullptr || tb == nullptr) return ta == tb;
  return key_eq(ta, tb);
}

template <class T>
void assign_value(void* dest, const void* src, bool array) {
  if (array)
    *static_cast<Array<T>*>(dest) = static_cast<const Array<T>*>(src)->deep_copy();
  else
    *static_cast<T*>(dest) = *static_cast<const T*>(src);
}

void copy_reference(Instance* dest, const Instance* src, const Meta_Reference* mr) {
  if (is_reference_array(mr)) {
    Array<Instance*> fresh;
    for (Instance* element : *static_cast<const Array<Instance*>*>(slot(src, mr->offset))) {
      Instance* element_copy = element ? clone(element) : nullptr;
      fresh.append(element_copy);
      unref(element_copy);
    }
    *static_cast<Array<Instance*>*>(slot(dest, mr->offset)) = std::move(fresh);
    return;
  }
  Instance* target = reference_of(src, mr);
  Instance* replacement = target ? clone(target) : nullptr;
  unref(reference_slot(dest, mr));
  reference_slot(dest, mr) = replacement;
}

}  // namespace

bool key_eq(const Instance* a, const Instance* b) {
  if (a == nullptr || b == nullptr) return a == b;
  const Meta_Class* mc = a->meta_class;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (!(mf->flags & FLAG_KEY)) continue;
    if (mf->flags & FLAG_PROPERTY) {
      if (!key_property_eq(a, reinterpret_cast<const Meta_Property*>(mf), b)) return false;
    } else if (mf->flags & FLAG_REFERENCE) {
      auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
      if (!is_reference_array(mr) && !key_reference_eq(a, mr, b)) return false;
    }
  }
  return true;
}

void set_null_flags(Instance* instance, bool include_keys, bool include_non_keys, uint8_t value) {
  const Meta_Class* mc = instance->meta_class;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (!(mf->flags & FLAG_PROPERTY)) continue;
    bool key = (mf->flags & FLAG_KEY) != 0;
    if ((key && include_keys) || (!key && include_non_keys))
      *null_flag(instance, reinterpret_cast<const Meta_Property*>(mf)) = value;
  }
}

void create_refs(Instance* instance) {
  const Meta_Class* mc = instance->meta_class;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (!(mf->flags & FLAG_REFERENCE)) continue;
    auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
    if (!is_reference_array(mr) && reference_slot(instance, mr) == nullptr)
      reference_slot(instance, mr) = create(mr->meta_class, false);
  }
}

void copy(Instance* dest, const Instance* src, bool keys_only, const Instance* model) {
  if (dest == nullptr || src == nullptr || dest == src || dest->meta_class != src->meta_class) return;
  const Meta_Class* mc = dest->meta_class;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (keys_only && !(mf->flags & FLAG_KEY)) continue;
    if (mf->flags & FLAG_PROPERTY) {
      auto* mp = reinterpret_cast<const Meta_Property*>(mf);
      if (model) {
        const Meta_Property* in_model = find_property(model->meta_class, mp->name);
        if (in_model == nullptr || *null_flag(model, in_model)) continue;
      }
      visit_type(mp->type, [&](auto tag) {
        using T = typename decltype(tag)::type;
        assign_value<T>(slot(dest, mp->offset), slot(src, mp->offset), is_array(mp));
      });
      *null_flag(dest, mp) = *null_flag(src, mp);
    } else if (mf->flags & FLAG_REFERENCE) {
      copy_reference(dest, src, reinterpret_cast<const Meta_Reference*>(mf));
    }
  }
}

}  // namespace cimple
