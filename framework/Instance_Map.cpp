#include "framework/Instance_Map.h"

#include <algorithm>
#include <cstring>
#include <functional>
#include <string_view>

#include "framework/Type_Visit.h"

namespace cimple {

namespace {

inline size_t mix(size_t seed, size_t value) {
  return seed ^ (value + 0x9e3779b97f4a7c15ull + (seed << 6) + (seed >> 2));
}

template <class T>
size_t value_hash(const T& v) {
  if constexpr (std::is_same_v<T, String>) {
    return std::hash<std::string_view>()(v.view());
  } else if constexpr (std::is_same_v<T, Datetime>) {
    return mix(std::hash<uint64_t>()(v.usec()), static_cast<size_t>(v.utc_offset()) * 2 + v.is_interval());
  } else if constexpr (std::is_same_v<T, char16>) {
    return v.code;
  } else if constexpr (std::is_floating_point_v<T>) {
    return v == 0 ? 0 : std::hash<T>()(v);  // +0.0 and -0.0 compare equal
  } else {
    return std::hash<T>()(v);
  }
}

}  // namespace

size_t property_hash(const Instance* instance, const Meta_Property* mp) {
  size_t h = *null_flag(instance, mp);
  return visit_type(mp->type, [&](auto tag) {
    using T = typename decltype(tag)::type;
    const void* where = slot(instance, mp->offset);
    if (!is_array(mp)) return mix(h, value_hash(*static_cast<const T*>(where)));
    for (const T& element : *static_cast<const Array<T>*>(where)) h = mix(h, value_hash(element));
    return h;
  });
}

size_t key_hash(const Instance* instance) {
  size_t h = 0;
  const Meta_Class* mc = instance->meta_class;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (!(mf->flags & FLAG_KEY)) continue;
    if (mf->flags & FLAG_PROPERTY) {
      h = mix(h, property_hash(instance, reinterpret_cast<const Meta_Property*>(mf)));
    } else if (mf->flags & FLAG_REFERENCE) {
      auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
      if (is_reference_array(mr)) continue;
      const Instance* target = reference_of(instance, mr);
      h = mix(h, target ? key_hash(target) + 1 : 0);
    }
  }
  return h;
}

Instance_Map::Instance_Map(const Meta_Class* meta_class, bool index_references) : meta_class_(meta_class) {
  if (index_references && meta_class != nullptr && (meta_class->flags & FLAG_ASSOCIATION))
    references_ = std::make_unique<Reference_Index>(meta_class);
}

std::vector<size_t> Instance_Map::referring_to(const Instance* source, const char* role) const {
  if (!references_ || source == nullptr) return {};
  return references_->referring_to(instances_, source, role);
}

long Instance_Map::find(const Instance* keys) const {
  return keys == nullptr ? -1 : find(keys, key_hash(keys));
}

long Instance_Map::find(const Instance* keys, size_t hash) const {
  if (index_.empty()) return -1;
  const size_t mask = index_.size() - 1;
  for (size_t i = hash & mask; index_[i].position_plus_one; i = (i + 1) & mask) {
    const Slot& slot = index_[i];
    if (slot.hash == hash && key_eq(instances_[slot.position_plus_one - 1], keys))
      return static_cast<long>(slot.position_plus_one - 1);
  }
  return -1;
}

Instance* Instance_Map::lookup(const Instance* keys) const {
  long i = find(keys);
  return i < 0 ? nullptr : instances_[static_cast<size_t>(i)];
}

long Instance_Map::insert(Instance* instance) {
  if (instance == nullptr) return -1;
  const size_t hash = key_hash(instance);
  if (find(instance, hash) >= 0) return -1;
  instances_.push_back(instance);
  index(hash, instances_.size() - 1);
  if (references_) references_->add(instance, instances_.size() - 1);
  return static_cast<long>(instances_.size() - 1);
}

void Instance_Map::index(size_t hash, size_t position) {
  if ((instances_.size()) * 2 > index_.size()) {
    // Grow and re-place every slot by its stored hash; no instance is read.
    std::vector<Slot> old(std::max<size_t>(16, index_.size() * 2));
    old.swap(index_);
    for (const Slot& slot : old)
      if (slot.position_plus_one) index(slot.hash, slot.position_plus_one - 1);
  }
  const size_t mask = index_.size() - 1;
  size_t i = hash & mask;
  while (index_[i].position_plus_one) i = (i + 1) & mask;
  index_[i] = Slot{hash, static_cast<uint32_t>(position + 1)};
}

int Instance_Map::get_instance(const Instance* keys, Instance*& instance) const {
  Instance* found = lookup(keys);
  if (found == nullptr) return GET_INSTANCE_NOT_FOUND;
  instance = clone(found);
  return GET_INSTANCE_OK;
}

int Instance_Map::create_instance(const Instance* instance) {
  if (instance == nullptr) return CREATE_INSTANCE_INVALID_PARAMETER;
  if (find(instance) >= 0) return CREATE_INSTANCE_DUPLICATE;
  insert(clone(instance));
  return CREATE_INSTANCE_OK;
}

int Instance_Map::modify_instance(const Instance* model, const Instance* instance) {
  Instance* stored = lookup(instance);
  if (stored == nullptr) return MODIFY_INSTANCE_NOT_FOUND;
  copy(stored, instance, false, model);
  if (references_) rebuild_index();  // its ends may have moved
  return MODIFY_INSTANCE_OK;
}

int Instance_Map::delete_instance(const Instance* keys) {
  long i = find(keys);
  if (i < 0) return DELETE_INSTANCE_NOT_FOUND;
  remove(static_cast<size_t>(i));
  return DELETE_INSTANCE_OK;
}

int Instance_Map::enum_instances(const Handler& handler) const {
  for (Instance* instance : instances_)
    if (!handler(clone(instance), 0)) break;
  return ENUM_INSTANCES_OK;
}

void Instance_Map::remove(size_t index) {
  if (index >= instances_.size()) return;
  unref(instances_[index]);
  instances_.erase(instances_.begin() + static_cast<long>(index));
  rebuild_index();
}

void Instance_Map::clear() {
  for (Instance* instance : instances_) unref(instance);
  instances_.clear();
  index_.clear();
  if (references_) references_->clear();
}

void Instance_Map::rebuild_index() {
  index_.clear();
  if (references_) references_->clear();
  for (size_t i = 0; i < instances_.size(); ++i) {
    index(key_hash(instances_[i]), i);
    if (references_) references_->add(instances_[i], i);
  }
}

}  // namespace cimple
