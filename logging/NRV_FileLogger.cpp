#include "logging/NRV_FileLogger.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

#include "framework/Datetime.h"
#include "logging/CLogger.h"
#include "logging/NRV_LogLevels.h"

namespace cimple {

// Opens `path` for appending when it is, or becomes, a regular file.  A FIFO
// would take the lines until its buffer filled and then block every logging
// thread with the sink's lock held; a device or a directory is no trace file.
NRV_FileLogger::File NRV_FileLogger::openTraceFile(const char* path, bool truncate) {
  const int flags = O_RDWR | O_CREAT | O_APPEND | O_NONBLOCK | O_CLOEXEC | (truncate ? O_TRUNC : 0);
  const int fd = ::open(path, flags, 0644);
  if (fd < 0) return nullptr;
  struct stat st;
  if (::fstat(fd, &st) != 0 || !S_ISREG(st.st_mode) || ::fcntl(fd, F_SETFL, O_RDWR | O_APPEND) != 0) {
    ::close(fd);
    return nullptr;
  }
  File file(::fdopen(fd, "a+"));
  if (!file) ::close(fd);
  return file;
}

NRV_FileLogger::NRV_FileLogger(CLogger& logger) : m_Logger(logger) {}

NRV_FileLogger::NRV_FileLogger() : NRV_FileLogger(CLogger::instance()) {}

NRV_FileLogger::~NRV_FileLogger() { m_Logger.unregisterSink(this); }

bool NRV_FileLogger::keeps(int level) const {
  return nrv_level_name(level) != nullptr && nrv_mode_writes_file(m_Logger.getMode()) && m_File &&
         (!m_bErrorsOnly || level == NRV_ERR || level == NRV_CRIT);
}

bool NRV_FileLogger::wants(int level) const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return keeps(level);
}

void NRV_FileLogger::log(int level, const char* file, unsigned line, const char* message) {
  std::lock_guard<std::mutex> lock(m_Mutex);
  if (!keeps(level)) return;
  const char* level_name = nrv_level_name(level);
  const std::string stamp = Datetime::now().ascii(true);
  // The thread id goes out as an unsigned int to match "%u"; the trailing 'l'
  // belongs to the established line format that log readers expect.
  std::fprintf(m_File.get(), "[threadid =%ul] [%s] [%s:%u][%s] %s\n",
               static_cast<unsigned>(gettid()), stamp.c_str(), file, line, level_name,
               message != nullptr ? message : "");
  std::fflush(m_File.get());
}

void NRV_FileLogger::start() {
  if (!nrv_mode_writes_file(m_Logger.getMode())) return;
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_File.reset();
  if (!m_Path.empty()) m_File = openTraceFile(m_Path.c_str(), false);
}

void NRV_FileLogger::stop() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  if (!m_File) return;
  m_File.reset();
  m_Path.clear();
}

void NRV_FileLogger::clear() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  if (!m_File) return;
  m_File.reset();
  m_File = openTraceFile(m_Path.c_str(), true);
}

int NRV_FileLogger::open(const char* path, bool errors_only) {
  if (path == nullptr) return -1;
  struct stat st;
  if (::stat(path, &st) == 0) {
    if ((st.st_mode & S_IWUSR) == 0) return -1;
  } else if (errno != ENOENT) {
    return -1;
  }
  File opened = openTraceFile(path, false);
  if (!opened) return -1;
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_File = std::move(opened);
  m_Path = path;
  m_bErrorsOnly = errors_only;
  return 0;
}

std::string NRV_FileLogger::path() const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return m_Path;
}

bool NRV_FileLogger::isOpen() const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return static_cast<bool>(m_File);
}

bool NRV_FileLogger::errorsOnly() const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return m_bErrorsOnly;
}

}  // namespace cimple
