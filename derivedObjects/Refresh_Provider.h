// Refresh_Provider<C, Refresh>: the catalogue provider of a class whose
// volatile values (link state, speeds, temperature, statistics, driver
// parameters) are refreshed in its map, at most once per interval, just
// before the map is copied out or an instance is looked up in it.
// Everything else is Catalogue_Provider<C>'s.
//
// Contract: the refresh runs under the agent's locks in the data-fetch
// thread's order, then under this provider's own recursive mutex, one per
// class, made on first use and kept for the life of the module.
#pragma once

#include <mutex>

#include "agent/Status_Refresh.h"
#include "derivedObjects/Catalogue_Provider.h"

namespace cimple {

template <class C, void (*Refresh)(ProviderAgent&)>
class Refresh_Provider : public Catalogue_Provider<C> {
 public:
  int enum_instances(const Instance*, const Handler& handler) {
    return enumerate_refreshed(C::static_meta_class.name, kSource, &agent_map<C>, refresh(), handler);
  }
  int get_instance(const Instance* model, Instance*& instance) {
    if (generic_reads()) return GET_INSTANCE_UNSUPPORTED;
    const Status_Refresh run = refresh();
    return get_catalogue_instance({C::static_meta_class.name, &agent_map<C>, Catalogue::Adapter, &run, kSource},
                                  model, instance);
  }

 private:
  static constexpr const char* kSource = "Refresh_Provider.h";
  static Status_Refresh refresh() {
    static std::recursive_mutex own;  // lives until the module is unloaded, after its last request
    return Status_Refresh{Refresh, &own};
  }
};

// The classes whose providers refresh, and the refresh each runs.
#define NRV_REFRESH_PROVIDERS(X)                               \
  X(NRVTAVO_Card, UpdateBoardTemp)                             \
  X(NRVTAVO_EthernetPort, UpdateEthernetPortStatus)            \
  X(NRVTAVO_FCPort, UpdateFCoEPortStatus)                      \
  X(NRVTAVO_FCPortStatistics, GetFCoEPortStats)                \
  X(NRVTAVO_PortController, UpdatePhyLinkDownReason)           \
  X(NRVTAVO_DriverParameterSettingData, UpdateDriverParameters)

#define NRV_DECLARE_REFRESH_PROVIDER(C, R) \
  class C##_Provider : public Refresh_Provider<C, &R> {};
NRV_REFRESH_PROVIDERS(NRV_DECLARE_REFRESH_PROVIDER)
#undef NRV_DECLARE_REFRESH_PROVIDER

}  // namespace cimple
