#include "logging/NRV_SysLogger.h"

#include <syslog.h>

#include "logging/CLogger.h"
#include "logging/NRV_LogLevels.h"

namespace cimple {

namespace {

// Indexed by level; -1 marks levels that never reach the system log.  The
// driver-log readers scan the system log, and every catalogue read logs at
// NRV_INFO: only problems belong there.
constexpr int kPriorities[kNrvLevelCount] = {
    -1,           // NRV_INVALID
    LOG_CRIT,     // NRV_CRIT
    LOG_WARNING,  // NRV_WARN
    LOG_ERR,      // NRV_ERR
    -1,           // NRV_INFO
    -1,           // NRV_DBG
};

}  // namespace

NRV_SysLogger::NRV_SysLogger(CLogger& logger) : m_Logger(logger) {
  m_Logger.registerSink(this);
  openlog(kNrvSyslogIdentity, LOG_NDELAY | LOG_NOWAIT, LOG_USER);
}

NRV_SysLogger::NRV_SysLogger() : NRV_SysLogger(CLogger::instance()) {}

NRV_SysLogger::~NRV_SysLogger() {
  m_Logger.unregisterSink(this);
  closelog();
}

int NRV_SysLogger::priorityFor(int level) {
  return (level >= 0 && level < kNrvLevelCount) ? kPriorities[level] : -1;
}

bool NRV_SysLogger::wants(int level) const { return priorityFor(level) >= 0; }

void NRV_SysLogger::log(int level, const char* file, unsigned line, const char* message) {
  const int priority = priorityFor(level);
  if (priority < 0 || message == nullptr) return;
  syslog(priority, "[%s]\n", message);
}

}  // namespace cimple
