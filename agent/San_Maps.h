// San_Maps: one instance map per SAN-catalogue class, filled aside while the
// SAN part is rebuilt and then swapped into the agent's maps in one short
// step (publish_san_maps), so readers never wait for SCSI I/O or for the
// building of thousands of instances.  san_map<C> names C's staging map.
//
// Contract: owned by the data-fetch thread; not synchronised.  After a
// publish it holds the previous catalogue, released when it is destroyed,
// outside every lock.
#pragma once

#include "schema/ProviderClasses.h"
#include "framework/Instance_Map.h"
#include "schema/Classes.h"

namespace cimple {

class ProviderAgent;

struct San_Maps {
#define NRV_SAN_STAGING_MAP(C) Instance_Map m_##C##_map{&C::static_meta_class};
  NRV_FOR_EACH_SAN_CATALOGUE_CLASS(NRV_SAN_STAGING_MAP)
#undef NRV_SAN_STAGING_MAP

  // Instances held over all maps.
  size_t size() const;
};

template <class C>
Instance_Map& san_map(San_Maps& maps);

#define NRV_SAN_MAP_OF(C) \
  template <>             \
  inline Instance_Map& san_map<C>(San_Maps & maps) { return maps.m_##C##_map; }
NRV_FOR_EACH_SAN_CATALOGUE_CLASS(NRV_SAN_MAP_OF)
#undef NRV_SAN_MAP_OF

// Exchanges every staging map with the agent's; m_SANMapsReadyMutex and
// m_DataMutex held.
void publish_san_maps(ProviderAgent& agent, San_Maps& maps);

}  // namespace cimple
