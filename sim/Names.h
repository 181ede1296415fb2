// Text forms of the 8-byte world-wide names and 6-byte MAC addresses that a
// site file uses.  Parsing never throws: a malformed text yields nullopt.
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace nrvsim {

using Wwn = std::array<uint8_t, 8>;
using Mac = std::array<uint8_t, 6>;

// Accepts 16 hex digits, optionally split into pairs by ':', '-' or ' '.
std::optional<Wwn> parse_wwn(std::string_view text);
// Accepts 12 hex digits, optionally split into pairs by ':' or '-'.
std::optional<Mac> parse_mac(std::string_view text);

// 16 upper-case hex digits, no separators (the form the module compares).
std::string wwn_plain(const Wwn& wwn);
// Pairs joined by `sep`, lower case ("00:90:fa:..").
std::string mac_text(const Mac& mac, char sep);

// The identifier a NIC or iSCSI function has: its MAC followed by two zero bytes.
Wwn wwn_from_mac(const Mac& mac);

uint64_t wwn_to_u64(const Wwn& wwn);
Wwn wwn_from_u64(uint64_t value);

}  // namespace nrvsim
