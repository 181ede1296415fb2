// The guarded VPD walk.
#include "access/NRV_VpdWalk.h"

#include <cstring>

#include "access/RM_Api.h"
#include "logging/Log.h"

namespace cimple {

std::string Vpd_Entry::text() const { return std::string(value.c_str(), strnlen(value.data(), value.size())); }

std::vector<Vpd_Entry> walkVpd(const std::vector<uint8_t>& image, Vpd_Next next) {
  if (next == nullptr) next = RM_GetNextVpdEntry;
  std::vector<Vpd_Entry> entries;
  if (image.empty()) return entries;
  // An image without its end tag, or whose last entry claims more bytes than
  // are left, makes the library read on; the zeroed tail keeps that read in
  // our buffer and reads as the end.
  std::vector<uint8_t> copy(image);
  copy.resize(image.size() + RM_VPD_VALUE_SIZE + RM_VPD_KEYWORD_SIZE, 0);
  uint8_t* const begin = copy.data();
  uint8_t* const end = begin + image.size();
  const size_t most = image.size() / 3 + 1;
  uint8_t* cursor = begin;
  while (entries.size() < most) {
    char keyword[RM_VPD_KEYWORD_SIZE] = {};
    char value[RM_VPD_VALUE_SIZE] = {};
    auto* following = static_cast<uint8_t*>(next(cursor, keyword, value));
    if (following == nullptr) return entries;
    entries.push_back({std::string(keyword, strnlen(keyword, 2)), std::string(value, sizeof value)});
    if (following <= cursor || following > end) {
      NRV_LOG(NRV_ERR, "VPD walk left the image after %zu entries", entries.size());
      return entries;
    }
    cursor = following;
  }
  NRV_LOG(NRV_ERR, "VPD walk stopped after %zu entries: no end in the image", entries.size());
  return entries;
}

std::string printableText(const std::string& text) {
  std::string out(text);
  for (char& c : out)
    if (static_cast<unsigned char>(c) < 0x20 || static_cast<unsigned char>(c) > 0x7E) c = '?';
  return out;
}

}  // namespace cimple
