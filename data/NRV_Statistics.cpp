#include "data/NRV_Statistics.h"

#include <string.h>

#include <stdexcept>
#include <vector>

#include "access/NRV_Common.h"
#include "access/RM_Api.h"
#include "data/NRV_DataLog.h"

namespace cimple {

namespace {

// Statistic number -> counter (1..25), in the order the blob is read.
struct CounterOf {
  uint16_t number;
  uint8_t counter;
};
constexpr CounterOf kCounters[] = {
    {1025, 1},  {1026, 18}, {1027, 19}, {1028, 16}, {1029, 17}, {1030, 2},  {1031, 4},
    {1032, 3},  {1033, 5},  {1036, 6},  {1037, 7},  {1038, 8},  {1039, 9},  {1040, 10},
    {1041, 11}, {1042, 12}, {1043, 13}, {1044, 14}, {1045, 15}, {1046, 23}, {1047, 21},
    {1048, 20}, {1057, 24}, {1058, 22}, {1059, 25},
};
static_assert(sizeof kCounters / sizeof kCounters[0] == kPortCounterCount);

}  // namespace

AdapterStatistics::~AdapterStatistics() = default;

int PortStatistics::counterOf(uint32_t number) {
  for (const CounterOf& c : kCounters)
    if (c.number == number) return c.counter;
  return 0;
}

PortStatistics::PortStatistics(const std::string& portName) {
  m_Counters.fill(kStatisticNotAvailable);
  HBA_NAME name{};
  if (string2HBAName(&name, portName.c_str()) != 1) {
    NRV_DATA_LOG(NRV_DBG, "NRV_MethodWrapper::string2HBAName failed");
    throw std::runtime_error("invalid port name");
  }
  std::vector<unsigned char> blob(RM_PORT_STATISTICS_SIZE);
  HBA_UINT32 size = RM_PORT_STATISTICS_SIZE;
  const RM_STATUS status = RM_GetPortStatistics(name, blob.data(), &size);
  if (status != RM_STATUS_SUCCESS) {
    NRV_DATA_LOG(NRV_ERR, "ERROR: RM_GetPortStatistics call failed (%d)", static_cast<int>(status));
    throw std::runtime_error("port statistics not available");
  }
  for (const CounterOf& c : kCounters) {
    HBA_UINT16 length = 0;
    HBA_UINT32 st = RM_STATUS_ERROR;
    const void* value = RM_GetAttributeValue(blob.data(), c.number, &length, &st);
    if (value == nullptr || st != RM_STATUS_SUCCESS) continue;
    uint64_t v = 0;
    memcpy(&v, value, length < sizeof v ? length : sizeof v);
    if (v == ~uint64_t{0}) continue;
    if (c.number > 1024 && c.number < 1060) m_Counters[c.counter - 1] = v;
  }
}

PortStatistics::~PortStatistics() = default;

uint64_t PortStatistics::counter(int n) const {
  if (n < 1 || n > kPortCounterCount) return kStatisticNotAvailable;
  return m_Counters[static_cast<size_t>(n - 1)];
}

}  // namespace cimple
