// Life cycle of the agent: the process-wide pointer and reference count,
// construction and destruction in their fixed order.  The data fetch lives in
// ProviderAgent_Fetch.cpp, the clearing of the maps in ProviderAgent_Clear.cpp.
#include "agent/ProviderAgent.h"

#include <unistd.h>

#include <exception>

#include "access/NRV_Common.h"
#include "agent/Status_Refresh.h"
#include "access/NRV_MethodWrapper.h"
#include "access/NRV_Runtime_Loader.h"
#include "logging/NRV_SystemPaths.h"
#include "access/RM_Api.h"
#include "agent/San_Catalogue.h"
#include "data/NRV_Data.h"
#include "data/NRV_SanScan.h"
#include "logging/CLogger.h"
#include "logging/Log.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

// The process-wide state: the agent pointer, its reference count and the
// agent mutex, which guards both (the pointer is also read without it).
std::atomic<ProviderAgent*> s_pAgent{nullptr};
int32_t s_RefCount = 0;
std::mutex s_AgentMutex;

void default_build_adapter_data(ProviderAgent& agent) {
  if (agent.m_pData) agent.m_pData->buildAdapterData();
}
void default_update_adapter_maps(ProviderAgent& agent) { agent.updateAdapterMaps(); }
void default_build_san_data(ProviderAgent& agent) { agent.buildSANData(); }
void default_update_san_maps(ProviderAgent& agent) { agent.updateSANMaps(); }
void default_publish_san_maps(ProviderAgent& agent) { agent.publishSANMaps(); }
void default_release_diagnostic_jobs(ProviderAgent& agent) { agent.releaseDiagnosticJobs(); }

constexpr Catalogue_Builders kDefaultBuilders = {default_build_adapter_data, default_update_adapter_maps,
                                                 default_build_san_data, default_update_san_maps,
                                                 default_publish_san_maps, default_release_diagnostic_jobs};
// Constant-initialised, so ready before any static initialiser could load a provider.
Catalogue_Builders s_Builders = kDefaultBuilders;  // guarded by s_AgentMutex

}  // namespace

Catalogue_Builders ProviderAgent::defaultBuilders() { return kDefaultBuilders; }

void ProviderAgent::useBuilders(const Catalogue_Builders& builders) {
  std::lock_guard<std::mutex> lock(s_AgentMutex);
  s_Builders = builders;
}

ProviderAgent* ProviderAgent::instanceLocked() {
  ProviderAgent* agent = s_pAgent.load(std::memory_order_relaxed);
  if (agent == nullptr) {
    agent = new ProviderAgent(s_Builders);
    s_pAgent.store(agent, std::memory_order_release);
  }
  return agent;
}

ProviderAgent* ProviderAgent::getInstance() {
  if (ProviderAgent* agent = s_pAgent.load(std::memory_order_acquire)) return agent;
  std::lock_guard<std::mutex> lock(s_AgentMutex);
  return instanceLocked();
}

ProviderAgent* ProviderAgent::peekInstance() { return s_pAgent.load(std::memory_order_acquire); }

int32_t ProviderAgent::refCount() {
  std::lock_guard<std::mutex> lock(s_AgentMutex);
  return s_RefCount;
}

void ProviderAgent::addRef() {
  NRV_LOG(NRV_DBG, "ProviderAgent::addRef[%d]", refCount());
  std::lock_guard<std::mutex> lock(s_AgentMutex);
  ++s_RefCount;
}

bool ProviderAgent::acquireLoaded() {
  std::lock_guard<std::mutex> lock(s_AgentMutex);
  if (!instanceLocked()->m_bIsLoaded) return false;
  // The count is logged before the change, as addRef does.
  NRV_LOG(NRV_DBG, "ProviderAgent::addRef[%d]", s_RefCount);
  ++s_RefCount;
  return true;
}

void ProviderAgent::releaseRef() {
  NRV_LOG(NRV_DBG, "ProviderAgent::releaseRef[%d]", refCount());
  std::lock_guard<std::mutex> lock(s_AgentMutex);
  if (s_RefCount == 0) return;
  if (--s_RefCount > 0) return;
  // Destroyed under the agent mutex, so a provider loading meanwhile waits
  // for the old agent (sinks, libraries) to be gone before a new one starts.
  // The pointer stays published until then: code on the agent's own fetch
  // thread, which the destructor joins, may still look the agent up.
  delete s_pAgent.load(std::memory_order_relaxed);
  s_pAgent.store(nullptr, std::memory_order_release);
}

// ---- construction ------------------------------------------------------------

#define NRV_AGENT_INIT_MAP(C) , m_##C##_map(&C::static_meta_class)

ProviderAgent::ProviderAgent(const Catalogue_Builders& builders)
    : m_FileLogger(CLogger::instance()),
      m_CIMLogger(CLogger::instance(), NRV_CIMLogger::kDefaultMaxRecords),
      m_CIM_ComputerSystem_map(&CIM_ComputerSystem::static_meta_class),
      m_CIM_Chassis_map(&CIM_Chassis::static_meta_class)
      NRV_FOR_EACH_PROVIDER_CLASS(NRV_AGENT_INIT_MAP),
      m_Builders(builders) {
  construct();
}

#undef NRV_AGENT_INIT_MAP

void ProviderAgent::construct() {
  CLogger& logger = CLogger::instance();
  logger.registerSink(&m_FileLogger);
  logger.registerSink(&m_CIMLogger);
  m_SysLogger.emplace(logger);
  // A new agent has a new catalogue: its first reads refresh at once.
  resetStatusRefreshTimes();
  try {
    m_ConfigFile.read(system_path(kNrvConfigFile));

    logger.dataFile().setReadOnlyRootProbe([] { return IsReadOnlyFS(); });
    logger.readConfigDataFile();
    m_bLoggerDefault = logger.dataFile().applyDefaultIfMissing();

    const NrvConfigFile::Settings settings = m_ConfigFile.settings();
    m_CacheTimeout = settings.cacheTimeout;
    m_bRefreshAdapterData = settings.refreshAdapterData;
    m_bRefreshSANData = settings.refreshSANData;

    if (getOSInformation(m_OSName, m_OSDistribution) != 0) NRV_LOG(NRV_ERR, "getOSInformation() failed");
    {
      std::lock_guard<std::mutex> lock(m_BuildMutex);
      m_LoadedTime = Datetime();
    }

    NRV_LOG(NRV_DBG, "Initializing RM API ");
    if (NRV_Runtime_Loader::loadLibraries() == 1) {
      // Without a management library there is nothing to initialise, and the
      // agent still serves what needs none (the provider settings) while
      // adapter classes answer empty, so that a CIMOM's request across every
      // provider still succeeds.
      NRV_LOG(NRV_ERR, "Error : In Loading Library ");
      NRV_LOG(NRV_CRIT, "No management library (liblrmapi.so, librmapi.so) found: no adapter can be managed");
    } else {
      m_pMethodWrapper = std::make_unique<NRV_MethodWrapper>();
    }
    m_pData = std::make_unique<Data>();

    NRV_LOG(NRV_INFO, "Norvane Provider v%d.%d.%d-%d Loaded[%d]", kNrvVersion[0], kNrvVersion[1], kNrvVersion[2],
            kNrvVersion[3], static_cast<int>(::getpid()));
    m_bIsLoaded = true;
  } catch (...) {
    NRV_LOG(NRV_ERR, "Norvane CIM Provider load failure");
    m_bIsLoaded = false;
  }
}

// ---- destruction -------------------------------------------------------------

ProviderAgent::~ProviderAgent() { destruct(); }

void ProviderAgent::destruct() {
  NRV_LOG(NRV_DBG, "Entering dtor ~ProviderAgent()");
  try {
    {
      std::lock_guard<std::mutex> lock(m_BuildMutex);
      m_bIsLoaded = false;
      // A fetch that is running, or one that finished but was never joined,
      // is joined here.  Not under m_BuildMutex: the fetch thread takes it
      // last thing before it ends.
      if (m_bIsDataFetchRunning) NRV_LOG(NRV_DBG, "PERF: Clearing the previous thread...with join");
    }
    if (m_DataFetchThread.joinable()) {
      void* result = nullptr;
      Thread::join(m_DataFetchThread, result);
    }

    NRV_LOG(NRV_DBG, "Deleting Data pointer");
    {
      std::unique_lock<std::mutex> data_ready(m_AdapterDataReadyMutex);
      if (m_bIsAdapterDataBuilding) {
        NRV_LOG(NRV_DBG, "PERF: Waiting for m_bIsAdapterDataReady");
        m_AdapterDataReadyCond.wait(data_ready, [this] { return !m_bIsAdapterDataBuilding; });
        NRV_LOG(NRV_DBG, "PERF: Woken up from wait for m_bIsAdapterDataReady");
      }
      std::unique_lock<std::mutex> maps_ready(m_AdapterMapsReadyMutex);
      m_AdapterMapsReadyCond.wait(maps_ready, [this] { return !m_bIsAdapterMapsUpdating; });
      std::lock_guard<std::recursive_mutex> data(m_DataMutex);

      m_pData.reset();
      NRV_LOG(NRV_DBG, "MethodWrapper");
      m_pMethodWrapper.reset();

      NRV_LOG(NRV_DBG, "Clearing the ConcreteJob objects related to CDM");
      runStep(m_Builders.release_diagnostic_jobs, "release_diagnostic_jobs");
      NRV_LOG(NRV_DBG, "Clearing all the record logs");
      m_NRVTAVO_DiagnosticServiceRecord_map.clear();
      m_NRVTAVO_DiagnosticCompletionRecord_map.clear();
      m_NRVTAVO_RecordAppliesToElement_map.clear();
      m_NRVTAVO_LogManagesRecord_map.clear();
    }

    DOZER_FreeLibrary();
    ClearMaps();
    // A data file the logger refused at start stays as the user wrote it.
    if (!m_bLoggerDefault) CLogger::instance().dataFile().writeUnlessRejected();
    // Saved here, while the sinks can still report a failure; the
    // configuration's own save at its destruction then finds nothing to do.
    m_ConfigFile.write();

    NRV_LOG(NRV_INFO, "Norvane Provider Unloaded");
    NRV_Runtime_Loader::unloadLibraries();
    // The sinks die with the agent; what the logger allocated goes too, so
    // a module unloaded now leaves nothing behind.
    CLogger::instance().release();
  } catch (...) {
    NRV_LOG(NRV_ERR, "Error in ProviderAgent unload. Just continue");
  }
  // The members die next; the configuration rewrites its file as it goes.
}

}  // namespace cimple
