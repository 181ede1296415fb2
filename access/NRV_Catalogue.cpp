// The catalogue view's own helpers: the host system, inserting into the map
// of an instance's class, and making instances and associations.
#include "access/NRV_Catalogue.h"

#include "schema/CIM_ComputerSystem.h"

namespace cimple {

const Instance* NRV_Catalogue::hostSystem() {
  const Instance_Map& systems = of<CIM_ComputerSystem>();
  return systems.empty() ? nullptr : systems[0];
}

bool NRV_Catalogue::insert(Instance* instance) {
  if (instance == nullptr) return false;
  if (map(*instance->meta_class).insert(instance) >= 0) return true;
  destroy(instance);
  return false;
}

const String& moduleNameSpace() {
  static const String name_space(kNrvNamespace);
  return name_space;
}

Instance* makeInstance(const Meta_Class& mc) {
  Instance* instance = create(&mc, true);
  instance->__name_space = moduleNameSpace();
  return instance;
}

Instance* makeEnd(const Instance* end) {
  if (end == nullptr) return nullptr;
  Instance* copy = create(end->meta_class, false);
  set_null_flags(copy, true, true, 1);
  cimple::copy(copy, end, true);
  copy->__name_space = end->__name_space.empty() ? moduleNameSpace() : end->__name_space;
  return copy;
}

Instance* makeAssociation(const Meta_Class& mc, const Instance* first, const Instance* second) {
  if (first == nullptr || second == nullptr) return nullptr;
  const Meta_Reference* ends[2] = {};
  size_t found = 0;
  for (size_t i = 0; i < mc.num_meta_features && found < 2; ++i) {
    const Meta_Feature* feature = mc.meta_features[i];
    if (feature->flags & FLAG_REFERENCE) ends[found++] = reinterpret_cast<const Meta_Reference*>(feature);
  }
  if (found < 2) return nullptr;
  Instance* association = makeInstance(mc);
  reference_slot(association, ends[0]) = makeEnd(first);
  reference_slot(association, ends[1]) = makeEnd(second);
  return association;
}

}  // namespace cimple
