#include "logging/NRV_CIMLogger.h"

#include <cstdio>

#include "logging/CLogger.h"

namespace cimple {

namespace {

// Room for the message inside "[...]" and the terminating NUL.
constexpr int kMessageRoom = static_cast<int>(NRV_CIMLogEntry::kMessageSize) - 3;

}  // namespace

NRV_CIMLogger::NRV_CIMLogger(CLogger& logger, int32_t max_records)
    : m_Logger(logger), m_MaxRecords(max_records > 0 ? max_records : 0) {}

NRV_CIMLogger::NRV_CIMLogger(int32_t max_records)
    : NRV_CIMLogger(CLogger::instance(), max_records) {}

NRV_CIMLogger::~NRV_CIMLogger() { m_Logger.unregisterSink(this); }

bool NRV_CIMLogger::wants(int level) const {
  return level >= NRV_INVALID && level < NRV_INFO && nrv_mode_writes_records(m_Logger.getMode()) && m_MaxRecords != 0;
}

void NRV_CIMLogger::log(int level, const char* file, unsigned line, const char* message) {
  if (message == nullptr || !wants(level)) return;

  NRV_CIMLogEntry entry;
  entry.level = level;
  entry.timestamp = Datetime::now();
  std::snprintf(entry.message, sizeof entry.message, "[%.*s]", kMessageRoom, message);

  std::lock_guard<std::mutex> lock(m_Mutex);
  // The index wraps with the ring instead of counting forever, so it cannot
  // overflow however long the module runs.
  m_LastIndex = (m_LastIndex + 1) % m_MaxRecords;
  if (m_Records.size() < static_cast<size_t>(m_MaxRecords))
    m_Records.push_back(std::move(entry));
  else
    m_Records[static_cast<size_t>(m_LastIndex)] = std::move(entry);
}

void NRV_CIMLogger::clear() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_Records.clear();
  m_LastIndex = -1;
}

std::vector<NRV_CIMLogEntry> NRV_CIMLogger::records() const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return m_Records;
}

int32_t NRV_CIMLogger::lastIndex() const {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return m_LastIndex;
}

}  // namespace cimple
