// Catalogue_Provider<C>: the one provider template behind every class whose
// instances come from the provider agent's catalogue.  load/unload take and
// drop the agent; enum_instances hands out C's instances (shared when C is
// published whole, else clones); get instance looks the keys up in the map,
// and for association classes references and associator names come from the
// map's reference index, answering what the dispatch layer's
// enumeration-based fallbacks would (which still serve when NRV_GENERIC_READS
// is set).  Writes and every extrinsic method of the class are unsupported
// (INVOKE_METHOD_UNSUPPORTED).
#pragma once

#include <span>
#include <vector>

#include "agent/Catalogue_Reader.h"
#include "framework/Generic_Reads.h"
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
  int get_instance(const Instance* model, Instance*& instance) {
    if (generic_reads()) return GET_INSTANCE_UNSUPPORTED;
    return get_catalogue_instance(source(), model, instance);
  }
  int enum_references(const Instance* instance, const Instance*, const char* role, const Handler& handler) {
    if (generic_reads()) return ENUM_REFERENCES_UNSUPPORTED;
    return catalogue_references(source(), instance, role, handler);
  }
  int enum_associator_names(const Instance* instance, const char* result_class, const char* role,
                            const char* result_role, const Handler& handler) {
    if (generic_reads()) return ENUM_ASSOCIATOR_NAMES_UNSUPPORTED;
    return catalogue_associator_names(source(), instance, result_class, role, result_role, handler);
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
  static Catalogue_Source source() { return {C::static_meta_class.name, &agent_map<C>, catalogue_of<C>}; }
  int unsupported_method(const Instance*, Instance*) { return INVOKE_METHOD_UNSUPPORTED; }
};

}  // namespace cimple
