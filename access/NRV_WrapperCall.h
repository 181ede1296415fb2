// The shapes every wrapper operation shares: validate the port name, call the
// library, log a failure with its status text; read a record under the
// library's size protocol; read a count-prefixed table.
//
// Contract: internal to the wrapper's units.  `call` and `fn` are run on the
// caller's thread and may capture by reference; nothing is kept.
#pragma once

#include <cstring>
#include <string>
#include <vector>

#include "access/NRV_MethodWrapper.h"
#include "logging/Log.h"

namespace cimple::wrapper {

// Logs the entry of `operation`, validates `name` and runs `call`.  A name that
// is not a local adapter answers RM_STATUS_ERROR without calling the library.
template <class Call>
RM_STATUS validated(const HBA_NAME& name, const char* operation, Call call) {
  NRV_LOG(NRV_DBG, "Entering NRV_MethodWrapper::%s", operation);
  if (NRV_MethodWrapper::Validatewwpn(name) != 0) {
    NRV_LOG(NRV_ERR, "INVALID wwpn");
    return RM_STATUS_ERROR;
  }
  const RM_STATUS status = call();
  if (status != RM_STATUS_SUCCESS) {
    NRV_LOG(NRV_ERR, "NRV_MethodWrapper::%s failed with %d", operation, static_cast<int>(status));
    NRV_MethodWrapper::logStatus(status);
  }
  return status;
}

// Runs fn(buffer, &size) with `size` bytes; when the library answers "too
// small" (7 or 191) with a larger size, once more with that size.  On success
// `out` holds the bytes the library reported (never more than it was given).
template <class Fn>
RM_STATUS readSized(std::vector<uint8_t>& out, HBA_UINT32 size, Fn fn) {
  out.assign(size, 0);
  HBA_UINT32 length = size;
  RM_STATUS status = fn(out.data(), &length);
  if ((status == RM_STATUS_ERROR_BUFFER_TOO_SMALL || status == RM_STATUS_ERROR_MORE_DATA) &&
      length > out.size()) {
    out.assign(length, 0);
    status = fn(out.data(), &length);
  }
  if (status != RM_STATUS_SUCCESS) {
    out.clear();
    return status;
  }
  if (length < out.size()) out.resize(length);
  return status;
}

// Reads a table of a 32-bit count followed by `Entry` records (size argument
// in bytes); "too small" is answered with the count needed and retried once.
// Only entries that lie inside the buffer are taken.
template <class Entry, class Fn>
RM_STATUS readTable(std::vector<Entry>& out, HBA_UINT32 capacity, Fn fn) {
  out.clear();
  std::vector<uint8_t> buffer;
  auto attempt = [&](HBA_UINT32 entries) {
    buffer.assign(sizeof(HBA_UINT32) + entries * sizeof(Entry), 0);
    std::memcpy(buffer.data(), &entries, sizeof entries);
    HBA_UINT32 size = static_cast<HBA_UINT32>(buffer.size());
    return fn(buffer.data(), &size);
  };
  RM_STATUS status = attempt(capacity);
  if (status == RM_STATUS_ERROR_BUFFER_TOO_SMALL || status == RM_STATUS_ERROR_MORE_DATA) {
    HBA_UINT32 needed = 0;
    std::memcpy(&needed, buffer.data(), sizeof needed);
    if (needed > capacity) status = attempt(needed);
  }
  if (status != RM_STATUS_SUCCESS) return status;
  HBA_UINT32 count = 0;
  std::memcpy(&count, buffer.data(), sizeof count);
  const size_t room = (buffer.size() - sizeof(HBA_UINT32)) / sizeof(Entry);
  if (count > room) count = static_cast<HBA_UINT32>(room);
  out.resize(count);
  if (count != 0)
    std::memcpy(out.data(), buffer.data() + sizeof(HBA_UINT32), count * sizeof(Entry));
  return status;
}

// A NUL-terminated text out of a fixed field of `size` bytes.
inline std::string fieldText(const char* field, size_t size) {
  return std::string(field, strnlen(field, size));
}

// Copies `text` into a fixed field, cut to leave room for the terminator.
inline void copyField(char* field, size_t size, const std::string& text) {
  const size_t n = text.size() < size ? text.size() : size - 1;
  std::memcpy(field, text.data(), n);
  field[n] = '\0';
}

// True when the adapter offers `feature`; logs `absentText` (if any) otherwise.
bool offers(const HBA_NAME& name, HBA_UINT32 feature, const char* absentText);

// Reads one integer attribute out of an attribute blob.
bool blobInteger(void* blob, HBA_UINT16 attribute, HBA_UINT32& value);
// Reads one text attribute out of an attribute blob.
bool blobText(void* blob, HBA_UINT16 attribute, std::string& value);

}  // namespace cimple::wrapper
