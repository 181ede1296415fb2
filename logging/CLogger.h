// The provider logger: one process-wide object that formats every message of
// the module and hands it to the registered sinks (file, record ring, syslog).
//
// Contract: sinks are not owned; a registered sink must stay alive until it is
// unregistered (every sink of this folder unregisters itself when destroyed).
// One logger mutex serialises the sink list and all sink output; a sink must
// never log.  The settings (mode, level, enabled, errors-only) are atomic so
// any thread may read them while the configuration paths change them.
// instance() is never destroyed, so logging from static destructors is safe;
// it lives in static storage, and release() hands back what it allocated, so
// a module unloaded by its CIMOM leaves no logger behind.
#pragma once

#include <atomic>
#include <cstdarg>
#include <cstdint>
#include <mutex>
#include <string>
#include <vector>

#include "logging/Log.h"
#include "logging/NRV_LogDataFile.h"
#include "logging/NRV_LoggerInterface.h"

namespace cimple {

class NRV_FileLogger;

// Log modes: which of the file and record-log sinks act.  Syslog ignores them.
enum NRV_LogMode : int32_t {
  NRV_MODE_OFF = 0,          // file and record log off, file closed
  NRV_MODE_RECORDS = 1,      // record log only
  NRV_MODE_FILE = 2,         // file only
  NRV_MODE_NONE = 3,         // neither
  NRV_MODE_FILE_RECORDS = 4, // both
};
inline constexpr int32_t kNrvMaxLogMode = 4;

constexpr bool nrv_mode_writes_file(int32_t mode) {
  return mode == NRV_MODE_FILE || mode == NRV_MODE_FILE_RECORDS;
}
constexpr bool nrv_mode_writes_records(int32_t mode) {
  return mode == NRV_MODE_RECORDS || mode == NRV_MODE_FILE_RECORDS;
}

class CLogger {
 public:
  // A logger with the defaults (mode 0, level 0, disabled, no sinks).  The
  // module uses instance(); separate loggers exist for tests.
  CLogger();
  CLogger(const CLogger&) = delete;
  CLogger& operator=(const CLogger&) = delete;
  ~CLogger() = default;

  // The process-wide logger, created on first use and never destroyed.
  static CLogger& instance();

  // The log call: formats without length limit and hands the text to the sinks.
  // `line` may be null (line 0).  Never fails.
  void log(const char* file, const int* line, int level, const char* format, ...)
      __attribute__((format(printf, 5, 6)));
  void vlog(const char* file, const int* line, int level, const char* format, va_list args);
  // Whether a message of `level` would reach any sink now (see vlog).
  bool wants(int level) const;

  // 1 when `sink` was appended, 0 when it was already registered (or null).
  // A registered NRV_SysLogger becomes the designated syslog sink.
  int registerSink(NRV_LoggerInterface* sink);
  // Removes every occurrence; 1 when it was registered, else 0.
  int unregisterSink(NRV_LoggerInterface* sink);
  void unregisterAll();
  // Unregisters every sink and frees the sink list and the data file's
  // remembered path (computed again on next need).  For the last user of the
  // module (the agent's destruction); the logger stays usable.
  void release();
  size_t sinkCount() const;

  // Stores the mode, then starts every sink (non-zero) or stops it (0).
  void setMode(int32_t mode);
  int32_t getMode() const { return m_Mode.load(std::memory_order_relaxed); }
  // Stores the mode without telling the sinks (the fault-data default).
  void setModeQuietly(int32_t mode) { m_Mode.store(mode, std::memory_order_relaxed); }

  // Stored only when 1 <= level <= 5.  Informational: sinks filter by their own rules.
  void setLevel(int32_t level);
  int32_t getLevel() const { return m_Level.load(std::memory_order_relaxed); }

  void enable() { m_Enabled.store(1, std::memory_order_relaxed); }
  void disable() { m_Enabled.store(0, std::memory_order_relaxed); }
  bool isEnabled() const { return m_Enabled.load(std::memory_order_relaxed) != 0; }
  void setEnabledValue(int32_t value) { m_Enabled.store(value, std::memory_order_relaxed); }

  // Handed to the file sink whenever it opens a file.
  void setErrorsOnly() { m_ErrorsOnly.store(true, std::memory_order_relaxed); }
  void clearErrorsOnly() { m_ErrorsOnly.store(false, std::memory_order_relaxed); }
  bool isErrorsOnly() const { return m_ErrorsOnly.load(std::memory_order_relaxed); }

  // Calls clear on every sink.
  void clearAllLogs();

  // Opens `path` in the first registered file sink with the errors-only flag.
  // 0 on success; -1 when it cannot be opened, is longer than the data file
  // can carry (kNrvTracePathMax) or no file sink is registered.
  int setTracePath(const std::string& path);
  // The first file sink's path; empty when none is open or none is registered.
  std::string tracePath() const;

  // The configuration data file ("dump file") of this logger.
  NRV_LogDataFile& dataFile() { return m_DataFile; }
  void readConfigDataFile() { m_DataFile.read(); }
  bool writeConfigDataFile() { return m_DataFile.write(); }
  bool checkDumpFileAccess() { return m_DataFile.checkAccess(); }

 private:
  // Runs `fn` on the first registered file sink under the logger mutex.
  template <class Fn>
  auto withFileSink(Fn fn) const;

  std::atomic<int32_t> m_Mode{0};
  std::atomic<int32_t> m_Level{0};
  std::atomic<int32_t> m_Enabled{0};
  std::atomic<bool> m_ErrorsOnly{false};

  mutable std::mutex m_Mutex;  // the logger mutex
  std::vector<NRV_LoggerInterface*> m_Sinks;
  NRV_LoggerInterface* m_SysLogSink = nullptr;  // guarded by m_Mutex

  NRV_LogDataFile m_DataFile;
};

}  // namespace cimple

// Logs through a given logger with the call site's file and line.
#define NRV_LOG_TO(logger, level, ...)                                       \
  do {                                                                       \
    static const int nrv_log_line_ = __LINE__;                               \
    (logger).log(::cimple::nrv_base_name(__FILE__), &nrv_log_line_, (level), \
                 __VA_ARGS__);                                               \
  } while (0)
