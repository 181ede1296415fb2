#include "agent/Catalogue_Reader.h"

#include <exception>
#include <mutex>
#include <vector>

#include "framework/Association_Walk.h"
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

// How many instances ahead a loop over a class's instances loads the next
// ones: far enough to hide a memory access, near enough to stay in the cache.
constexpr size_t kPrefetchAhead = 4;
// How far ahead a loop that only touches each instance's header loads it.
constexpr size_t kHeadersAhead = 32;

// Before a loop works on `instances[i]` (a map or a vector of `count`
// instances of at least `bytes` each): the instance two steps ahead starts
// loading, and the strings of the one a step ahead, whose memory is by then
// in the cache.
template <class Instances>
void load_ahead(const Instances& instances, size_t count, size_t i, size_t bytes) {
  if (i + 2 * kPrefetchAhead < count) prefetch_instance(instances[i + 2 * kPrefetchAhead], bytes);
  if (i + kPrefetchAhead < count) prefetch_strings(instances[i + kPrefetchAhead]);
}

// A class of the SAN catalogue is built aside and published whole (its map
// swapped in), never changed in place once published: its readers may share
// the map's own instances (handlers copy one before changing it), and its
// keys are as unique as the map's insert made them.  Every other class may
// change in place and is copied under the locks.
bool published_whole(const Catalogue_Source& from) {
  return from.catalogue == Catalogue::SAN && from.refresh == nullptr;
}

// Takes a reference to each of the map's instances, in map order; the caller
// holds m_DataMutex.
void share_map(const Instance_Map& map, std::vector<Instance*>& taken) {
  taken.reserve(map.size());
  for (size_t i = 0; i < map.size(); ++i) {
    // Only the header (the reference count) is touched here, in a loop so
    // short that the loads must start far ahead; the delivery loads the rest.
    if (i + kHeadersAhead < map.size()) prefetch_instance(map[i + kHeadersAhead], sizeof(Instance));
    ref(map[i]);
    taken.push_back(map[i]);
  }
}

// Clones the map's instances into `taken`, in map order; the caller holds
// m_DataMutex.  Nothing taken when two instances have equal keys (a class
// changed in place may have come to hold such a pair).
void copy_map(const Instance_Map& map, std::vector<Instance*>& taken) {
  // The snapshot only checks the keys and is handed out: no reference index.
  Instance_Map snapshot(map.meta_class(), false);
  const size_t bytes = map.meta_class()->size;
  for (size_t i = 0; i < map.size(); ++i) {
    load_ahead(map, map.size(), i, bytes);
    Instance* copy = clone(map[i]);
    if (snapshot.insert(copy) < 0) {
      destroy(copy);  // a refused instance stays ours
      NRV_LOG_AS_AGENT(NRV_CRIT, "Insert failed for %zu", i);
      return;
    }
  }
  taken.reserve(snapshot.size());
  for (size_t i = 0; i < snapshot.size(); ++i) {
    ref(snapshot[i]);
    taken.push_back(snapshot[i]);
  }
}

void log_failure(const Catalogue_Source& from) {
  if (from.refresh == nullptr && from.catalogue == Catalogue::SAN)
    NRV_LOG_AS_AGENT(NRV_CRIT, "Exception in SAN CIM Provider Enumeration - do nothing");
  else
    NRV_LOG_AS_AGENT(NRV_CRIT, "Exception in CIM Provider Enumeration - do nothing");
}

// Runs `work` on the class's map under the locks of its enumeration: the
// catalogue's ready lock and the data lock, or, for a refreshing class, the
// data-fetch thread's order of locks around the refresh.  False when nothing
// was read: a refreshing class without a loaded agent, or a failure (logged
// as the enumeration logs it).
template <class Work>
bool read_map(const Catalogue_Source& from, Work&& work) {
  try {
    ProviderAgent& agent = *ProviderAgent::getInstance();
    if (from.refresh != nullptr) {
      if (!agent.m_bIsLoaded) {
        NRV_LOG(NRV_DBG, "RM Init failed for %s", from.source);
        return false;
      }
      agent.BuildCimpleInfo();
      Instance_Map& map = from.select(agent);
      std::unique_lock<std::mutex> data_ready = agent.waitForAdapterData();
      std::unique_lock<std::mutex> maps_ready = agent.waitForAdapterMaps();
      std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
      {
        std::lock_guard<std::recursive_mutex> own(*from.refresh->own);
        from.refresh->run(agent);
      }
      work(map);
      return true;
    }
    if (from.catalogue == Catalogue::SAN) agent.requestSANData();
    agent.BuildCimpleInfo();
    Instance_Map& map = from.select(agent);
    std::unique_lock<std::mutex> ready =
        from.catalogue == Catalogue::SAN ? agent.waitForSANMaps() : agent.waitForAdapterMaps();
    std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
    work(map);
    return true;
  } catch (...) {
    log_failure(from);
    return false;
  }
}

// Hands each instance to the handler, which owns it from then on; the
// handler's answer to go on or stop is honoured only when `may_stop`.  A
// handler that throws ends the delivery as a failed read.
void deliver(const Catalogue_Source& from, std::vector<Instance*>& instances, const Handler& handler,
             bool may_stop) {
  size_t i = 0;
  try {
    while (i < instances.size()) {
      load_ahead(instances, instances.size(), i, instances[i]->meta_class->size);
      Instance* instance = instances[i];
      instances[i++] = nullptr;
      if (!handler(instance, 0) && may_stop) break;
    }
  } catch (...) {
    log_failure(from);
  }
  for (; i < instances.size(); ++i) unref(instances[i]);
}

// A read that failed half-way answers nothing, as its enumeration would.
void release(std::vector<Instance*>& instances) {
  for (Instance* instance : instances) unref(instance);
  instances.clear();
}

int enumerate(const Catalogue_Source& from, const Handler& handler) {
  std::vector<Instance*> taken;
  const bool shared = published_whole(from);
  read_map(from, [&](Instance_Map& map) {
    if (shared)
      share_map(map, taken);
    else
      copy_map(map, taken);
  });
  // The handler's answer is not consulted: every instance is delivered.
  deliver(from, taken, handler, false);
  NRV_LOG(NRV_DBG, "%s_Provider::enum_instances()", from.class_name);
  return ENUM_INSTANCES_OK;
}

}  // namespace

int agent_load() { return ProviderAgent::acquireLoaded() ? LOAD_OK : LOAD_FAILED; }

int agent_unload(const char* class_name) {
  NRV_LOG(NRV_DBG, "%s_Provider::unload()", class_name);
  ProviderAgent::releaseRef();
  return UNLOAD_OK;
}

int enumerate_catalogue(const char* class_name, Map_Selector select, Catalogue catalogue, const Handler& handler) {
  return enumerate(Catalogue_Source{class_name, select, catalogue}, handler);
}

int enumerate_refreshed(const char* class_name, const char* source, Map_Selector select, Status_Refresh refresh,
                        const Handler& handler) {
  return enumerate(Catalogue_Source{class_name, select, Catalogue::Adapter, &refresh, source}, handler);
}

int get_catalogue_instance(const Catalogue_Source& from, const Instance* model, Instance*& instance) {
  Instance* found = nullptr;
  if (model != nullptr) {
    read_map(from, [&](Instance_Map& map) {
      const Instance* stored = nullptr;
      if (model->meta_class == map.meta_class()) {
        stored = map.lookup(model);
      } else {
        // A model of another class (an ancestor named by the CIMOM) hashes
        // its keys differently: compare in map order, as an enumeration would.
        for (size_t i = 0; i < map.size() && stored == nullptr; ++i)
          if (key_eq(map[i], model)) stored = map[i];
      }
      if (stored != nullptr) found = clone(stored);
    });
  }
  NRV_LOG(NRV_DBG, "%s_Provider::get_instance()", from.class_name);
  if (found == nullptr) return GET_INSTANCE_NOT_FOUND;
  instance = found;
  return GET_INSTANCE_OK;
}

int catalogue_references(const Catalogue_Source& from, const Instance* source, const char* role,
                         const Handler& handler) {
  std::vector<Instance*> taken;
  if (source != nullptr && !read_map(from, [&](Instance_Map& map) {
        for (size_t position : map.referring_to(source, role)) taken.push_back(clone(map[position]));
      }))
    release(taken);
  deliver(from, taken, handler, true);
  NRV_LOG(NRV_DBG, "%s_Provider::enum_references()", from.class_name);
  return ENUM_REFERENCES_OK;
}

int catalogue_associator_names(const Catalogue_Source& from, const Instance* source, const char* result_class,
                               const char* role, const char* result_role, const Handler& handler) {
  std::vector<Instance*> taken;
  if (source != nullptr && !read_map(from, [&](Instance_Map& map) {
        for (size_t position : map.referring_to(source, role)) {
          const Instance* association = map[position];
          for (const Meta_Reference* mr : far_ends(association, source, result_class, role, result_role))
            taken.push_back(clone(reference_of(association, mr)));
        }
      }))
    release(taken);
  deliver(from, taken, handler, true);
  NRV_LOG(NRV_DBG, "%s_Provider::enum_associator_names()", from.class_name);
  return ENUM_ASSOCIATOR_NAMES_OK;
}

}  // namespace cimple
