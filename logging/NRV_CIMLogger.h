// Record-log sink of the provider logger: keeps the most recent errors,
// warnings and critical messages in memory for the provider's CIM record log.
//
// Contract: the logger passed in must outlive the sink; the sink unregisters
// itself when destroyed.  Records are handed out only as copies, under the
// sink's own mutex, so readers never see a record being overwritten.
#pragma once

#include <cstdint>
#include <mutex>
#include <vector>

#include "framework/Datetime.h"
#include "logging/NRV_LoggerInterface.h"

namespace cimple {

class CLogger;

// One record of the ring.
struct NRV_CIMLogEntry {
  static constexpr size_t kMessageSize = 200;

  int32_t level = 0;
  Datetime timestamp;  // when the record was made
  // "[message]", NUL-terminated; a longer message is cut so the closing
  // bracket still fits.
  char message[kMessageSize] = {};
};

class NRV_CIMLogger : public NRV_LoggerInterface {
 public:
  static constexpr int32_t kDefaultMaxRecords = 1024;

  explicit NRV_CIMLogger(CLogger& logger, int32_t max_records = kDefaultMaxRecords);
  // Bound to CLogger::instance().
  explicit NRV_CIMLogger(int32_t max_records = kDefaultMaxRecords);
  ~NRV_CIMLogger() override;

  // Records NRV_INVALID..NRV_ERR messages while the mode is 1 or 4.  Once the
  // ring is full the oldest slot is overwritten, so the vector is in slot
  // order, not time order.
  void log(int level, const char* file, unsigned line, const char* message) override;
  bool wants(int level) const override;
  void start() override {}
  void stop() override {}
  // Empties the ring.
  void clear() override;

  // A copy of the ring in slot order.
  std::vector<NRV_CIMLogEntry> records() const;
  // Slot of the most recent record, -1 when empty.
  int32_t lastIndex() const;
  int32_t maxRecords() const { return m_MaxRecords; }

 private:
  CLogger& m_Logger;
  const int32_t m_MaxRecords;
  mutable std::mutex m_Mutex;  // guards the two fields below
  int32_t m_LastIndex = -1;
  std::vector<NRV_CIMLogEntry> m_Records;
};

}  // namespace cimple
