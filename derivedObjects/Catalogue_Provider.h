// Catalogue_Provider<C>: the one provider template behind every class whose
// instances come from the provider agent's catalogue.  load/unload take and
// drop the agent; enum_instances hands out clones of C's map.  Get instance,
// references and associator names fall back on that enumeration in the
// dispatch layer, so they stay unsupported here, as do all writes and methods.
#pragma once

#include "agent/Catalogue_Reader.h"
#include "framework/Provider_Proc.h"

namespace cimple {

template <class C>
class Catalogue_Provider : public Provider_Base {
 public:
  int load() { return agent_load(); }
  int unload() { return agent_unload(C::static_meta_class.name); }
  int enum_instances(const Instance*, const Handler& handler) {
    return enumerate_catalogue(C::static_meta_class.name, &agent_map<C>, catalogue_of<C>, handler);
  }
};

}  // namespace cimple
