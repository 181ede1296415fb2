// The HBA API's FCP target mapping of one adapter handle: a buffer holding a
// 32-bit entry count and, from byte 8, the FCP SCSI entries.
//
// Contract: a TargetMapping owns its buffer; entry(i) is valid for i below
// size(), which never exceeds the room the buffer was made for, whatever
// count the library wrote into it.
#pragma once

#include <stddef.h>
#include <stdint.h>
#include <time.h>  // hbaapi.h uses struct tm without including it

#include <hbaapi.h>

#include <memory>

namespace cimple {

class TargetMapping {
 public:
  TargetMapping(const TargetMapping&) = delete;
  TargetMapping& operator=(const TargetMapping&) = delete;

  // A buffer with room for `capacity` entries and its count set to it; null
  // when it cannot be allocated.
  static std::unique_ptr<TargetMapping> create(HBA_UINT32 capacity);

  HBA_FCPTARGETMAPPING* raw() { return reinterpret_cast<HBA_FCPTARGETMAPPING*>(m_Words.get()); }
  // The count the library wrote (may exceed the room after status 7).
  HBA_UINT32 reportedCount() const;
  // Entries actually held.
  size_t size() const;
  const HBA_FCPSCSIENTRY& entry(size_t index) const;

 private:
  TargetMapping(std::unique_ptr<uint64_t[]> words, HBA_UINT32 capacity)
      : m_Words(std::move(words)), m_Capacity(capacity) {}

  std::unique_ptr<uint64_t[]> m_Words;  // 8-byte aligned, as the entries need
  HBA_UINT32 m_Capacity;
};

// Retrieves the mapping of `handle`, growing the buffer when the library asks
// for more room and refreshing on stale data, at most three attempts.  On 0
// `out` holds the mapping; after three attempts ending in 7 or 8 it holds the
// last buffer and that status is returned; on any other status `out` is null.
HBA_STATUS getFcpTargetMapping(HBA_HANDLE handle, std::unique_ptr<TargetMapping>& out);

}  // namespace cimple
