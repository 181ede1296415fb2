// Syslog sink of the provider logger: passes critical, warning and error
// messages to the system log under "[NRV][CIM][TAVO]".  It is the only sink
// that still hears the module while logging is disabled.
//
// Contract: registers itself with the logger and opens the system log when
// constructed; unregisters and closes it when destroyed.  The logger passed in
// must outlive the sink.  Only one should exist at a time (syslog is global).
#pragma once

#include "logging/NRV_LoggerInterface.h"

namespace cimple {

class CLogger;

inline constexpr const char* kNrvSyslogIdentity = "[NRV][CIM][TAVO]";

class NRV_SysLogger : public NRV_LoggerInterface {
 public:
  explicit NRV_SysLogger(CLogger& logger);
  NRV_SysLogger();  // bound to CLogger::instance()
  ~NRV_SysLogger() override;

  void log(int level, const char* file, unsigned line, const char* message) override;
  bool wants(int level) const override;
  void start() override {}
  void stop() override {}
  void clear() override {}

  // The syslog priority for a level, or -1 for a level that is not passed on
  // (NRV_INVALID, NRV_INFO, NRV_DBG and anything outside the defined levels).
  static int priorityFor(int level);

 private:
  CLogger& m_Logger;
};

}  // namespace cimple
