// Emptying the catalogue: the adapter groups and the SAN groups of
// Catalogue_Groups.h, each announced by its log texts, walked from one table.
#include <exception>
#include <initializer_list>

#include "agent/Catalogue_Groups.h"
#include "agent/ProviderAgent.h"
#include "logging/Log.h"

namespace cimple {

namespace {

using Map_Member = Instance_Map ProviderAgent::*;

#define NRV_AGENT_MAP_MEMBER(C) &ProviderAgent::m_##C##_map,

constexpr Map_Member kHostMaps[] = {NRV_HOST_MAPS(NRV_AGENT_MAP_MEMBER)};
constexpr Map_Member kRecordLogMaps[] = {NRV_RECORD_LOG_MAPS(NRV_AGENT_MAP_MEMBER)};
constexpr Map_Member kNicMaps[] = {NRV_NIC_MAPS(NRV_AGENT_MAP_MEMBER)};
constexpr Map_Member kSoftwareServiceMaps[] = {NRV_SOFTWARE_SERVICE_MAPS(NRV_AGENT_MAP_MEMBER)};
constexpr Map_Member kSoftwareUpdateMaps[] = {NRV_SOFTWARE_UPDATE_MAPS(NRV_AGENT_MAP_MEMBER)};
constexpr Map_Member kDiagnosticMaps[] = {NRV_DIAGNOSTIC_MAPS(NRV_AGENT_MAP_MEMBER)};
constexpr Map_Member kFcoeMaps[] = {NRV_FCOE_MAPS(NRV_AGENT_MAP_MEMBER)};
constexpr Map_Member kIscsiMaps[] = {NRV_ISCSI_MAPS(NRV_AGENT_MAP_MEMBER)};
constexpr Map_Member kSanFcoeMaps[] = {NRV_SAN_FCOE_MAPS(NRV_AGENT_MAP_MEMBER)};
constexpr Map_Member kSanIscsiMaps[] = {NRV_SAN_ISCSI_MAPS(NRV_AGENT_MAP_MEMBER)};

#undef NRV_AGENT_MAP_MEMBER

struct Map_Group {
  const char* before;  // logged before the group, when set
  const Map_Member* begin;
  const Map_Member* end;
  const char* after;   // logged after the group, when set
};

template <size_t N>
constexpr Map_Group group(const char* before, const Map_Member (&maps)[N], const char* after = nullptr) {
  return {before, maps, maps + N, after};
}

// clearAdapterMaps, in order.
constexpr Map_Group kAdapterGroups[] = {
    group(nullptr, kHostMaps),
    group("Clearing Record Log maps", kRecordLogMaps),
    group("Clearing NIC maps", kNicMaps),
    group("Clearing SoftwareUpdate maps", kSoftwareServiceMaps),
    group("Clearing Software Update maps", kSoftwareUpdateMaps),
    group("Clearing NRV CDM maps", kDiagnosticMaps, "Done with Clearing CDM maps"),
    group("Clearing NRVTAVO FCOE maps", kFcoeMaps, "Done with Clearing FCOE maps"),
    group("Clearing NRVTAVO iSCSI maps", kIscsiMaps, "Done with Clearing iSCSI maps"),
};

void clear_group(ProviderAgent& agent, const Map_Group& g) {
  if (g.before) NRV_LOG(NRV_DBG, "%s", g.before);
  for (const Map_Member* m = g.begin; m != g.end; ++m) (agent.*(*m)).clear();
  if (g.after) NRV_LOG(NRV_DBG, "%s", g.after);
}

}  // namespace

void ProviderAgent::ClearMaps() {
  NRV_LOG(NRV_DBG, "Entered ClearMaps()");
  {
    std::lock_guard<std::mutex> maps_ready(m_AdapterMapsReadyMutex);
    clearAdapterMaps();
  }
  {
    std::lock_guard<std::mutex> san_ready(m_SANMapsReadyMutex);
    clearSANMaps();
  }
  NRV_LOG(NRV_DBG, "Exiting ClearMaps()");
}

void ProviderAgent::clearAdapterMaps() {
  NRV_LOG(NRV_DBG, "PERF: Entered clearAdapterMaps()");
  try {
    for (const Map_Group& g : kAdapterGroups) clear_group(*this, g);
  } catch (...) {
    NRV_LOG(NRV_ERR, "Error in clearAdapterMaps()");
  }
  NRV_LOG(NRV_DBG, "Exiting clearAdapterMaps()");
}

void ProviderAgent::clearSANMaps() {
  NRV_LOG(NRV_DBG, "PERF: Entered FCoE clearSANMaps()");
  // One part failing must not keep the other's instances alive.
  for (const Map_Group& g : {group(nullptr, kSanFcoeMaps),
                             group("PERF: Entered iSCSI clearSANMaps()", kSanIscsiMaps)}) {
    try {
      clear_group(*this, g);
    } catch (...) {
      NRV_LOG(NRV_ERR, "Error in FCoE clearSANMaps()");
    }
  }
  NRV_LOG(NRV_DBG, "Exiting clearSANMaps()");
}

}  // namespace cimple
