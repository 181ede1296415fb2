// Typed, path-reporting access to site file nodes.
#include "sim/SiteJson.h"

namespace nrvsim {

void Node::fail(const std::string& why) const { throw SiteError(path + ": " + why); }

bool Node::has(const char* key) const { return j.is_object() && j.contains(key) && !j.at(key).is_null(); }

Node Node::at(const char* key) const {
  if (!has(key)) Node{j, path + "." + key}.fail("missing");
  return Node{j.at(key), path + "." + key};
}

Node Node::at(size_t i) const { return Node{j.at(i), path + "[" + std::to_string(i) + "]"}; }

std::vector<Node> Node::items(const char* key) const {
  std::vector<Node> out;
  if (!has(key)) return out;
  Node list = at(key);
  if (!list.j.is_array()) list.fail("must be an array");
  for (size_t i = 0; i < list.j.size(); ++i) out.push_back(list.at(i));
  return out;
}

uint64_t Node::number() const {
  if (j.is_number_unsigned()) return j.get<uint64_t>();
  if (j.is_number_integer()) {
    const int64_t v = j.get<int64_t>();
    if (v < 0) fail("must not be negative");
    return static_cast<uint64_t>(v);
  }
  if (j.is_string()) {
    const std::string s = j.get<std::string>();
    try {
      size_t used = 0;
      const uint64_t v = std::stoull(s, &used, 0);
      if (used == s.size() && !s.empty() && s[0] != '-') return v;
    } catch (const std::exception&) {
    }
  }
  fail("must be a number");
}

std::string Node::text() const {
  if (!j.is_string()) fail("must be a string");
  return j.get<std::string>();
}

bool Node::flag() const {
  if (!j.is_boolean()) fail("must be true or false");
  return j.get<bool>();
}

double Node::real() const {
  if (!j.is_number()) fail("must be a number");
  return j.get<double>();
}

uint64_t Node::u64(const char* key, uint64_t def) const { return has(key) ? at(key).number() : def; }

uint32_t Node::u32(const char* key, uint32_t def) const {
  const uint64_t v = u64(key, def);
  if (v > UINT32_MAX) at(key).fail("out of range");
  return static_cast<uint32_t>(v);
}

uint16_t Node::u16(const char* key, uint16_t def) const {
  const uint64_t v = u64(key, def);
  if (v > UINT16_MAX) at(key).fail("out of range");
  return static_cast<uint16_t>(v);
}

int32_t Node::i32(const char* key, int32_t def) const {
  if (!has(key)) return def;
  Node n = at(key);
  if (!n.j.is_number_integer()) n.fail("must be an integer");
  const int64_t v = n.j.get<int64_t>();
  if (v < INT32_MIN || v > INT32_MAX) n.fail("out of range");
  return static_cast<int32_t>(v);
}

std::string Node::str(const char* key, const std::string& def) const { return has(key) ? at(key).text() : def; }

bool Node::boolean(const char* key, bool def) const { return has(key) ? at(key).flag() : def; }

Wwn Node::wwn(const char* key) const {
  Node n = at(key);
  auto w = parse_wwn(n.text());
  if (!w) n.fail("not a world-wide name (16 hex digits, pairs may be split by ':')");
  return *w;
}

Mac Node::mac(const char* key) const {
  Node n = at(key);
  auto m = parse_mac(n.text());
  if (!m) n.fail("not a MAC address (12 hex digits, pairs may be split by ':' or '-')");
  return *m;
}

}  // namespace nrvsim
