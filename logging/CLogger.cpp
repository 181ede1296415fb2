#include "logging/CLogger.h"

#include <algorithm>
#include <cstdio>
#include <new>

#include "logging/NRV_FileLogger.h"
#include "logging/NRV_SysLogger.h"

namespace cimple {

namespace {

// vsnprintf into a buffer that grows until the whole text fits.
std::string format_message(const char* format, va_list args) {
  if (format == nullptr) return std::string();
  char small[512];
  va_list copy;
  va_copy(copy, args);
  int needed = std::vsnprintf(small, sizeof small, format, copy);
  va_end(copy);
  if (needed < 0) return std::string();
  if (static_cast<size_t>(needed) < sizeof small) return std::string(small, needed);
  std::string text(static_cast<size_t>(needed) + 1, '\0');
  va_copy(copy, args);
  std::vsnprintf(text.data(), text.size(), format, copy);
  va_end(copy);
  text.resize(static_cast<size_t>(needed));
  return text;
}

}  // namespace

CLogger::CLogger() : m_DataFile(*this) {}

CLogger& CLogger::instance() {
  // Never destroyed: modules and static destructors may log until the end.
  // Kept in the module's static storage rather than on the heap, so that a
  // module unloaded after release() leaves nothing allocated behind.
  alignas(CLogger) static unsigned char storage[sizeof(CLogger)];
  static CLogger* const logger = new (storage) CLogger;
  return *logger;
}

void CLogger::log(const char* file, const int* line, int level, const char* format, ...) {
  va_list args;
  va_start(args, format);
  vlog(file, line, level, format, args);
  va_end(args);
}

void CLogger::vlog(const char* file, const int* line, int level, const char* format,
                   va_list args) {
  const std::string message = format_message(format, args);
  const char* source = file != nullptr ? file : "";
  const unsigned at = line != nullptr ? static_cast<unsigned>(*line) : 0u;

  // The mutex is taken on the disabled path too: without it a syslog sink
  // being destroyed by another thread could be called after its death.
  std::lock_guard<std::mutex> lock(m_Mutex);
  if (!isEnabled() && m_SysLogSink != nullptr) {
    m_SysLogSink->log(level, source, at, message.c_str());
    return;
  }
  for (NRV_LoggerInterface* sink : m_Sinks) sink->log(level, source, at, message.c_str());
}

bool CLogger::wants(int level) const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  if (!isEnabled() && m_SysLogSink != nullptr) return m_SysLogSink->wants(level);
  return std::any_of(m_Sinks.begin(), m_Sinks.end(), [level](const NRV_LoggerInterface* s) { return s->wants(level); });
}

int CLogger::registerSink(NRV_LoggerInterface* sink) {
  if (sink == nullptr) return 0;
  std::lock_guard<std::mutex> lock(m_Mutex);
  if (std::find(m_Sinks.begin(), m_Sinks.end(), sink) != m_Sinks.end()) return 0;
  m_Sinks.push_back(sink);
  if (dynamic_cast<NRV_SysLogger*>(sink) != nullptr) m_SysLogSink = sink;
  return 1;
}

int CLogger::unregisterSink(NRV_LoggerInterface* sink) {
  std::lock_guard<std::mutex> lock(m_Mutex);
  const auto removed = std::erase(m_Sinks, sink);
  // A designated syslog sink that is no longer registered must not be called.
  if (m_SysLogSink == sink) m_SysLogSink = nullptr;
  return removed > 0 ? 1 : 0;
}

void CLogger::unregisterAll() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_Sinks.clear();
  m_SysLogSink = nullptr;
}

void CLogger::release() {
  {
    std::lock_guard<std::mutex> lock(m_Mutex);
    std::vector<NRV_LoggerInterface*>().swap(m_Sinks);
    m_SysLogSink = nullptr;
  }
  m_DataFile.release();
}

size_t CLogger::sinkCount() const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return m_Sinks.size();
}

void CLogger::setMode(int32_t mode) {
  m_Mode.store(mode, std::memory_order_relaxed);
  std::lock_guard<std::mutex> lock(m_Mutex);
  for (NRV_LoggerInterface* sink : m_Sinks) {
    if (mode != 0)
      sink->start();
    else
      sink->stop();
  }
}

void CLogger::setLevel(int32_t level) {
  if (level >= NRV_CRIT && level <= NRV_DBG) m_Level.store(level, std::memory_order_relaxed);
}

void CLogger::clearAllLogs() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  for (NRV_LoggerInterface* sink : m_Sinks) sink->clear();
}

template <class Fn>
auto CLogger::withFileSink(Fn fn) const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  for (NRV_LoggerInterface* sink : m_Sinks) {
    if (auto* file = dynamic_cast<NRV_FileLogger*>(sink)) return fn(file);
  }
  return fn(static_cast<NRV_FileLogger*>(nullptr));
}

int CLogger::setTracePath(const std::string& path) {
  if (path.size() > kNrvTracePathMax) return -1;
  const bool errorsOnly = isErrorsOnly();
  return withFileSink([&](NRV_FileLogger* file) {
    return file != nullptr ? file->open(path.c_str(), errorsOnly) : -1;
  });
}

std::string CLogger::tracePath() const {
  return withFileSink([](NRV_FileLogger* file) {
    return file != nullptr ? file->path() : std::string();
  });
}

}  // namespace cimple

bool cimple::nrv_log_wanted(int level) { return CLogger::instance().wants(level); }

void cimple::nrv_log(const char* file, const int* line, int level, const char* format, ...) {
  va_list args;
  va_start(args, format);
  CLogger::instance().vlog(file, line, level, format, args);
  va_end(args);
}
