// Helpers shared by the management library's handlers: finding the function a
// name addresses, copying texts and records into caller buffers, and the
// library's own status numbers beyond the ones the interface fixes.
#pragma once

#include <cstring>
#include <optional>
#include <string>
#include <vector>

#include "sim/RmDispatch.h"

namespace nrvsim::rm {

// Statuses of this library beyond RM_Types.h (texts in RM_StatusString).
enum : RM_STATUS {
  kStatusNoSuchAdapter = 3,  // no local function has this name
  kStatusBadArgument = 4,    // null pointer or malformed argument
  kStatusNotFound = 5,       // target, LUN, session, portal or parameter unknown
  kStatusBadValue = 6,       // value out of range, or name already in use
  kStatusCheckCondition = 9, // SCSI check condition; sense data returned
};

inline Wwn to_wwn(const HBA_NAME& n) {
  Wwn w{};
  std::memcpy(w.data(), n.wwn, 8);
  return w;
}
inline HBA_NAME to_name(const Wwn& w) {
  HBA_NAME n{};
  std::memcpy(n.wwn, w.data(), 8);
  return n;
}

// Runs f(Site&, FunctionRef) under the site lock for the function `name`
// addresses; kStatusNoSuchAdapter when there is none.
template <class F>
RM_STATUS on_function(HBA_NAME name, F&& f) {
  return SimSite::instance().with([&](Site& site) -> RM_STATUS {
    auto ref = find_function(site, to_wwn(name));
    if (!ref) return kStatusNoSuchAdapter;
    return f(site, *ref);
  });
}

// NUL-terminated copy cut to `size` bytes (size includes the terminator).
inline void put_text(char* dst, size_t size, const std::string& s) {
  if (dst == nullptr || size == 0) return;
  const size_t n = s.size() < size - 1 ? s.size() : size - 1;
  std::memcpy(dst, s.data(), n);
  dst[n] = '\0';
}

// Bounded read of a caller's NUL-terminated text.
inline std::string get_text(const char* src, size_t max) {
  if (src == nullptr) return {};
  return std::string(src, strnlen(src, max));
}

// Buffer-size protocol for a fixed record or a byte image: copies when *size
// is large enough, else answers 7 with the size needed.
inline RM_STATUS deliver_bytes(const void* data, size_t length, void* buffer, HBA_UINT32* size) {
  if (buffer == nullptr || size == nullptr) return kStatusBadArgument;
  if (*size < length) {
    *size = static_cast<HBA_UINT32>(length);
    return RM_STATUS_ERROR_BUFFER_TOO_SMALL;
  }
  std::memcpy(buffer, data, length);
  *size = static_cast<HBA_UINT32>(length);
  return RM_STATUS_SUCCESS;
}

// A list answered as "u32 count, padding to `header`, entries": when the
// buffer holds fewer than `entries.size()` entries the count says how many
// are needed, *size the bytes needed, and the status is 7.
template <class Entry>
RM_STATUS deliver_list(const std::vector<Entry>& entries, size_t header, void* buffer, HBA_UINT32* size) {
  if (buffer == nullptr || size == nullptr) return kStatusBadArgument;
  const size_t need = header + entries.size() * sizeof(Entry);
  const HBA_UINT32 count = static_cast<HBA_UINT32>(entries.size());
  if (*size < header) {
    *size = static_cast<HBA_UINT32>(need);
    return RM_STATUS_ERROR_BUFFER_TOO_SMALL;
  }
  std::memcpy(buffer, &count, sizeof count);
  if (*size < need) {
    *size = static_cast<HBA_UINT32>(need);
    return RM_STATUS_ERROR_BUFFER_TOO_SMALL;
  }
  auto* out = static_cast<unsigned char*>(buffer);
  std::memset(out + sizeof count, 0, header - sizeof count);
  if (!entries.empty()) std::memcpy(out + header, entries.data(), entries.size() * sizeof(Entry));
  *size = static_cast<HBA_UINT32>(need);
  return RM_STATUS_SUCCESS;
}

// Address record <-> text ("10.0.0.1", "fe80::1").
RM_IP_ADDRESS ip_record(const std::string& text, uint16_t port);
std::string ip_text(const RM_IP_ADDRESS& record);

// The features a function offers: the card's list plus its protocol's own.
std::vector<uint32_t> features_of(const Card& card, const Function& fn);

}  // namespace nrvsim::rm
