// Helpers of the access tests: capture of log messages through a logger sink,
// and running one test of this executable in a child process with its own
// library search path (the dynamic loader fixes the path at process start).
#pragma once

#include <mutex>
#include <string>
#include <vector>

#include "logging/CLogger.h"
#include "logging/NRV_LoggerInterface.h"

namespace nrv_test {

// Registers itself with the process logger for its lifetime.
class LogCapture : public cimple::NRV_LoggerInterface {
 public:
  struct Entry {
    int level;
    std::string file;
    std::string message;
  };
  LogCapture() { cimple::CLogger::instance().registerSink(this); }
  ~LogCapture() override { cimple::CLogger::instance().unregisterSink(this); }

  void log(int level, const char* file, unsigned, const char* message) override {
    std::lock_guard<std::mutex> lock(m_mutex);
    m_entries.push_back({level, file ? file : "", message ? message : ""});
  }
  void start() override {}
  void stop() override {}
  void clear() override {}

  std::vector<Entry> entries() const {
    std::lock_guard<std::mutex> lock(m_mutex);
    return m_entries;
  }
  // Number of messages beginning with `prefix` (at `level` unless -1).
  int count(const std::string& prefix, int level = -1) const {
    int n = 0;
    for (const Entry& e : entries())
      if (e.message.rfind(prefix, 0) == 0 && (level < 0 || e.level == level)) ++n;
    return n;
  }
  // Number of messages beginning with `prefix` that also contain `needle`.
  int count(const std::string& prefix, const std::string& needle, int level = -1) const {
    int n = 0;
    for (const Entry& e : entries())
      if (e.message.rfind(prefix, 0) == 0 && e.message.find(needle) != std::string::npos &&
          (level < 0 || e.level == level))
        ++n;
    return n;
  }
  bool contains(const std::string& text) const {
    for (const Entry& e : entries())
      if (e.message == text) return true;
    return false;
  }
  void reset() {
    std::lock_guard<std::mutex> lock(m_mutex);
    m_entries.clear();
  }

 private:
  mutable std::mutex m_mutex;
  std::vector<Entry> m_entries;
};

// Runs "--gtest_filter=<test>" of this executable (disabled tests included)
// with LD_LIBRARY_PATH = `libraryPath` and returns its exit status (0 = all
// passed; -1 when it could not be run).
int runInChild(const std::string& test, const std::string& libraryPath);

// Directory of a stub library set built beside the tests ("lrm", "hba2", ...).
std::string stubDir(const char* name);

}  // namespace nrv_test
