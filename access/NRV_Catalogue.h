// The catalogue as the feature builders of data/ and access/ see it: the
// instance map of each class and the host system, without knowing who holds
// the maps (the provider agent, or a test).  Also the one way those builders
// make an association instance from its two ends.
//
// Contract: a builder is handed a catalogue for the length of one call and
// keeps nothing from it.  The holder serialises access (the agent's data lock)
// for the whole call.  map() throws std::out_of_range for a class the
// catalogue has no map for; builders let that propagate as their failure.
// insert() takes the instance in every case: kept by the map, or destroyed
// when an instance with equal keys is already there (the caller logs that).
#pragma once

#include <string>
#include <string_view>

#include "framework/Instance.h"
#include "framework/Instance_Map.h"

namespace cimple {

class NRV_Catalogue {
 public:
  virtual ~NRV_Catalogue() = default;

  // The map holding the instances of class `mc`.
  virtual Instance_Map& map(const Meta_Class& mc) = 0;

  template <class C>
  Instance_Map& of() {
    return map(C::static_meta_class);
  }

  // The first instance of the host's computer-system map, or null.
  const Instance* hostSystem();

  // Puts `instance` into the map of its class.  False (and the instance
  // destroyed) when it is null or its keys are taken.
  bool insert(Instance* instance);
};

// Every instance of the module lives in this namespace.
inline constexpr const char* kNrvNamespace = "root/norvane";

// A new instance of `mc` in the module's namespace with every property null
// except those the schema gives a default.
Instance* makeInstance(const Meta_Class& mc);

template <class C>
C* makeInstance() {
  return static_cast<C*>(makeInstance(C::static_meta_class));
}

// The module's namespace as one shared string, for instances to share.
const String& moduleNameSpace();

// What an association keeps of an end: a new instance with the end's keys
// only (clients see references as object paths), in the end's namespace, or
// in the module's when the end names none: an end says where it lives, so
// that a request from another namespace (a profile's) gets its true path.
Instance* makeEnd(const Instance* end);

// A new association of class `mc` whose first and second references (in the
// order the class declares them) hold ends (makeEnd) of `first` and `second`.
// Null when either end is missing or the class has fewer than two references.
Instance* makeAssociation(const Meta_Class& mc, const Instance* first, const Instance* second);

template <class A>
A* makeAssociation(const Instance* first, const Instance* second) {
  return static_cast<A*>(makeAssociation(A::static_meta_class, first, second));
}

// The first instance of `map` (a map of class C or of a superclass of C's
// instances) for which pred(const C&) holds, or null.
template <class C, class Pred>
C* findIn(const Instance_Map& map, Pred pred) {
  for (size_t i = 0; i < map.size(); ++i) {
    C* instance = static_cast<C*>(map[i]);
    if (pred(*instance)) return instance;
  }
  return nullptr;
}

// The OtherIdentifyingInfo entry of a device paired with its
// IdentifyingDescriptions entry `description`; "" when it has none.
template <class D>
std::string identifyingInfo(const D& device, std::string_view description) {
  if (device.IdentifyingDescriptions.is_null() || device.OtherIdentifyingInfo.is_null()) return {};
  const auto& descriptions = device.IdentifyingDescriptions.value;
  const auto& info = device.OtherIdentifyingInfo.value;
  for (size_t i = 0; i < descriptions.size() && i < info.size(); ++i)
    if (descriptions[i].view() == description) return info[i].str();
  return {};
}

// The text of a string property, "" when it is null.
inline std::string textOf(const Property<String>& p) { return p.is_null() ? std::string() : p.value.str(); }

}  // namespace cimple
