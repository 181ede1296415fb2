// PCI vital product data images (identifier string, VPD-R keywords, end tag)
// as the management library answers them, and the cursor walk behind
// RM_GetNextVpdEntry.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "sim/SiteModel.h"

namespace nrvsim::rm {

// `binary_fru` converts the FRU keywords that carry binary values: UU (32 hex
// digits become 16 bytes), CF and RI (a decimal number becomes one byte).
std::vector<uint8_t> vpd_image(const std::string& product_name, const VpdEntries& entries, bool binary_fru);

// Reads the entry at `cursor` into keyword (4 bytes: two characters and a NUL;
// the identifier string reads as 0x82 0x82) and value (256 bytes, NUL after
// the value's bytes).  Returns the cursor of the next entry, or null when
// `cursor` is at the end tag (nothing is written then).
const uint8_t* next_vpd_entry(const uint8_t* cursor, char* keyword, char* value);

}  // namespace nrvsim::rm
