// The logger's configuration data file ("dump file"): log mode, level, enabled
// and trace path, written when settings change and read back at start-up so
// they survive restarts.
//
// Contract: belongs to one CLogger, which must outlive it.  Every problem is
// reported through that logger and leaves the previous settings in force.
// Only a regular file is read, and only its first few kilobytes; a write
// replaces the file whole or not at all.  A file whose content was refused
// stays as the user left it until the settings are explicitly saved.
// Must not be used while the logger mutex is held (it logs).
#pragma once

#include <cstddef>
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

// Longest trace path the file carries; a longer one is refused, never cut.
inline constexpr size_t kNrvTracePathMax = 255;

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

  // Writes "mode,level,enabled\n" followed by the trace path (no newline),
  // unless the file already holds exactly that.  False (logged) when the
  // file could not be replaced.
  bool write();
  // The save at unload: like write(), but a file whose content read() refused
  // is left alone (true then).
  bool writeUnlessRejected();
  // read() found a file and refused what it holds.
  bool rejected();
  // False (and logs the system error at NRV_CRIT) when the file is not readable.
  bool checkAccess();
  // Reads the file and applies what it holds; see the .cpp for the steps.
  void read();

  // Forgets the path and the read-only probe (which may point into an
  // unloaded module) and frees what they held.
  void release();

  // Start-up fallback: when the file is not readable, switches the logger to
  // errors-only file logging on the fault-data file and answers true.
  bool applyDefaultIfMissing();

 private:
  std::string computePath();
  std::string pathLocked();
  bool checkAccessLocked();
  // False when an existing file was refused.
  bool readLocked();
  bool writeLocked();

  CLogger& m_Logger;
  std::mutex m_Mutex;  // guards the fields below and serialises read/write
  ReadOnlyRootProbe m_ReadOnlyRoot;
  bool m_bDumpPathKnown = false;
  std::string m_DumpPath;
  bool m_bRejected = false;
};

}  // namespace cimple
