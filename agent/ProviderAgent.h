// ProviderAgent: the one process-wide object behind every provider.  It owns
// the management-library wrapper, the adapter data set, the logger sinks, the
// provider configuration and the catalogue (one instance map per class), and
// rebuilds the catalogue on its single data-fetch thread.
//
// Contract:
// - Providers take a reference in load() (getInstance, then addRef when
//   m_bIsLoaded) and drop it in unload() (releaseRef); the release that brings
//   the count to zero destroys the agent, joining its data-fetch thread first.
// - Readers follow the reader contract: BuildCimpleInfo(), then one ready
//   lock (waitForAdapterMaps or waitForSANMaps), then m_DataMutex while they
//   clone instances out.  Nobody holds two ready locks except the data-fetch
//   thread and the destructor, which nest m_AdapterDataReadyMutex,
//   m_AdapterMapsReadyMutex, m_SANMapsReadyMutex, m_DataMutex in that order.
//   m_BuildMutex is always taken alone.
// - The maps and m_pData are touched only under m_DataMutex.  The ready and
//   busy flags change only under their own ready mutex (waiters re-test them
//   in a loop, so a spurious wake never hands out a half-built catalogue).
//   A waiter stops waiting, and reads the catalogue as it is, when no fetch
//   is running: one that could not be started is retried by the next
//   BuildCimpleInfo, never run on the caller's thread.
// - The request flags (m_bBuild...), the configuration copies and m_bIsLoaded
//   are atomics: they are set from request threads without a common lock.
#pragma once

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <memory>
#include <mutex>
#include <optional>
#include <string>

#include "agent/NrvConfigFile.h"
#include "framework/Datetime.h"
#include "framework/Instance_Map.h"
#include "framework/Thread.h"
#include "logging/DeviceLog.h"
#include "logging/NRV_CIMLogger.h"
#include "logging/NRV_FileLogger.h"
#include "logging/NRV_SysLogger.h"
#include "schema/ProviderClasses.h"

namespace cimple {

class Data;
class NRV_MethodWrapper;
class ProviderAgent;
struct San_Rebuild;

// The steps of a data fetch that fill the data set and the maps, and the
// release of diagnostic jobs at destruction.  The defaults are the agent's
// own builders; a test installs others with ProviderAgent::useBuilders; a
// null step is skipped.  None may throw (a throw is caught and logged; the
// fetch still completes its flag updates).
// - build_adapter_data, update_adapter_maps, release_diagnostic_jobs:
//   m_DataMutex held.
// - build_san_data, update_san_maps: no agent lock held.  They do the slow
//   part of the SAN rebuild (SCSI and management-library I/O, building the
//   SAN instances aside) and take m_DataMutex themselves only for the
//   moments they read the data set or the adapter maps, so that no reader
//   waits for a slow logical unit.
// - publish_san_maps: m_SANMapsReadyMutex and m_DataMutex held; puts what the
//   two steps before it prepared in place, and must be quick.
struct Catalogue_Builders {
  void (*build_adapter_data)(ProviderAgent& agent);
  void (*update_adapter_maps)(ProviderAgent& agent);
  void (*build_san_data)(ProviderAgent& agent);
  void (*update_san_maps)(ProviderAgent& agent);
  void (*publish_san_maps)(ProviderAgent& agent);
  void (*release_diagnostic_jobs)(ProviderAgent& agent);
};

// The module's version, as every "v%d.%d.%d-%d" text shows it.
inline constexpr int kNrvVersion[4] = {10, 2, 107, 7};
inline constexpr const char* kNrvSystemLogFile = "/var/log/messages";
inline constexpr int32_t kNrvDriverLogLines = 200;

class ProviderAgent {
 public:
  // ---- process-wide life cycle -------------------------------------------
  // The agent, constructed on first use.  Never null; check m_bIsLoaded.
  static ProviderAgent* getInstance();
  // The agent if one exists, else null; does not construct it.
  static ProviderAgent* peekInstance();
  static void addRef();
  // A provider's load: getInstance and, when the agent is loaded, addRef,
  // both under the agent mutex so that a load racing with the last unload
  // never takes a reference on an agent being destroyed.  False (no
  // reference taken) when the agent's construction failed.
  static bool acquireLoaded();
  // Destroys the agent when the count drops to zero.  The count never goes
  // below zero, so an unload without a successful load does no harm.
  static void releaseRef();
  static int32_t refCount();
  // Builders for agents constructed from now on (tests); see Catalogue_Builders.
  static void useBuilders(const Catalogue_Builders& builders);
  static Catalogue_Builders defaultBuilders();

  ProviderAgent(const ProviderAgent&) = delete;
  ProviderAgent& operator=(const ProviderAgent&) = delete;

  // ---- the catalogue -------------------------------------------------------
  // Starts a data fetch when the cache timed out or a rebuild is requested.
  // Returns at once (0); readers then wait for the ready flag they need.
  int BuildCimpleInfo();

  // Reader side of the contract.  Each answers the ready lock, held, once the
  // flag is set; the caller then locks m_DataMutex and copies.  With `trace`
  // the wait is logged ("PERF: Waiting for ...", "PERF: Woken up ...").
  std::unique_lock<std::mutex> waitForAdapterData(bool trace = false);
  std::unique_lock<std::mutex> waitForAdapterMaps(bool trace = false);
  std::unique_lock<std::mutex> waitForSANMaps();
  // A SAN reader calls this before BuildCimpleInfo: when the SAN maps are not
  // ready it asks the next fetch to build them.
  void requestSANData();

  void ClearMaps();
  void clearAdapterMaps();
  void clearSANMaps();

  // The catalogue builders (see Catalogue_Update.cpp); m_DataMutex held.
  // updateAdapterMaps answers 0, or 32769 when a failure ended the build
  // early (what was built stays; the fetch marks the maps ready either way).
  int updateAdapterMaps();
  // The SAN part, in the three steps of Catalogue_Builders: discovery and
  // building aside with no lock held, then the quick publication.
  void buildSANData();
  void updateSANMaps();
  void publishSANMaps();
  // Hands every diagnostic job to its clean-up; run by the destructor with
  // m_DataMutex held.
  void releaseDiagnosticJobs();

  // Fill the driver-log holders from the system log.
  void logFCDriverEvents();
  void logNICDriverEvents();
  void logISCSIDriverEvents();

  // ---- state (names as every builder and provider uses them) -------------
  std::atomic<bool> m_bBuildAdapterData{true};
  std::atomic<bool> m_bRefreshAdapterData{false};
  std::atomic<bool> m_bBuildSANData{false};
  std::atomic<bool> m_bRefreshSANData{false};
  std::atomic<int32_t> m_CacheTimeout{10};  // minutes
  std::atomic<bool> m_bIsLoaded{false};

  std::unique_ptr<Data> m_pData;
  std::unique_ptr<NRV_MethodWrapper> m_pMethodWrapper;

  NRV_FileLogger m_FileLogger;
  NRV_CIMLogger m_CIMLogger;
  std::optional<NRV_SysLogger> m_SysLogger;  // made after the other two are registered

  NrvConfigFile m_ConfigFile;

  // Guards m_pData and every map.  Recursive so that a method holding it for
  // the whole call may use helpers that lock it again.
  std::recursive_mutex m_DataMutex;

  std::atomic<bool> m_bIsAdapterDataReady{false};
  std::atomic<bool> m_bIsAdapterDataBuilding{false};
  std::mutex m_AdapterDataReadyMutex;
  std::condition_variable m_AdapterDataReadyCond;

  std::atomic<bool> m_bIsAdapterMapsReady{false};
  std::atomic<bool> m_bIsAdapterMapsUpdating{false};
  std::mutex m_AdapterMapsReadyMutex;
  std::condition_variable m_AdapterMapsReadyCond;

  std::atomic<bool> m_bIsSANMapsReady{false};
  std::atomic<bool> m_bIsSANMapsUpdating{false};
  std::mutex m_SANMapsReadyMutex;
  std::condition_variable m_SANMapsReadyCond;

  // Written at construction and by the host-system builder (m_DataMutex held).
  std::string m_OSName;
  std::string m_OSDistribution;
  std::string m_HostName;
  std::string m_HostIPAddress;

  // The catalogue: m_<Class>_map for every provider class and the two host
  // classes.  The maps own their instances; hand out clones only.
#define NRV_AGENT_DECLARE_MAP(C) Instance_Map m_##C##_map;
  Instance_Map m_CIM_ComputerSystem_map;
  Instance_Map m_CIM_Chassis_map;
  NRV_FOR_EACH_PROVIDER_CLASS(NRV_AGENT_DECLARE_MAP)
#undef NRV_AGENT_DECLARE_MAP

  DeviceLog m_FCDriverLog{kNrvDriverLogLines};
  DeviceLog m_NICDriverLog{kNrvDriverLogLines};
  DeviceLog m_ISCSIDriverLog{kNrvDriverLogLines};

  Datetime m_LoadedTime;  // guarded by m_BuildMutex; zero interval until a fetch ends
  Thread m_DataFetchThread;  // started and joined under m_BuildMutex only
  std::mutex m_BuildMutex;
  // Changed under m_BuildMutex; waiting readers read it without (a reader
  // never takes m_BuildMutex inside a ready lock).
  std::atomic<bool> m_bIsDataFetchRunning{false};
  std::atomic<bool> m_bOwnComputerSystem{false};
  // The SAN rebuild between its steps; the data-fetch thread's alone.
  std::unique_ptr<San_Rebuild> m_SANRebuild;

 private:
  // The agent, constructed if absent; the agent mutex held.
  static ProviderAgent* instanceLocked();

  explicit ProviderAgent(const Catalogue_Builders& builders);
  ~ProviderAgent();
  void construct();
  void destruct();

  // m_BuildMutex held.
  bool isCacheTimedOut();
  // Starts the fetch thread; false when no thread could be made.
  bool startDataFetch();
  static void* DataFetch_Handler(void* agent);
  void runDataFetch();
  void buildAdapterPart();
  void buildSANPart();
  // Runs one builder step, logging instead of letting an exception escape.
  void runStep(void (*step)(ProviderAgent&), const char* name);

  void readDriverEvents(const char* tag, DeviceLog& holder);

  const Catalogue_Builders m_Builders;
  bool m_bLoggerDefault = false;  // the logger fell back to the fault-data file
};

}  // namespace cimple
