// The one call through which the whole module logs: NRV_LOG(level, fmt, ...).
// It records the source file (without directory) and line of the call site.
#pragma once

namespace cimple {

enum NRV_LogLevel : int {
  NRV_INVALID = 0,
  NRV_CRIT = 1,
  NRV_WARN = 2,
  NRV_ERR = 3,
  NRV_INFO = 4,
  NRV_DBG = 5,
};

// Formats the message and hands it to the logger's sinks.  `line` is the
// address of the caller's line number.  Never fails; never throws.
void nrv_log(const char* file, const int* line, int level, const char* format, ...)
    __attribute__((format(printf, 4, 5)));

// Whether a message of `level` would be kept anywhere: NRV_LOG neither
// evaluates its arguments nor formats a message nobody keeps.
bool nrv_log_wanted(int level);

constexpr const char* nrv_base_name(const char* path) {
  const char* base = path;
  for (const char* p = path; *p; ++p)
    if (*p == '/') base = p + 1;
  return base;
}

}  // namespace cimple

#define NRV_LOG(level, ...)                                                  \
  do {                                                                       \
    static const int nrv_log_line_ = __LINE__;                               \
    if (::cimple::nrv_log_wanted(level))                                     \
      ::cimple::nrv_log(::cimple::nrv_base_name(__FILE__), &nrv_log_line_,  \
                        (level), __VA_ARGS__);                               \
  } while (0)
