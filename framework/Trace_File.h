// The framework's own trace file, "$CIMPLE_HOME/.cimple/messages", kept apart
// from the module logger so that adapter and conversion traces survive even
// when the module's logging is not configured.
//
// Contract: configured once per process, on the first message.  Nothing is
// written unless CIMPLE_HOME is set and "$CIMPLE_HOME/.cimplerc" holds a
// valid LOG_LEVEL line.  Writers in several processes are serialised by an
// exclusive fcntl lock on "messages.lock"; never fails, never throws.
#pragma once

namespace cimple {

enum Log_Level : int { LL_FATAL = 0, LL_ERR = 1, LL_WARN = 2, LL_INFO = 3, LL_DBG = 4 };

// "FATAL", "ERR", "WARN", "INFO", "DBG".
const char* log_level_name(Log_Level level);

void trace_log(Log_Level level, const char* file, int line, const char* format, ...)
    __attribute__((format(printf, 4, 5)));

constexpr const char* trace_base_name(const char* path) {
  const char* base = path;
  for (const char* p = path; *p; ++p)
    if (*p == '/') base = p + 1;
  return base;
}

}  // namespace cimple

#define CIMPLE_LOG(level, ...) ::cimple::trace_log(level, ::cimple::trace_base_name(__FILE__), __LINE__, __VA_ARGS__)
#define CIMPLE_DBG(...) CIMPLE_LOG(::cimple::LL_DBG, __VA_ARGS__)
#define CIMPLE_INFO(...) CIMPLE_LOG(::cimple::LL_INFO, __VA_ARGS__)
#define CIMPLE_WARN(...) CIMPLE_LOG(::cimple::LL_WARN, __VA_ARGS__)
#define CIMPLE_ERR(...) CIMPLE_LOG(::cimple::LL_ERR, __VA_ARGS__)
