#include "agent/San_Maps.h"

#include "agent/ProviderAgent.h"

namespace cimple {

size_t San_Maps::size() const {
  size_t n = 0;
#define NRV_SAN_STAGING_SIZE(C) n += m_##C##_map.size();
  NRV_FOR_EACH_SAN_CATALOGUE_CLASS(NRV_SAN_STAGING_SIZE)
#undef NRV_SAN_STAGING_SIZE
  return n;
}

void publish_san_maps(ProviderAgent& agent, San_Maps& maps) {
#define NRV_SAN_PUBLISH(C) agent.m_##C##_map.swap(maps.m_##C##_map);
  NRV_FOR_EACH_SAN_CATALOGUE_CLASS(NRV_SAN_PUBLISH)
#undef NRV_SAN_PUBLISH
}

}  // namespace cimple
