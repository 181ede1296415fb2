#include "framework/Reference_Index.h"

#include <algorithm>

#include "framework/Association_Walk.h"
#include "framework/Instance_Map.h"

namespace cimple {

bool keys_hash(const Meta_Class* keys, const Instance* instance, size_t& hash) {
  hash = 0;
  for (size_t i = 0; i < keys->num_meta_features; ++i) {
    const Meta_Feature* mf = keys->meta_features[i];
    if (!(mf->flags & FLAG_KEY) || !(mf->flags & FLAG_PROPERTY)) continue;
    const Meta_Property* mp = instance->meta_class == keys ? reinterpret_cast<const Meta_Property*>(mf)
                                                            : find_property(instance->meta_class, mf->name);
    if (mp == nullptr) return false;
    hash = hash * 1099511628211ull + property_hash(instance, mp);
  }
  return true;
}

Reference_Index::Reference_Index(const Meta_Class* association) {
  for_each_single_reference(association, [this](const Meta_Reference* mr) {
    ends_.push_back(End{mr, {}, {}});
    return true;
  });
}

void Reference_Index::add(const Instance* association, size_t position) {
  for (End& end : ends_) {
    const Instance* target = reference_of(association, end.reference);
    if (target == nullptr) continue;
    size_t hash = 0;
    keys_hash(target->meta_class, target, hash);
    end.positions.emplace(hash, static_cast<uint32_t>(position));
    if (std::find(end.target_classes.begin(), end.target_classes.end(), target->meta_class) ==
        end.target_classes.end())
      end.target_classes.push_back(target->meta_class);
  }
}

void Reference_Index::clear() {
  for (End& end : ends_) {
    end.target_classes.clear();
    end.positions.clear();
  }
}

std::vector<size_t> Reference_Index::referring_to(const std::vector<Instance*>& instances, const Instance* source,
                                                  const char* role) const {
  std::vector<size_t> found;
  for (const End& end : ends_) {
    if (name_given(role) && !equal_nocase(end.reference->name, role)) continue;
    if (!is_subclass(end.reference->meta_class, source->meta_class)) continue;
    // key_eq compares the target's keys with the source's of the same names,
    // so the source is hashed as each kind of target would be.
    for (const Meta_Class* target_class : end.target_classes) {
      size_t hash = 0;
      if (!keys_hash(target_class, source, hash)) continue;
      auto [first, last] = end.positions.equal_range(hash);
      for (auto it = first; it != last; ++it)
        if (refers_to(instances[it->second], end.reference, source)) found.push_back(it->second);
    }
  }
  std::sort(found.begin(), found.end());
  found.erase(std::unique(found.begin(), found.end()), found.end());
  return found;
}

}  // namespace cimple
