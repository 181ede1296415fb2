// Meta-class to agent map, stamped out from the class lists.
#include "agent/Agent_Catalogue.h"

#include <stdexcept>
#include <string>
#include <unordered_map>

#include "agent/Catalogue_Groups.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

using Map_Member = Instance_Map ProviderAgent::*;

const std::unordered_map<const Meta_Class*, Map_Member>& maps_by_class() {
#define NRV_AGENT_CATALOGUE_ENTRY(C) {&C::static_meta_class, &ProviderAgent::m_##C##_map},
  static const std::unordered_map<const Meta_Class*, Map_Member> table = {
      NRV_HOST_MAPS(NRV_AGENT_CATALOGUE_ENTRY) NRV_FOR_EACH_PROVIDER_CLASS(NRV_AGENT_CATALOGUE_ENTRY)};
#undef NRV_AGENT_CATALOGUE_ENTRY
  return table;
}

}  // namespace

Instance_Map& Agent_Catalogue::map(const Meta_Class& mc) {
  const auto& table = maps_by_class();
  for (const Meta_Class* c = &mc; c != nullptr; c = c->super_meta_class) {
    const auto found = table.find(c);
    if (found != table.end()) return m_Agent.*(found->second);
  }
  throw std::out_of_range(std::string("no catalogue map for ") + mc.name);
}

}  // namespace cimple
