#include "logging/NRV_FileLogger.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

#include "framework/Datetime.h"
#include "logging/CLogger.h"
#include "logging/NRV_LogLevels.h"

namespace cimple {

NRV_FileLogger::NRV_FileLogger(CLogger& logger) : m_Logger(logger) {}

NRV_FileLogger::NRV_FileLogger() : NRV_FileLogger(CLogger::instance()) {}

NRV_FileLogger::~NRV_FileLogger() { m_Logger.unregisterSink(this); }

void NRV_FileLogger::log(int level, const char* file, unsigned line, const char* message) {
  const char* level_name = nrv_level_name(level);
  if (level_name == nullptr || !nrv_mode_writes_file(m_Logger.getMode())) return;
  std::lock_guard<std::mutex> lock(m_Mutex);
  if (!m_File) return;
  if (m_bErrorsOnly && level != NRV_ERR && level != NRV_CRIT) return;
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
  if (!m_Path.empty()) m_File.reset(std::fopen(m_Path.c_str(), "a+"));
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
  File truncate(std::fopen(m_Path.c_str(), "w"));
  truncate.reset();
  m_File.reset(std::fopen(m_Path.c_str(), "a+"));
}

int NRV_FileLogger::open(const char* path, bool errors_only) {
  if (path == nullptr) return -1;
  struct stat st;
  if (::stat(path, &st) == 0) {
    if ((st.st_mode & S_IWUSR) == 0) return -1;
  } else if (errno != ENOENT) {
    return -1;
  }
  File opened(std::fopen(path, "a+"));
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
