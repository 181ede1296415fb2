// The self-describing blobs in which the management library answers attribute
// and statistics queries, and the lookup behind RM_GetAttributeValue.
//
// Layout (little-endian): a 16-byte header "NRVB", total size, entry count,
// reserved; then entries of { u16 number, u8 type, u8 0, u16 length, u16 0 }
// followed by `length` value bytes padded to 8 (so 64-bit values are aligned
// when the caller's buffer is).  Strings carry a NUL after `length` bytes.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace nrvsim {

class BlobWriter {
 public:
  BlobWriter();
  BlobWriter(const BlobWriter&) = delete;
  BlobWriter& operator=(const BlobWriter&) = delete;

  void u32(uint16_t number, uint32_t value);
  void u64(uint16_t number, uint64_t value);
  void text(uint16_t number, std::string_view value);
  void bytes(uint16_t number, const void* data, uint16_t length);

  // Header completed; the writer stays usable.
  const std::vector<uint8_t>& finish();

 private:
  void put(uint16_t number, uint8_t type, const void* data, uint16_t length, bool nul);
  std::vector<uint8_t> buf_;
  uint32_t count_ = 0;
};

// Buffer-size protocol: copies the blob when *size is large enough (status 0),
// otherwise leaves the buffer alone and answers 7; *size becomes the blob size.
uint32_t deliver(const std::vector<uint8_t>& blob, void* buffer, uint32_t* size);

// Pointer to attribute `number` inside `blob` (null when absent or the blob is
// not one of ours), its length in *length and a status in *status (0 found,
// 190 absent, 1 bad blob).  Never reads past the blob's recorded size.
const void* find_attribute(const void* blob, uint16_t number, uint16_t* length, uint32_t* status);

}  // namespace nrvsim
