// Typed reading of one node of a site file.  Every accessor checks the JSON
// type and range and, on a mismatch, throws SiteError naming the node's path
// ("$.cards[0].functions[2].wwpn: not a world-wide name"); SiteLoader turns
// that into its error value.  A Node refers to the document it came from,
// which must outlive it.
#pragma once

#include <cstdint>
#include <stdexcept>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "sim/Names.h"

namespace nrvsim {

struct SiteError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

struct Node {
  const nlohmann::json& j;
  std::string path;

  [[noreturn]] void fail(const std::string& why) const;

  bool has(const char* key) const;  // present and not null
  Node at(const char* key) const;   // fails when absent
  Node at(size_t i) const;
  std::vector<Node> items(const char* key) const;  // absent: none

  // This node as a value.  Numbers may be JSON numbers or strings in any base
  // std::stoull accepts ("0x0a1b00").
  uint64_t number() const;
  std::string text() const;
  bool flag() const;
  double real() const;

  // Member `key` as a value, `def` when absent.
  uint64_t u64(const char* key, uint64_t def) const;
  uint32_t u32(const char* key, uint32_t def) const;
  uint16_t u16(const char* key, uint16_t def) const;
  int32_t i32(const char* key, int32_t def) const;
  std::string str(const char* key, const std::string& def = "") const;
  bool boolean(const char* key, bool def) const;
  // Member `key`, required.
  Wwn wwn(const char* key) const;
  Mac mac(const char* key) const;
};

}  // namespace nrvsim
