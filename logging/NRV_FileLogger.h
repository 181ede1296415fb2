// File sink of the provider logger: appends one line per message to the trace
// file while the log mode is 2 or 4, optionally only errors and critical ones.
//
// Contract: the logger passed in must outlive the sink.  The sink owns its
// stream and closes it on destruction, and unregisters itself from the logger.
// Its own mutex guards the stream, so open() may race with logging safely.
#pragma once

#include <cstdio>
#include <memory>
#include <mutex>
#include <string>

#include "logging/NRV_LoggerInterface.h"

namespace cimple {

class CLogger;

class NRV_FileLogger : public NRV_LoggerInterface {
 public:
  explicit NRV_FileLogger(CLogger& logger);
  NRV_FileLogger();  // bound to CLogger::instance()
  ~NRV_FileLogger() override;

  void log(int level, const char* file, unsigned line, const char* message) override;
  bool wants(int level) const override;
  // Reopens the stored path for appending when the mode writes the file.
  void start() override;
  // Closes the stream and forgets the path.
  void stop() override;
  // Empties the open file and keeps appending to it.
  void clear() override;

  // Opens `path` for appending and, only then, replaces the current file.
  // -1 when `path` is null, exists without owner write permission, cannot be
  // examined for a reason other than not existing, or cannot be opened.
  int open(const char* path, bool errors_only);

  std::string path() const;
  bool isOpen() const;
  bool errorsOnly() const;

 private:
  struct FileCloser {
    void operator()(std::FILE* f) const { std::fclose(f); }
  };
  using File = std::unique_ptr<std::FILE, FileCloser>;
  // The trace file at `path` opened for appending (emptied first when
  // `truncate`), or null when it cannot be opened or is not a regular file.
  static File openTraceFile(const char* path, bool truncate);
  // Whether log() writes a message of `level` now; m_Mutex held.
  bool keeps(int level) const;

  CLogger& m_Logger;
  mutable std::mutex m_Mutex;  // guards the three fields below
  std::string m_Path;
  File m_File;
  bool m_bErrorsOnly = false;
};

}  // namespace cimple
