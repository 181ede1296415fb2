// The logger's configuration data file ("dump file"): log mode, level, enabled
// and trace path, written when settings change and read back at start-up so
// they survive restarts.
//
// Contract: belongs to one CLogger, which must outlive it.  Every problem is
// reported through that logger and leaves the previous settings in force.
// Must not be used while the logger mutex is held (it logs).
#pragma once

#include <functional>
#include <mutex>
#include <string>

namespace cimple {

class CLogger;

// Where the file lives on a writable root and on a read-only one.
inline constexpr const char* kNrvDumpFile = "/etc/norvane_tavo_provider.dmp";
inline constexpr const char* kNrvReadOnlyRootDumpFile = "/var/log/norvane_tavo_provider.dmp";
// The fault-data trace file used when no configuration data file exists.
inline constexpr const char* kNrvFaultDataFile =
    "/opt/kelvar/platform/log/norvane_tavo_provider_ffdc.log";

// The fault-data file as it must be opened now (relocated under the sysroot).
std::string nrv_fault_data_file();

class NRV_LogDataFile {
 public:
  // Answers whether the root file system is mounted read-only.
  using ReadOnlyRootProbe = std::function<bool()>;

  explicit NRV_LogDataFile(CLogger& logger);
  NRV_LogDataFile(const NRV_LogDataFile&) = delete;
  NRV_LogDataFile& operator=(const NRV_LogDataFile&) = delete;

  // Replaces the read-only test (default: the root is writable).  The probe
  // may log.  Takes effect the next time the path is computed.
  void setReadOnlyRootProbe(ReadOnlyRootProbe probe);

  // The file's path, computed on first need and then kept.
  std::string path();

  // Writes "mode,level,enabled\n" followed by the trace path (no newline).
  void write();
  // False (and logs the system error at NRV_CRIT) when the file is not readable.
  bool checkAccess();
  // Reads the file and applies what it holds; see the .cpp for the steps.
  void read();

  // Start-up fallback: when the file is not readable, switches the logger to
  // errors-only file logging on the fault-data file and answers true.
  bool applyDefaultIfMissing();

 private:
  std::string computePath();
  std::string pathLocked();
  bool checkAccessLocked();

  CLogger& m_Logger;
  std::mutex m_Mutex;  // guards the fields below and serialises read/write
  ReadOnlyRootProbe m_ReadOnlyRoot;
  bool m_bDumpPathKnown = false;
  std::string m_DumpPath;
};

}  // namespace cimple
