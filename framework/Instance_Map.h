// cimple::Instance_Map: the instances of one class in insertion order, owned
// by the map, answering provider operations with the provider result codes.
// Look-ups go through an open-addressing index of key hashes, so n inserts and
// n look-ups cost O(n) and touch a stored instance only when its hash matches;
// equality is still decided by key_eq.  The map of an association class also
// keeps a Reference_Index of its instances' ends.
//
// Not synchronised: the owner serialises access.  Instances handed out are
// clones; instances handed in are taken over (insert) or copied (create).
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "framework/Instance.h"
#include "framework/Provider.h"
#include "framework/Reference_Index.h"

namespace cimple {

// Hash of an instance's key values, consistent with key_eq.
size_t key_hash(const Instance* instance);
// Hash of one property's value and null flag, consistent with key_eq.
size_t property_hash(const Instance* instance, const Meta_Property* mp);

class Instance_Map {
 public:
  // `index_references`: whether an association map keeps its Reference_Index
  // (a short-lived copy that is only enumerated has no use for one).
  explicit Instance_Map(const Meta_Class* meta_class, bool index_references = true);
  Instance_Map(const Instance_Map&) = delete;
  Instance_Map& operator=(const Instance_Map&) = delete;
  ~Instance_Map() { clear(); }

  const Meta_Class* meta_class() const { return meta_class_; }
  size_t size() const { return instances_.size(); }
  bool empty() const { return instances_.empty(); }
  Instance* operator[](size_t i) const { return instances_[i]; }

  // Takes `instance`; answers its index, or -1 (instance not taken) when an
  // instance with equal keys is present.
  long insert(Instance* instance);
  long find(const Instance* keys) const;
  Instance* lookup(const Instance* keys) const;

  int get_instance(const Instance* keys, Instance*& instance) const;
  int create_instance(const Instance* instance);
  int modify_instance(const Instance* model, const Instance* instance);
  int delete_instance(const Instance* keys);
  // Hands a clone of each instance, in insertion order, to the handler with
  // status 0; stops early when the handler answers false.  Answers 0.
  int enum_instances(const Handler& handler) const;

  // Association maps: positions, ascending, of the instances referring to
  // `source` through a single reference (named `role` when given), as
  // Association_Walk.h's references_source decides.  Other maps: none.
  std::vector<size_t> referring_to(const Instance* source, const char* role) const;

  void remove(size_t index);
  void clear();
  // Exchanges the contents with `other`, a map of the same class, in O(1):
  // a catalogue built aside is published without copying under a lock.
  void swap(Instance_Map& other) noexcept {
    instances_.swap(other.instances_);
    index_.swap(other.index_);
    references_.swap(other.references_);
  }

 private:
  struct Slot {
    size_t hash;
    uint32_t position_plus_one;  // 0: empty
  };
  // Position of the instance with keys equal to `keys` (hash `hash`), or -1.
  long find(const Instance* keys, size_t hash) const;
  void index(size_t hash, size_t position);
  void rebuild_index();

  const Meta_Class* meta_class_;
  std::vector<Instance*> instances_;
  std::vector<Slot> index_;  // power-of-two size, at most half full
  std::unique_ptr<Reference_Index> references_;  // association classes only
};

}  // namespace cimple
