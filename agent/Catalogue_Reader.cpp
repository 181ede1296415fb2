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

// Clones the map into `snapshot` under the catalogue's ready lock and the
// data lock.  False (snapshot emptied) when two instances have equal keys.
bool take_snapshot(ProviderAgent& agent, Instance_Map& map, Catalogue catalogue, Instance_Map& snapshot) {
  std::unique_lock<std::mutex> ready =
      catalogue == Catalogue::SAN ? agent.waitForSANMaps() : agent.waitForAdapterMaps();
  std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
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
    if (take_snapshot(agent, map, catalogue, snapshot)) {
      // The handler's answer is not consulted: every instance is delivered.
      for (size_t i = 0; i < snapshot.size(); ++i) handler(clone(snapshot[i]), 0);
    }
  } catch (...) {
    if (catalogue == Catalogue::SAN)
      NRV_LOG_AS_AGENT(NRV_CRIT, "Exception in SAN CIM Provider Enumeration - do nothing");
    else
      NRV_LOG_AS_AGENT(NRV_CRIT, "Exception in CIM Provider Enumeration - do nothing");
  }
  NRV_LOG(NRV_DBG, "%s_Provider::enum_instances()", class_name);
  return ENUM_INSTANCES_OK;
}

}  // namespace cimple
