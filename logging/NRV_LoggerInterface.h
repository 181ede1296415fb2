// Abstract sink of the provider logger: the logger hands every message to each
// registered sink, and forwards mode changes and "clear all logs" to them.
//
// Contract: the logger calls log(), start(), stop() and clear() with the
// logger mutex held, so a sink must never log (the mutex is not recursive).
// The logger does not own its sinks; a sink unregisters itself when destroyed.
#pragma once

#include <string>

namespace cimple {

class NRV_LoggerInterface {
 public:
  NRV_LoggerInterface() = default;
  NRV_LoggerInterface(const NRV_LoggerInterface&) = delete;
  NRV_LoggerInterface& operator=(const NRV_LoggerInterface&) = delete;
  virtual ~NRV_LoggerInterface() = default;

  // One formatted message from `file`:`line` at `level`; `message` may be null.
  virtual void log(int level, const char* file, unsigned line, const char* message) = 0;
  // False when log() would drop every message of `level` as things stand; the
  // logger then skips formatting it.  Called with the logger mutex held.
  virtual bool wants(int level) const {
    (void)level;
    return true;
  }
  // The logger's mode became non-zero.
  virtual void start() = 0;
  // The logger's mode became 0.
  virtual void stop() = 0;
  // The clear-all-logs operation.
  virtual void clear() = 0;
};

}  // namespace cimple
