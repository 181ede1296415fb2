// A bounded list of driver log lines (read from the system log by the agent)
// that the driver record logs serve as CIM log entries.
//
// Contract: once it holds its maximum count it refuses further lines until
// cleared.  Internally locked; lines are handed out only as copies.
#pragma once

#include <cstdint>
#include <mutex>
#include <string>
#include <vector>

namespace cimple {

class DeviceLog {
 public:
  explicit DeviceLog(int32_t max_count);
  DeviceLog(const DeviceLog&) = delete;
  DeviceLog& operator=(const DeviceLog&) = delete;

  // 1 when the list is full and `line` was dropped; 0 otherwise (an empty
  // line is ignored and also answers 0).
  int add(const std::string& line);

  std::vector<std::string> lines() const;
  size_t size() const;
  int32_t maxCount() const { return m_MaxCount; }
  void clear();

 private:
  const int32_t m_MaxCount;
  mutable std::mutex m_Mutex;  // guards m_Lines
  std::vector<std::string> m_Lines;
};

}  // namespace cimple
