// Reading and laying out the FRU record.
#include "data/NRV_FruRecord.h"

#include <cstring>
#include <string_view>

#include "access/NRV_Common.h"
#include "access/RM_Api.h"
#include "logging/Log.h"

namespace cimple {

namespace {

constexpr uint32_t kFruVpdKind = 1;
constexpr size_t kUuidBytes = 16;

// Copies `value` into a text member, cut to the member's size.
template <size_t N>
void put(char (&member)[N], std::string_view value) {
  std::memset(member, 0, N);
  std::memcpy(member, value.data(), value.size() < N ? value.size() : N);
}

// "A1,V:1.2.3,D:2012": the pieces after "V:" and "D:".
void splitFirmware(NRV_FruRecord& record, std::string_view value) {
  while (!value.empty()) {
    const size_t comma = value.find(',');
    const std::string_view piece = value.substr(0, comma);
    if (piece.substr(0, 2) == "V:") put(record.FWVersion, piece.substr(2));
    if (piece.substr(0, 2) == "D:") put(record.FWDate, piece.substr(2));
    if (comma == std::string_view::npos) break;
    value.remove_prefix(comma + 1);
  }
}

std::string hexDigits(const std::string& bytes, size_t count) {
  static constexpr char kDigits[] = "0123456789abcdef";
  std::string out;
  for (size_t i = 0; i < count && i < bytes.size(); ++i) {
    const auto b = static_cast<unsigned char>(bytes[i]);
    out += kDigits[b >> 4];
    out += kDigits[b & 0xF];
  }
  return out;
}

struct Code_Text {
  uint32_t value;
  const char* text;
};

uint32_t lookup(const Code_Text* begin, const Code_Text* end, uint32_t value, std::string& text) {
  for (const Code_Text* c = begin; c != end; ++c)
    if (c->value == value) {
      text = c->text;
      return 0;
    }
  text.clear();
  return kNrvNotFound;
}

}  // namespace

const Fru_Keyword kFruKeywords[10] = {
    {"PA", "Product Name"}, {"SN", "Serial Number"}, {"PN", "Part Number"}, {"MN", "Manufacturer"},
    {"DM", "Date (WWYY format)"}, {"UU", "UUID"}, {"CF", "Card Function"}, {"RI", "Revision ID"},
    {"FN", "FRU Number"}, {"FW", "Firmware"},
};

void NRV_FruRecord::fill(const std::vector<Vpd_Entry>& entries) {
  std::memset(this, 0, sizeof *this);
  for (const Vpd_Entry& entry : entries) {
    const std::string& kw = entry.keyword;
    const std::string value = printableText(entry.text());
    const Fru_Keyword* known = nullptr;
    for (const Fru_Keyword& k : kFruKeywords)
      if (kw == k.keyword) known = &k;
    if (known == nullptr) {
      NRV_LOG(NRV_DBG, "FRU VPD: skipping keyword %s", printableText(kw).c_str());
      continue;
    }
    NRV_LOG(NRV_DBG, "FRU VPD %s: %s", known->description, value.c_str());
    if (kw == "MN") put(MN, value);
    else if (kw == "PA") put(PA, value);
    else if (kw == "PN") put(PN, value);
    else if (kw == "SN") put(SN, value);
    else if (kw == "DM") put(DM, value);
    else if (kw == "FN") put(FN, value);
    else if (kw == "UU") put(UU, hexDigits(entry.value, kUuidBytes));
    else if (kw == "CF") CF = static_cast<unsigned char>(entry.value[0]);
    else if (kw == "RI") RI = static_cast<unsigned char>(entry.value[0]);
    else if (kw == "FW") {
      put(FW, value);
      splitFirmware(*this, value);
    }
  }
}

uint32_t GetFRUVPD(const char* deviceId, NRV_FruRecord* out) {
  NRV_LOG(NRV_DBG, "NRV_Vpd::GetFRUVPD");
  if (deviceId == nullptr || out == nullptr) {
    NRV_LOG(NRV_ERR, "Invalid Parameter");
    return 4;
  }
  std::memset(out, 0, sizeof *out);
  HBA_NAME name{};
  if (!deviceIdToHBAName(deviceId, name, "Id2HBAName failed", "str2HBAName failed")) return 1;
  std::vector<uint8_t> image(RM_VPD_V2_SIZE, 0);
  HBA_UINT32 size = RM_VPD_V2_SIZE;
  const RM_STATUS status = LRM_GetVPDV2(name, kFruVpdKind, image.data(), &size);
  if (status != RM_STATUS_SUCCESS) {
    NRV_LOG(NRV_DBG, "ERROR: RM_GetVPDV2 call failed : %d", static_cast<int>(status));
    return status;
  }
  // Never walk more than the buffer the library was given.
  if (size < image.size()) image.resize(size);
  out->fill(walkVpd(image));
  return 0;
}

uint32_t CardFunctionText(uint32_t value, std::string& text) {
  static constexpr Code_Text kTexts[] = {
      {0, "Reserved"}, {16, "Infiniband"}, {64, "Ethernet"}, {80, "Fibre Channel"}, {96, "iSCSI"}};
  return lookup(std::begin(kTexts), std::end(kTexts), value, text);
}

uint32_t SoftwareClassificationText(uint32_t value, std::string& text) {
  static constexpr Code_Text kTexts[] = {{2, "Driver"}, {10, "Firmware"}, {11, "BIOD/Fcode"}, {32775, "CIM Provider"}};
  return lookup(std::begin(kTexts), std::end(kTexts), value, text);
}

}  // namespace cimple
