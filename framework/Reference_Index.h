// cimple::Reference_Index: for the map of an association class, which
// instances refer to a given object through each single reference, so that a
// references or associators request costs its answer, not the whole map.
// Targets are indexed by a hash of their key values, consistent with key_eq;
// a hit is still confirmed by key_eq, so collisions cost time, never answers.
//
// Owned by its Instance_Map, which adds every inserted instance and drops or
// rebuilds the index when instances leave.  Not synchronised.
#pragma once

#include <cstdint>
#include <unordered_map>
#include <vector>

#include "framework/Instance.h"

namespace cimple {

class Reference_Index {
 public:
  explicit Reference_Index(const Meta_Class* association);

  void add(const Instance* association, size_t position);
  void clear();

  // Positions in `instances` (the owner's, ascending, each once) of the
  // instances with a single reference, named `role` when given, that
  // refers_to `source` (Association_Walk.h).
  std::vector<size_t> referring_to(const std::vector<Instance*>& instances, const Instance* source,
                                   const char* role) const;

 private:
  struct End {
    const Meta_Reference* reference;
    std::vector<const Meta_Class*> target_classes;  // each class a target of this end has had
    std::unordered_multimap<size_t, uint32_t> positions;  // target's key hash -> position
  };
  std::vector<End> ends_;
};

// Hash of the key values of `instance` named by the key properties of `keys`
// (a class of equal key names and types), or false when `instance` lacks
// one.  Equal for two instances that key_eq compares equal over `keys`.
bool keys_hash(const Meta_Class* keys, const Instance* instance, size_t& hash);

}  // namespace cimple
