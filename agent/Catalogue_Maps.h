// Which agent map, and which of the two catalogues (adapter or SAN), serves
// each class: agent_map<C> and catalogue_of<C>, stamped out from the class
// lists so that no binding is written by hand.
#pragma once

#include "agent/Catalogue_Groups.h"
#include "agent/ProviderAgent.h"
#include "schema/ProviderClasses.h"

namespace cimple {

#define NRV_CATALOGUE_DECLARE_CLASS(C) struct C;
NRV_FOR_EACH_PROVIDER_CLASS(NRV_CATALOGUE_DECLARE_CLASS)
NRV_HOST_MAPS(NRV_CATALOGUE_DECLARE_CLASS)
#undef NRV_CATALOGUE_DECLARE_CLASS

// The map of class C.  Only the specialisations below exist, so a class
// without a map fails to link rather than reading the wrong one.
template <class C>
Instance_Map& agent_map(ProviderAgent& agent);

#define NRV_CATALOGUE_MAP_OF(C) \
  template <>                   \
  inline Instance_Map& agent_map<C>(ProviderAgent & agent) { return agent.m_##C##_map; }
NRV_FOR_EACH_PROVIDER_CLASS(NRV_CATALOGUE_MAP_OF)
NRV_HOST_MAPS(NRV_CATALOGUE_MAP_OF)
#undef NRV_CATALOGUE_MAP_OF

// Which readiness a reader of class C waits for.
enum class Catalogue { Adapter, SAN };

template <class C>
inline constexpr Catalogue catalogue_of = Catalogue::Adapter;

#define NRV_CATALOGUE_SAN_CLASS(C) \
  template <>                      \
  inline constexpr Catalogue catalogue_of<C> = Catalogue::SAN;
NRV_FOR_EACH_SAN_CATALOGUE_CLASS(NRV_CATALOGUE_SAN_CLASS)
#undef NRV_CATALOGUE_SAN_CLASS

}  // namespace cimple
