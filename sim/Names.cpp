// Text forms of world-wide names and MAC addresses.
#include "sim/Names.h"

#include <cstdio>

namespace nrvsim {
namespace {

int hex_value(char c) {
  if (c >= '0' && c <= '9') return c - '0';
  if (c >= 'a' && c <= 'f') return c - 'a' + 10;
  if (c >= 'A' && c <= 'F') return c - 'A' + 10;
  return -1;
}

// Reads exactly N bytes of hex digits; a separator is allowed only between
// byte pairs, and either everywhere or nowhere.
template <size_t N>
std::optional<std::array<uint8_t, N>> parse_bytes(std::string_view text, std::string_view seps) {
  std::array<uint8_t, N> out{};
  const bool separated = text.size() == N * 3 - 1;
  if (!separated && text.size() != N * 2) return std::nullopt;
  size_t pos = 0;
  char sep = 0;
  for (size_t i = 0; i < N; ++i) {
    if (separated && i > 0) {
      const char c = text[pos++];
      if (seps.find(c) == std::string_view::npos) return std::nullopt;
      if (sep == 0) sep = c;
      if (c != sep) return std::nullopt;
    }
    const int hi = hex_value(text[pos]);
    const int lo = hex_value(text[pos + 1]);
    if (hi < 0 || lo < 0) return std::nullopt;
    out[i] = static_cast<uint8_t>(hi * 16 + lo);
    pos += 2;
  }
  return out;
}

}  // namespace

std::optional<Wwn> parse_wwn(std::string_view text) { return parse_bytes<8>(text, ":- "); }
std::optional<Mac> parse_mac(std::string_view text) { return parse_bytes<6>(text, ":-"); }

std::string wwn_plain(const Wwn& wwn) {
  char buf[17];
  std::snprintf(buf, sizeof buf, "%02X%02X%02X%02X%02X%02X%02X%02X", wwn[0], wwn[1], wwn[2], wwn[3],
                wwn[4], wwn[5], wwn[6], wwn[7]);
  return buf;
}

std::string mac_text(const Mac& mac, char sep) {
  char buf[18];
  std::snprintf(buf, sizeof buf, "%02x%c%02x%c%02x%c%02x%c%02x%c%02x", mac[0], sep, mac[1], sep, mac[2],
                sep, mac[3], sep, mac[4], sep, mac[5]);
  return buf;
}

Wwn wwn_from_mac(const Mac& mac) {
  Wwn w{};
  for (size_t i = 0; i < mac.size(); ++i) w[i] = mac[i];
  return w;
}

uint64_t wwn_to_u64(const Wwn& wwn) {
  uint64_t v = 0;
  for (uint8_t b : wwn) v = (v << 8) | b;
  return v;
}

Wwn wwn_from_u64(uint64_t value) {
  Wwn w{};
  for (int i = 7; i >= 0; --i) {
    w[static_cast<size_t>(i)] = static_cast<uint8_t>(value & 0xFF);
    value >>= 8;
  }
  return w;
}

}  // namespace nrvsim
