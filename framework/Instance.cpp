// Instance life cycle: create (with or without defaults), clone, ref/unref.
//
// create(mc, with_defaults): zeroed memory already holds empty strings, zero
// datetimes, empty arrays and null references, so only defaults and null
// flags need writing.  With defaults, a property with a default value gets a
// copy of it; every other property is null.  Without, nothing is null.
#include "framework/Instance.h"

#include <cstddef>
#include <cstdlib>
#include <cstring>
#include <new>

#include "framework/Type_Visit.h"

namespace cimple {

const Meta_Class Instance_meta_class = {
    0, FLAG_CLASS, "Instance", 0, nullptr, nullptr, 0, sizeof(Instance), nullptr, nullptr, 0, nullptr,
};

namespace {

inline std::atomic_ref<uint32_t> counter(const Instance* instance) {
  return std::atomic_ref<uint32_t>(const_cast<Instance*>(instance)->refs);
}

template <class T>
T default_scalar(const void* data) {
  if constexpr (std::is_same_v<T, String>) {
    return String(*static_cast<const char* const*>(data));
  } else if constexpr (std::is_same_v<T, Datetime>) {
    Datetime dt;
    dt.set(*static_cast<const char* const*>(data));
    return dt;
  } else {
    return *static_cast<const T*>(data);
  }
}

template <class T>
T default_element(const void* data, size_t i) {
  if constexpr (std::is_same_v<T, String> || std::is_same_v<T, Datetime>)
    return default_scalar<T>(static_cast<const char* const*>(data) + i);
  else
    return static_cast<const T*>(data)[i];
}

void apply_default(Instance* instance, const Meta_Property* mp) {
  void* where = slot(instance, mp->offset);
  const Meta_Value* value = mp->value;
  visit_type(mp->type, [&](auto tag) {
    using T = typename decltype(tag)::type;
    if (is_array(mp)) {
      auto* array = static_cast<Array<T>*>(where);
      for (uint32_t i = 0; i < value->count; ++i) array->append(default_element<T>(value->data, i));
    } else {
      *static_cast<T*>(where) = default_scalar<T>(value->data);
    }
  });
}

// Turns the bitwise copy of a property into an independent copy.
void own_copied_property(Instance* copy, const Meta_Property* mp) {
  void* where = slot(copy, mp->offset);
  visit_type(mp->type, [&](auto tag) {
    using T = typename decltype(tag)::type;
    if (is_array(mp)) {
      // Copied into a local first: constructing straight into `where` would
      // let the copy's construction overwrite the handle it copies from.
      Array<T> own = static_cast<const Array<T>*>(where)->deep_copy();
      new (where) Array<T>(std::move(own));
    } else if constexpr (!std::is_trivially_copyable_v<T>) {
      const T& shared = *static_cast<const T*>(where);
      new (where) T(shared);
    }
  });
}

void release_property(Instance* instance, const Meta_Property* mp) {
  void* where = slot(instance, mp->offset);
  visit_type(mp->type, [&](auto tag) {
    using T = typename decltype(tag)::type;
    if (is_array(mp))
      static_cast<Array<T>*>(where)->~Array<T>();
    else if constexpr (!std::is_trivially_destructible_v<T>)
      static_cast<T*>(where)->~T();
  });
}

Instance* allocate(const Meta_Class* mc) {
  void* mem = std::calloc(1, mc->size);
  if (mem == nullptr) throw std::bad_alloc();
  Instance* instance = static_cast<Instance*>(mem);
  instance->magic = kInstanceMagic;
  instance->refs = 1;
  instance->meta_class = mc;
  return instance;
}

void destroy_record(Instance* instance) {
  const Meta_Class* mc = instance->meta_class;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (mf->flags & FLAG_PROPERTY) {
      release_property(instance, reinterpret_cast<const Meta_Property*>(mf));
    } else if (mf->flags & FLAG_REFERENCE) {
      auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
      if (is_reference_array(mr))
        static_cast<Array<Instance*>*>(slot(instance, mr->offset))->~Array<Instance*>();
      else
        unref(reference_slot(instance, mr));
    }
  }
  instance->__name_space.~String();
  instance->magic = 0;
  std::free(instance);
}

}  // namespace

Instance* create(const Meta_Class* mc, bool with_defaults) {
  Instance* instance = allocate(mc);
  if (!with_defaults) return instance;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (!(mf->flags & FLAG_PROPERTY)) continue;
    auto* mp = reinterpret_cast<const Meta_Property*>(mf);
    if (mp->value)
      apply_default(instance, mp);
    else
      *null_flag(instance, mp) = 1;
  }
  return instance;
}

Instance* create(const Meta_Method* mm) {
  return allocate(reinterpret_cast<const Meta_Class*>(mm));
}

void prefetch_instance(const Instance* instance, size_t bytes) {
  if (instance == nullptr) return;
  const char* start = reinterpret_cast<const char*>(instance);
  for (size_t at = 0; at < bytes; at += 64) __builtin_prefetch(start + at);
}

void prefetch_strings(const Instance* instance) {
  if (instance == nullptr) return;
  const Meta_Class* mc = instance->meta_class;
  for (size_t i = 0; i < mc->num_meta_features; ++i)
    if (const String* text = scalar_string(instance, mc->meta_features[i])) text->prefetch();
}

const String* scalar_string(const Instance* instance, const Meta_Feature* feature) {
  if (!(feature->flags & FLAG_PROPERTY)) return nullptr;
  auto* mp = reinterpret_cast<const Meta_Property*>(feature);
  if (mp->type != STRING || is_array(mp)) return nullptr;
  return static_cast<const String*>(slot(instance, mp->offset));
}

Instance* clone(const Instance* source) {
  const Meta_Class* mc = source->meta_class;
  void* mem = std::malloc(mc->size);
  if (mem == nullptr) throw std::bad_alloc();
  // Everything but the reference count, which other threads may be changing
  // (an instance may be shared while it is cloned): the copy starts at one.
  constexpr size_t kAfterRefs = offsetof(Instance, refs) + sizeof(Instance::refs);
  std::memcpy(mem, static_cast<const void*>(source), offsetof(Instance, refs));
  std::memcpy(static_cast<char*>(mem) + kAfterRefs, reinterpret_cast<const char*>(source) + kAfterRefs,
              mc->size - kAfterRefs);
  Instance* copy = static_cast<Instance*>(mem);
  copy->refs = 1;
  new (&copy->__name_space) String(source->__name_space);
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (mf->flags & FLAG_PROPERTY) {
      own_copied_property(copy, reinterpret_cast<const Meta_Property*>(mf));
    } else if (mf->flags & FLAG_REFERENCE) {
      auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
      if (is_reference_array(mr)) {
        const Array<Instance*>& shared = *static_cast<const Array<Instance*>*>(slot(source, mr->offset));
        Array<Instance*>* fresh = new (slot(copy, mr->offset)) Array<Instance*>();
        for (Instance* element : shared) {
          Instance* element_copy = element ? clone(element) : nullptr;
          fresh->append(element_copy);
          unref(element_copy);
        }
      } else if (Instance* target = reference_of(source, mr)) {
        reference_slot(copy, mr) = clone(target);
      }
    }
  }
  return copy;
}

void ref(const Instance* instance) {
  if (instance) counter(instance).fetch_add(1, std::memory_order_relaxed);
}

void unref(Instance* instance) {
  if (instance && counter(instance).fetch_sub(1, std::memory_order_acq_rel) == 1) destroy_record(instance);
}

Instance* writable(Instance_Ptr& owned) {
  // A count of one cannot grow behind our back: only a holder can ref.
  if (owned && counter(owned.get()).load(std::memory_order_acquire) > 1) owned.reset(clone(owned.get()));
  return owned.get();
}

uint8_t* null_flag(Instance* instance, const Meta_Property* mp) {
  uint32_t value_size = is_array(mp) ? 8 : (mp->type < 14 ? type_size[mp->type] : 8);
  return static_cast<uint8_t*>(slot(instance, mp->offset + value_size));
}

const uint8_t* null_flag(const Instance* instance, const Meta_Property* mp) {
  return null_flag(const_cast<Instance*>(instance), mp);
}

}  // namespace cimple
