#include "data/NRV_TargetMapping.h"

#include <new>

#include "access/RM_Api.h"
#include "data/NRV_DataLog.h"

namespace cimple {

namespace {

constexpr size_t kEntriesOffset = offsetof(HBA_FCPTARGETMAPPING, entry);
static_assert(kEntriesOffset == 8);
static_assert(sizeof(HBA_FCPSCSIENTRY) == 304);

constexpr HBA_UINT32 kInitialEntries = 256;
constexpr int kMaxAttempts = 3;

}  // namespace

std::unique_ptr<TargetMapping> TargetMapping::create(HBA_UINT32 capacity) {
  // The header is 8 bytes, not 4: the entries are 8-byte aligned.  A buffer
  // of 304 * n + 4 bytes would let the library write past its end.
  const size_t bytes = kEntriesOffset + size_t{capacity} * sizeof(HBA_FCPSCSIENTRY);
  std::unique_ptr<uint64_t[]> words(new (std::nothrow) uint64_t[(bytes + 7) / 8]);
  if (!words) return nullptr;
  std::unique_ptr<TargetMapping> mapping(new (std::nothrow) TargetMapping(std::move(words), capacity));
  if (!mapping) return nullptr;
  mapping->raw()->NumberOfEntries = capacity;
  return mapping;
}

HBA_UINT32 TargetMapping::reportedCount() const {
  return reinterpret_cast<const HBA_FCPTARGETMAPPING*>(m_Words.get())->NumberOfEntries;
}

size_t TargetMapping::size() const {
  const HBA_UINT32 count = reportedCount();
  return count < m_Capacity ? count : m_Capacity;
}

const HBA_FCPSCSIENTRY& TargetMapping::entry(size_t index) const {
  return reinterpret_cast<const HBA_FCPTARGETMAPPING*>(m_Words.get())->entry[index];
}

HBA_STATUS getFcpTargetMapping(HBA_HANDLE handle, std::unique_ptr<TargetMapping>& out) {
  out.reset();
  HBA_UINT32 entries = kInitialEntries;
  std::unique_ptr<TargetMapping> buffer;
  HBA_STATUS status = HBA_STATUS_ERROR;
  for (int attempt = 1;; ++attempt) {
    NRV_DATA_LOG(NRV_DBG, "To retry the HBA_GetFcpTargetMapping command");
    NRV_DATA_LOG(NRV_DBG, "Deleting the allocated memory");
    buffer.reset();
    buffer = TargetMapping::create(entries);
    if (!buffer) {
      NRV_DATA_LOG(NRV_CRIT, "Could not allocate memory..break ");
      return status;
    }
    status = HBA_GetFcpTargetMapping(handle, buffer->raw());
    if (status == HBA_STATUS_OK) {
      NRV_DATA_LOG(NRV_DBG, "All Ok ...break ");
      break;
    }
    if (status == HBA_STATUS_ERROR_STALE_DATA) {
      HBA_RefreshInformation(handle);
      NRV_DATA_LOG(NRV_DBG, "Refresh and retry ... ");
    } else if (status == HBA_STATUS_ERROR_MORE_DATA) {
      entries = buffer->reportedCount();
      NRV_DATA_LOG(NRV_DBG, "Increasing the buffer to = %d", static_cast<int>(entries));
    } else {
      buffer.reset();
      NRV_DATA_LOG(NRV_ERR, "Error hbaStatus=%d", static_cast<int>(status));
      return status;
    }
    if (attempt == kMaxAttempts) break;
  }
  out = std::move(buffer);
  NRV_DATA_LOG(NRV_DBG, "Successful target info fetched");
  return status;
}

}  // namespace cimple
