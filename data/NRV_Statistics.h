// Statistics objects of adapters and ports.  Adapter statistics carry no data;
// port statistics hold the 25 counters of the port statistics blob.
//
// Contract: a PortStatistics is read completely by its constructor, which
// throws std::runtime_error when the blob cannot be read (the port then keeps
// its previous object).  Counters the library did not deliver hold
// kStatisticNotAvailable.
#pragma once

#include <stdint.h>

#include <array>
#include <string>

namespace cimple {

class AdapterStatistics {
 public:
  AdapterStatistics() = default;
  AdapterStatistics(const AdapterStatistics&) = delete;
  AdapterStatistics& operator=(const AdapterStatistics&) = delete;
  virtual ~AdapterStatistics();
};

class FCAdapterStatistics : public AdapterStatistics {};
class NICAdapterStatistics : public AdapterStatistics {};
class iSCSIAdapterStatistics : public AdapterStatistics {};
class FCoEAdapterStatistics : public AdapterStatistics {};

inline constexpr uint64_t kStatisticNotAvailable = 4294967295ULL;
inline constexpr int kPortCounterCount = 25;

class PortStatistics {
 public:
  // Reads the statistics blob of the port named by `portName` (16 hex digits).
  explicit PortStatistics(const std::string& portName);
  PortStatistics(const PortStatistics&) = delete;
  PortStatistics& operator=(const PortStatistics&) = delete;
  virtual ~PortStatistics();

  // Counter n, 1 to 25 in declaration order; kStatisticNotAvailable for any
  // other n.
  uint64_t counter(int n) const;
  const std::array<uint64_t, kPortCounterCount>& counters() const { return m_Counters; }

  // The counter (1..25) fed by statistic `number`, or 0 for none.
  static int counterOf(uint32_t number);

 private:
  std::array<uint64_t, kPortCounterCount> m_Counters;
};

class FCPortStatistics : public PortStatistics {
 public:
  using PortStatistics::PortStatistics;
};
class NICPortStatistics : public PortStatistics {
 public:
  using PortStatistics::PortStatistics;
};
class iSCSIPortStatistics : public PortStatistics {
 public:
  using PortStatistics::PortStatistics;
};
class FCoEPortStatistics : public PortStatistics {
 public:
  using PortStatistics::PortStatistics;
};

}  // namespace cimple
