// Vital product data and transceiver (SFF) records of a function's card.
#include <cstring>

#include "sim/RmCommon.h"
#include "sim/VpdImage.h"

namespace nrvsim::rm {
namespace {

constexpr uint32_t kVpdKindFru = 1;

void put16(uint8_t* rec, size_t at, uint16_t v) { std::memcpy(rec + at, &v, 2); }
void putf(uint8_t* rec, size_t at, float v) { std::memcpy(rec + at, &v, 4); }
void put_thresholds(uint8_t* rec, size_t at, const std::array<uint16_t, 4>& t) {
  for (size_t i = 0; i < 4; ++i) put16(rec, at + 2 * i, t[i]);
}
void put_field(uint8_t* rec, size_t at, size_t width, const std::string& s) {
  // SFF-8472 text fields are space padded; the record keeps a NUL after them.
  std::memset(rec + at, ' ', width);
  std::memcpy(rec + at, s.data(), s.size() < width ? s.size() : width);
}

}  // namespace

RM_STATUS handle_GetVPD(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const Card& card = card_of(s, r);
    const auto image = vpd_image(card.description, card.vpd, false);
    return deliver_bytes(image.data(), image.size(), buffer, size);
  });
}

RM_STATUS handle_GetVPDV2(HBA_NAME a1, HBA_UINT32 kind, void* buffer, HBA_UINT32* size) {
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const Card& card = card_of(s, r);
    if (kind != kVpdKindFru) return RM_STATUS_ITEM_NOT_OFFERED;
    if (card.fru.empty()) return RM_STATUS_ITEM_NOT_OFFERED;
    const auto image = vpd_image(card.description, card.fru, true);
    return deliver_bytes(image.data(), image.size(), buffer, size);
  });
}

// The 948-byte record: thresholds at 296, presence bytes at 584, serial ID
// from 588, live readings as floats from 596, vendor texts from 616.
RM_STATUS handle_GetSffData(HBA_NAME a1, void* buffer, HBA_UINT32* size) {
  return on_function(a1, [&](Site& s, FunctionRef r) -> RM_STATUS {
    const SffData& sff = card_of(s, r).ports[at(s, r).port].sff;
    if (!sff.present) return RM_STATUS_ITEM_NOT_OFFERED;
    uint8_t rec[RM_SFF_DATA_SIZE] = {};
    if (sff.diagnostics) {
      put_thresholds(rec, 296, sff.temp_thresholds);
      put_thresholds(rec, 304, sff.vcc_thresholds);
      put_thresholds(rec, 312, sff.bias_thresholds);
      put_thresholds(rec, 320, sff.tx_thresholds);
      put_thresholds(rec, 328, sff.rx_thresholds);
    }
    rec[584] = 1;
    rec[585] = sff.diagnostics ? 1 : 0;
    rec[586] = 1;
    rec[588] = sff.identifier;
    rec[589] = sff.ext_identifier;
    rec[590] = sff.connector;
    put16(rec, 592, sff.wavelength);
    if (sff.diagnostics) {
      putf(rec, 596, sff.temperature);
      putf(rec, 600, sff.vcc);
      putf(rec, 604, sff.tx_bias);
      putf(rec, 608, sff.tx_power);
      putf(rec, 612, sff.rx_power);
    }
    std::memcpy(rec + 616, sff.oui.data(), 3);
    put_field(rec, 620, 16, sff.vendor);
    put_field(rec, 638, 16, sff.part_number);
    put_field(rec, 656, 4, sff.revision);
    put_field(rec, 662, 16, sff.serial);
    std::memcpy(rec + 680, sff.date_code.data(), 6);
    return deliver_bytes(rec, sizeof rec, buffer, size);
  });
}

}  // namespace nrvsim::rm
