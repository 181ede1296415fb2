#include "logging/DeviceLog.h"

#include "logging/Log.h"

namespace cimple {

DeviceLog::DeviceLog(int32_t max_count) : m_MaxCount(max_count > 0 ? max_count : 0) {}

int DeviceLog::add(const std::string& line) {
  NRV_LOG(NRV_DBG, "Handlelog ---  Prior to Inserting into DeviceLog Vector");
  std::lock_guard<std::mutex> lock(m_Mutex);
  if (m_Lines.size() >= static_cast<size_t>(m_MaxCount)) return 1;
  if (line.empty()) return 0;
  m_Lines.push_back(line);
  return 0;
}

std::vector<std::string> DeviceLog::lines() const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return m_Lines;
}

size_t DeviceLog::size() const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return m_Lines.size();
}

void DeviceLog::clear() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_Lines.clear();
}

}  // namespace cimple
