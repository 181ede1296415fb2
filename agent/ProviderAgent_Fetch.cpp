// The data fetch: when one is due (BuildCimpleInfo, the cache-timeout check),
// the fetch thread that rebuilds the adapter part and the SAN part of the
// catalogue, and the waits of the reader contract.
#include <chrono>
#include <exception>

#include "agent/ProviderAgent.h"
#include "agent/San_Catalogue.h"
#include "logging/Log.h"

namespace cimple {

namespace {

// How long a waiting reader goes without looking whether a fetch is still
// running: a fetch that could not be started broadcasts nothing.
constexpr std::chrono::milliseconds kFetchRecheck{200};

// Waits until `flag` holds, re-testing it after every wake-up: a wake-up
// alone proves nothing (spurious wakes, broadcasts of an earlier state), and
// a reader that went on would copy maps still being filled.  When no fetch
// is running there is nobody left to set the flag: the caller then goes on
// with the catalogue as it is (nothing is filling it) instead of waiting for
// ever.
void wait_for(std::unique_lock<std::mutex>& lock, std::condition_variable& cond, const std::atomic<bool>& flag,
              const std::atomic<bool>& fetching, const char* waiting = nullptr, const char* woken = nullptr) {
  if (flag) return;
  if (waiting) NRV_LOG(NRV_DBG, "%s", waiting);
  while (!flag && fetching) cond.wait_for(lock, kFetchRecheck);
  if (woken) NRV_LOG(NRV_DBG, "%s", woken);
}

constexpr uint64_t kUsecPerMinute = 60000000ULL;

}  // namespace

// ---- reader side ---------------------------------------------------------------

std::unique_lock<std::mutex> ProviderAgent::waitForAdapterData(bool trace) {
  std::unique_lock<std::mutex> lock(m_AdapterDataReadyMutex);
  wait_for(lock, m_AdapterDataReadyCond, m_bIsAdapterDataReady, m_bIsDataFetchRunning,
           trace ? "PERF: Waiting for m_AdapterDataReadyMutex" : nullptr,
           trace ? "PERF: Woken up from wait for m_AdapterDataReadyMutex" : nullptr);
  return lock;
}

std::unique_lock<std::mutex> ProviderAgent::waitForAdapterMaps(bool trace) {
  std::unique_lock<std::mutex> lock(m_AdapterMapsReadyMutex);
  wait_for(lock, m_AdapterMapsReadyCond, m_bIsAdapterMapsReady, m_bIsDataFetchRunning,
           trace ? "PERF: Waiting for m_AdapterMapsReadyMutex" : nullptr,
           trace ? "PERF: Woken up from wait for m_AdapterMapsReadyMutex" : nullptr);
  return lock;
}

std::unique_lock<std::mutex> ProviderAgent::waitForSANMaps() {
  std::unique_lock<std::mutex> lock(m_SANMapsReadyMutex);
  wait_for(lock, m_SANMapsReadyCond, m_bIsSANMapsReady, m_bIsDataFetchRunning);
  return lock;
}

void ProviderAgent::requestSANData() {
  std::lock_guard<std::mutex> lock(m_SANMapsReadyMutex);
  if (!m_bIsSANMapsReady) m_bBuildSANData = true;
}

// ---- when a fetch is due -------------------------------------------------------

bool ProviderAgent::isCacheTimedOut() {
  NRV_LOG(NRV_DBG, "Checking if TimeOut...");
  const Datetime now = Datetime::now();
  const int32_t timeout = m_CacheTimeout;
  NRV_LOG(NRV_DBG, "loadedtime = %s; currenttime = %s; cache timeout = %d", m_LoadedTime.ascii(true).c_str(),
          now.ascii(true).c_str(), timeout);
  const uint64_t elapsed = now.usec() - m_LoadedTime.usec();
  if (elapsed >= static_cast<uint64_t>(timeout) * kUsecPerMinute) {
    NRV_LOG(NRV_DBG, "PERF: TimeOut");
    return true;
  }
  NRV_LOG(NRV_DBG, "PERF: Refresh Not yet required");
  return false;
}

int ProviderAgent::BuildCimpleInfo() {
  NRV_LOG(NRV_INFO, " Entering BuildCimpleInfo()");
  if (!m_bIsLoaded)
    NRV_LOG(NRV_DBG, "Norvane Provider dependent library load has failed..do nothing is the only option");

  std::unique_lock<std::mutex> build(m_BuildMutex);
  const bool timed_out = isCacheTimedOut();
  if (!timed_out && !m_bBuildAdapterData && !m_bBuildSANData) {
    NRV_LOG(NRV_DBG, "PERF: ---No timeout BuildCimpleInfo END---");
    return 0;
  }
  if (m_bIsDataFetchRunning) {
    NRV_LOG(NRV_DBG, "DataFetch_Handler thread already running-BuildCimpleInfo");
    return 0;
  }
  m_bIsDataFetchRunning = true;
  if (m_DataFetchThread.joinable()) {
    NRV_LOG(NRV_DBG, "PERF: Clearing the previous thread...with join");
    void* result = nullptr;
    Thread::join(m_DataFetchThread, result);
  }
  // A timeout rebuilds the adapter part; a pending SAN request alone does not.
  if (!m_bBuildSANData) m_bBuildAdapterData = true;
  if (!startDataFetch()) {
    // Never fetched on this thread instead: the caller may be a method that
    // holds m_DataMutex, which a fetch may only take after the ready locks.
    // The request stays for the next call; readers stop waiting once they
    // see that no fetch is running.
    m_bIsDataFetchRunning = false;
    return 0;
  }
  NRV_LOG(NRV_DBG, "PERF: ---Created DataFetch_Handler thread -- BuildCimpleInfo END---");
  return 0;
}

// m_BuildMutex held, so the start and the joins of the thread never overlap.
bool ProviderAgent::startDataFetch() {
  if (Thread::create_joinable(m_DataFetchThread, &ProviderAgent::DataFetch_Handler, this) == 0) return true;
  NRV_LOG(NRV_ERR, "Unable to create DataFetch_Handler thread; the catalogue is rebuilt at the next request");
  return false;
}

// ---- the fetch thread ------------------------------------------------------------

void* ProviderAgent::DataFetch_Handler(void* agent) {
  static_cast<ProviderAgent*>(agent)->runDataFetch();
  return nullptr;
}

void ProviderAgent::runDataFetch() {
  NRV_LOG(NRV_DBG, "PERF: DataFetch_Handler Thread BEGIN");
  for (;;) {
    // The SAN part needs adapter data; only this thread ever makes it.
    if (m_bRefreshAdapterData || m_bBuildAdapterData || !m_bIsAdapterDataReady) buildAdapterPart();
    if (m_bRefreshSANData || m_bBuildSANData) buildSANPart();

    // A SAN reader that asked after this pass chose its parts has called
    // BuildCimpleInfo while we ran and been told a fetch is running: serve it
    // with one more pass instead of leaving it waiting.  A request the pass
    // already satisfied is dropped.
    {
      std::lock_guard<std::mutex> san(m_SANMapsReadyMutex);
      if (m_bIsSANMapsReady) m_bBuildSANData = false;
    }
    std::lock_guard<std::mutex> build(m_BuildMutex);
    if (m_bBuildSANData && m_bIsLoaded) continue;
    m_bIsDataFetchRunning = false;
    m_LoadedTime = Datetime::now();
    break;
  }
  NRV_LOG(NRV_DBG, "PERF: DataFetch_Handler Thread END");
}

void ProviderAgent::runStep(void (*step)(ProviderAgent&), const char* name) {
  if (step == nullptr) return;
  try {
    step(*this);
  } catch (const std::exception& e) {
    NRV_LOG(NRV_ERR, "Exception in %s: %s", name, e.what());
  } catch (...) {
    NRV_LOG(NRV_ERR, "Exception in %s", name);
  }
}

void ProviderAgent::buildAdapterPart() {
  NRV_LOG(NRV_DBG, "PERF: Building Adapter Data...");
  {
    std::lock_guard<std::mutex> data_ready(m_AdapterDataReadyMutex);
    m_bBuildAdapterData = false;
    m_bIsAdapterDataReady = false;
    {
      std::lock_guard<std::mutex> maps_ready(m_AdapterMapsReadyMutex);
      m_bIsAdapterMapsReady = false;
    }
    m_bIsAdapterDataBuilding = true;
    if (m_bIsLoaded) {
      std::lock_guard<std::recursive_mutex> data(m_DataMutex);
      runStep(m_Builders.build_adapter_data, "buildAdapterData");
    }
    m_bIsAdapterDataReady = true;
    m_bIsAdapterDataBuilding = false;
    m_AdapterDataReadyCond.notify_all();
  }
  {
    std::lock_guard<std::mutex> san_ready(m_SANMapsReadyMutex);
    m_bIsSANMapsReady = false;
  }
  std::lock_guard<std::mutex> maps_ready(m_AdapterMapsReadyMutex);
  m_bIsAdapterMapsUpdating = true;
  if (m_bIsLoaded) {
    NRV_LOG(NRV_DBG, "PERF: Updating Adapter Maps...");
    std::lock_guard<std::recursive_mutex> data(m_DataMutex);
    runStep(m_Builders.update_adapter_maps, "updateAdapterMaps");
  }
  m_bIsAdapterMapsReady = true;
  m_bIsAdapterMapsUpdating = false;
  m_AdapterMapsReadyCond.notify_all();
}

// The SAN part keeps the flags, conditions and lock order of the adapter
// part, but its slow steps (SCSI commands per logical unit, iSCSI listings,
// building the instances) run with no lock that a reader needs: only the
// publication holds m_SANMapsReadyMutex and m_DataMutex, for a swap of maps.
void ProviderAgent::buildSANPart() {
  {
    std::unique_lock<std::mutex> data_ready(m_AdapterDataReadyMutex);
    m_bBuildSANData = false;
    {
      std::lock_guard<std::mutex> san_ready(m_SANMapsReadyMutex);
      m_bIsSANMapsReady = false;
    }
    wait_for(data_ready, m_AdapterDataReadyCond, m_bIsAdapterDataReady, m_bIsDataFetchRunning);
  }
  if (m_bIsLoaded) {
    NRV_LOG(NRV_DBG, "PERF: Building SAN Data...");
    runStep(m_Builders.build_san_data, "buildSANData");
  }
  {
    std::unique_lock<std::mutex> maps_ready(m_AdapterMapsReadyMutex);
    wait_for(maps_ready, m_AdapterMapsReadyCond, m_bIsAdapterMapsReady, m_bIsDataFetchRunning);
  }
  {
    std::lock_guard<std::mutex> san_ready(m_SANMapsReadyMutex);
    m_bIsSANMapsUpdating = true;
  }
  if (m_bIsLoaded) {
    NRV_LOG(NRV_DBG, "PERF: Updating SAN Maps...");
    runStep(m_Builders.update_san_maps, "updateSANMaps");
  }
  {
    std::lock_guard<std::mutex> san_ready(m_SANMapsReadyMutex);
    if (m_bIsLoaded) {
      std::lock_guard<std::recursive_mutex> data(m_DataMutex);
      runStep(m_Builders.publish_san_maps, "publishSANMaps");
    }
    m_bIsSANMapsReady = true;
    m_bIsSANMapsUpdating = false;
    m_SANMapsReadyCond.notify_all();
  }
  // The previous catalogue, now in the staging maps, is released here,
  // outside every lock.
  m_SANRebuild.reset();
}

}  // namespace cimple
