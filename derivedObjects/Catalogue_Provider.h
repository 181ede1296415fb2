// Catalogue_Provider<C>: the one provider template behind every class whose
// instances come from the provider agent's catalogue.  load/unload take and
// drop the agent; enum_instances hands out clones of C's map.  Get instance,
// references and associator names fall back on that enumeration in the
// dispatch layer, so they stay unsupported here, as do all writes and every
// extrinsic method of the class (INVOKE_METHOD_UNSUPPORTED).
#pragma once

#include <span>
#include <vector>

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

  // One entry per method the class declares or inherits, all unsupported.
  static std::span<const Method_Entry<Catalogue_Provider>> methods() {
    static const std::vector<Method_Entry<Catalogue_Provider>> table = [] {
      std::vector<Method_Entry<Catalogue_Provider>> entries;
      const Meta_Class& mc = C::static_meta_class;
      for (size_t i = 0; i < mc.num_meta_features; ++i)
        if (mc.meta_features[i]->flags & FLAG_METHOD)
          entries.push_back({mc.meta_features[i]->name, &Catalogue_Provider::unsupported_method});
      return entries;
    }();
    return table;
  }

 private:
  int unsupported_method(const Instance*, Instance*) { return INVOKE_METHOD_UNSUPPORTED; }
};

}  // namespace cimple
