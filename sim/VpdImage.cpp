// PCI VPD images and their walk.
#include "sim/VpdImage.h"

#include <cstring>

namespace nrvsim::rm {
namespace {

constexpr uint8_t kIdString = 0x82, kVpdR = 0x90, kVpdW = 0x91, kEnd = 0x78;

std::string fru_value(const std::string& kw, const std::string& v) {
  if (kw == "UU" && v.size() == 32) {
    std::string out;
    for (size_t i = 0; i < 32; i += 2) {
      try {
        out.push_back(static_cast<char>(std::stoul(v.substr(i, 2), nullptr, 16)));
      } catch (const std::exception&) {
        return v;
      }
    }
    return out;
  }
  if (kw == "CF" || kw == "RI") {
    try {
      return std::string(1, static_cast<char>(std::stoul(v, nullptr, 0) & 0xFF));
    } catch (const std::exception&) {
      return v;
    }
  }
  return v;
}

void put_large(std::vector<uint8_t>& out, uint8_t tag, const std::vector<uint8_t>& body) {
  out.push_back(tag);
  out.push_back(static_cast<uint8_t>(body.size()));
  out.push_back(static_cast<uint8_t>(body.size() >> 8));
  out.insert(out.end(), body.begin(), body.end());
}

}  // namespace

std::vector<uint8_t> vpd_image(const std::string& product_name, const VpdEntries& entries, bool binary_fru) {
  std::vector<uint8_t> out;
  put_large(out, kIdString, std::vector<uint8_t>(product_name.begin(), product_name.end()));
  std::vector<uint8_t> r;
  for (const auto& [kw, raw] : entries) {
    std::string v = binary_fru ? fru_value(kw, raw) : raw;
    if (v.size() > 255) v.resize(255);
    r.push_back(static_cast<uint8_t>(kw.size() > 0 ? kw[0] : ' '));
    r.push_back(static_cast<uint8_t>(kw.size() > 1 ? kw[1] : ' '));
    r.push_back(static_cast<uint8_t>(v.size()));
    r.insert(r.end(), v.begin(), v.end());
  }
  put_large(out, kVpdR, r);
  out.push_back(kEnd);
  return out;
}

const uint8_t* next_vpd_entry(const uint8_t* p, char* keyword, char* value) {
  if (p == nullptr) return nullptr;
  // Section headers carry no entry of their own: step into the keywords.
  while (*p == kVpdR || *p == kVpdW) p += 3;
  if (*p == kEnd) return nullptr;
  size_t len = 0;
  const uint8_t* data = nullptr;
  const uint8_t* next = nullptr;
  if (*p == kIdString) {
    len = static_cast<size_t>(p[1]) | (static_cast<size_t>(p[2]) << 8);
    data = p + 3;
    next = data + len;
    if (keyword) {
      keyword[0] = keyword[1] = static_cast<char>(kIdString);
      keyword[2] = keyword[3] = '\0';
    }
  } else {
    if (*p < 0x20 || *p >= 0x7F) return nullptr;  // not a keyword: not an image of ours
    len = p[2];
    data = p + 3;
    next = data + len;
    if (keyword) {
      keyword[0] = static_cast<char>(p[0]);
      keyword[1] = static_cast<char>(p[1]);
      keyword[2] = keyword[3] = '\0';
    }
  }
  if (len > 255) len = 255;
  if (value) {
    std::memcpy(value, data, len);
    std::memset(value + len, 0, 256 - len);
  }
  return next;
}

}  // namespace nrvsim::rm
