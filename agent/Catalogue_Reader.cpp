#include "agent/Catalogue_Reader.h"

#include <exception>
#include <mutex>

#include "logging/Log.h"

// The two critical messages of the enumeration belong to the agent's
// interface, whichever provider runs it, and name its header as their source.
#define NRV_LOG_AS_AGENT(level, ...)                                             \
  do {                                                                           \
    static const int nrv_log_line_ = __LINE__;                                   \
    ::cimple::nrv_log("ProviderAgent.h", &nrv_log_line_, (level), __VA_ARGS__); \
  } while (0)

namespace cimple {

namespace {

// Clones the map into `snapshot`; the caller holds m_DataMutex.  False
// (snapshot emptied) when two instances have equal keys.
bool copy_map(Instance_Map& map, Instance_Map& snapshot) {
  for (size_t i = 0; i < map.size(); ++i) {
    Instance* copy = clone(map[i]);
    if (snapshot.insert(copy) < 0) {
      destroy(copy);  // a refused instance stays ours
      NRV_LOG_AS_AGENT(NRV_CRIT, "Insert failed for %zu", i);
      snapshot.clear();
      return false;
    }
  }
  return true;
}

// Clones the map into `snapshot` under the catalogue's ready lock and the
// data lock.
bool take_snapshot(ProviderAgent& agent, Instance_Map& map, Catalogue catalogue, Instance_Map& snapshot) {
  std::unique_lock<std::mutex> ready =
      catalogue == Catalogue::SAN ? agent.waitForSANMaps() : agent.waitForAdapterMaps();
  std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
  return copy_map(map, snapshot);
}

// The refreshing variant: the same order of locks as the data-fetch thread,
// so that a refresh never sees a half-built data set.
bool refresh_and_snapshot(ProviderAgent& agent, Instance_Map& map, Status_Refresh refresh, Instance_Map& snapshot) {
  std::unique_lock<std::mutex> data_ready = agent.waitForAdapterData();
  std::unique_lock<std::mutex> maps_ready = agent.waitForAdapterMaps();
  std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
  {
    std::lock_guard<std::recursive_mutex> own(*refresh.own);
    refresh.run(agent);
  }
  return copy_map(map, snapshot);
}

void deliver(const Instance_Map& snapshot, const Handler& handler) {
  // The handler's answer is not consulted: every instance is delivered.
  for (size_t i = 0; i < snapshot.size(); ++i) handler(clone(snapshot[i]), 0);
}

}  // namespace

int agent_load() { return ProviderAgent::acquireLoaded() ? LOAD_OK : LOAD_FAILED; }

int agent_unload(const char* class_name) {
  NRV_LOG(NRV_DBG, "%s_Provider::unload()", class_name);
  ProviderAgent::releaseRef();
  return UNLOAD_OK;
}

int enumerate_catalogue(const char* class_name, Map_Selector select, Catalogue catalogue, const Handler& handler) {
  try {
    ProviderAgent& agent = *ProviderAgent::getInstance();
    if (catalogue == Catalogue::SAN) agent.requestSANData();
    agent.BuildCimpleInfo();
    Instance_Map& map = select(agent);
    Instance_Map snapshot(map.meta_class());
    if (take_snapshot(agent, map, catalogue, snapshot)) deliver(snapshot, handler);
  } catch (...) {
    if (catalogue == Catalogue::SAN)
      NRV_LOG_AS_AGENT(NRV_CRIT, "Exception in SAN CIM Provider Enumeration - do nothing");
    else
      NRV_LOG_AS_AGENT(NRV_CRIT, "Exception in CIM Provider Enumeration - do nothing");
  }
  NRV_LOG(NRV_DBG, "%s_Provider::enum_instances()", class_name);
  return ENUM_INSTANCES_OK;
}

int enumerate_refreshed(const char* class_name, const char* source, Map_Selector select, Status_Refresh refresh,
                        const Handler& handler) {
  try {
    ProviderAgent& agent = *ProviderAgent::getInstance();
    if (!agent.m_bIsLoaded) {
      NRV_LOG(NRV_DBG, "RM Init failed for %s", source);
      return ENUM_INSTANCES_OK;
    }
    agent.BuildCimpleInfo();
    Instance_Map& map = select(agent);
    Instance_Map snapshot(map.meta_class());
    if (refresh_and_snapshot(agent, map, refresh, snapshot)) deliver(snapshot, handler);
  } catch (...) {
    NRV_LOG_AS_AGENT(NRV_CRIT, "Exception in CIM Provider Enumeration - do nothing");
  }
  NRV_LOG(NRV_DBG, "%s_Provider::enum_instances()", class_name);
  return ENUM_INSTANCES_OK;
}

}  // namespace cimple
