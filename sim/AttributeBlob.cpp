// Attribute blob writer and reader.
#include "sim/AttributeBlob.h"

#include <cstring>

namespace nrvsim {
namespace {

constexpr uint8_t kMagic[4] = {'N', 'R', 'V', 'B'};
constexpr size_t kHeader = 16;
constexpr size_t kEntryHeader = 8;
constexpr uint32_t kStatusAbsent = 190;
constexpr uint32_t kStatusBadBlob = 1;
// Guards against a caller handing us a buffer that never held a blob.
constexpr uint32_t kMaxBlob = 1u << 20;

size_t padded(size_t n) { return (n + 7) & ~size_t{7}; }

void store_u32(uint8_t* p, uint32_t v) { std::memcpy(p, &v, 4); }
void store_u16(uint8_t* p, uint16_t v) { std::memcpy(p, &v, 2); }

}  // namespace

BlobWriter::BlobWriter() : buf_(kHeader, 0) { std::memcpy(buf_.data(), kMagic, 4); }

void BlobWriter::put(uint16_t number, uint8_t type, const void* data, uint16_t length, bool nul) {
  const size_t at = buf_.size();
  buf_.resize(at + kEntryHeader + padded(length + (nul ? 1 : 0)), 0);
  store_u16(&buf_[at], number);
  buf_[at + 2] = type;
  store_u16(&buf_[at + 4], length);
  if (length > 0) std::memcpy(&buf_[at + kEntryHeader], data, length);
  ++count_;
}

void BlobWriter::u32(uint16_t number, uint32_t value) { put(number, 1, &value, 4, false); }
void BlobWriter::u64(uint16_t number, uint64_t value) { put(number, 2, &value, 8, false); }
void BlobWriter::text(uint16_t number, std::string_view value) {
  const uint16_t len = static_cast<uint16_t>(value.size() > 1024 ? 1024 : value.size());
  put(number, 3, value.data(), len, true);
}
void BlobWriter::bytes(uint16_t number, const void* data, uint16_t length) {
  put(number, 4, data, length, false);
}

const std::vector<uint8_t>& BlobWriter::finish() {
  store_u32(&buf_[4], static_cast<uint32_t>(buf_.size()));
  store_u32(&buf_[8], count_);
  return buf_;
}

uint32_t deliver(const std::vector<uint8_t>& blob, void* buffer, uint32_t* size) {
  const uint32_t need = static_cast<uint32_t>(blob.size());
  if (size == nullptr || buffer == nullptr) return 4;  // bad argument
  if (*size < need) {
    *size = need;
    return 7;
  }
  std::memcpy(buffer, blob.data(), need);
  *size = need;
  return 0;
}

const void* find_attribute(const void* blob, uint16_t number, uint16_t* length, uint32_t* status) {
  auto answer = [&](const void* p, uint16_t len, uint32_t st) {
    if (length) *length = len;
    if (status) *status = st;
    return p;
  };
  if (blob == nullptr) return answer(nullptr, 0, kStatusBadBlob);
  const auto* b = static_cast<const uint8_t*>(blob);
  uint32_t total = 0, count = 0;
  std::memcpy(&total, b + 4, 4);
  std::memcpy(&count, b + 8, 4);
  if (std::memcmp(b, kMagic, 4) != 0 || total < kHeader || total > kMaxBlob)
    return answer(nullptr, 0, kStatusBadBlob);
  size_t at = kHeader;
  for (uint32_t i = 0; i < count && at + kEntryHeader <= total; ++i) {
    uint16_t num = 0, len = 0;
    std::memcpy(&num, b + at, 2);
    std::memcpy(&len, b + at + 4, 2);
    const bool nul = b[at + 2] == 3;
    const size_t next = at + kEntryHeader + padded(len + (nul ? 1 : 0));
    if (next > total) break;
    if (num == number) return answer(b + at + kEntryHeader, len, 0);
    at = next;
  }
  return answer(nullptr, 0, kStatusAbsent);
}

}  // namespace nrvsim
