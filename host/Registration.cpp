// Registration: parsing the SFCB provider registration format and the look-ups on it.
#include "host/Registration.h"

#include <algorithm>
#include <fstream>
#include <sstream>

#include "host/Datum.h"

namespace nrv::host {

namespace {

std::string_view trim(std::string_view s) {
  const auto first = s.find_first_not_of(" \t\r");
  if (first == std::string_view::npos) return {};
  return s.substr(first, s.find_last_not_of(" \t\r") - first + 1);
}

std::vector<std::string> words(std::string_view s) {
  std::vector<std::string> out;
  std::istringstream in{std::string(s)};
  for (std::string w; in >> w;) out.push_back(w);
  return out;
}

bool contains(const std::vector<std::string>& names, const std::string& name) {
  return std::any_of(names.begin(), names.end(),
                     [&](const std::string& n) { return sameName(n, name); });
}

}  // namespace

std::variant<Registration, std::string> Registration::read(const std::string& path) {
  std::ifstream in(path);
  if (!in) return "cannot read registration file " + path;
  std::ostringstream text;
  text << in.rdbuf();
  auto parsed = parse(text.str());
  if (auto* error = std::get_if<std::string>(&parsed)) return path + ": " + *error;
  return parsed;
}

std::variant<Registration, std::string> Registration::parse(std::string_view text) {
  Registration r;
  int lineNo = 0;
  while (!text.empty()) {
    const size_t nl = text.find('\n');
    const std::string_view line = trim(text.substr(0, nl));
    text = nl == std::string_view::npos ? std::string_view{} : text.substr(nl + 1);
    ++lineNo;
    if (line.empty() || line.front() == '#') continue;
    const std::string where = "line " + std::to_string(lineNo) + ": ";
    if (line.front() == '[') {
      if (line.back() != ']' || line.size() < 3) return where + "bad class entry";
      r.entries_.push_back({std::string(trim(line.substr(1, line.size() - 2))), {}, {}, {}, {}});
      continue;
    }
    const size_t colon = line.find(':');
    if (colon == std::string_view::npos) return where + "expected key: value";
    if (r.entries_.empty()) return where + "statement before the first [Class]";
    RegisteredClass& e = r.entries_.back();
    const std::string key(trim(line.substr(0, colon)));
    const std::string_view value = trim(line.substr(colon + 1));
    if (key == "provider") {
      e.provider = value;
    } else if (key == "location") {
      e.location = value;
    } else if (key == "type") {
      e.types = words(value);
    } else if (key == "namespace") {
      e.namespaces = words(value);
    } else if (key != "group" && key != "unload" && key != "user" && key != "parameters") {
      return where + "unknown key " + key;
    }
  }
  for (const auto& e : r.entries_) {
    if (e.provider.empty() || e.location.empty() || e.types.empty() || e.namespaces.empty()) {
      return "entry [" + e.className + "] lacks provider, location, type or namespace";
    }
  }
  return r;
}

const RegisteredClass* Registration::find(const std::string& className) const {
  for (const auto& e : entries_) {
    if (sameName(e.className, className)) return &e;
  }
  return nullptr;
}

bool Registration::serves(const std::string& className, const std::string& nameSpace) const {
  const RegisteredClass* e = find(className);
  return e != nullptr && contains(e->namespaces, nameSpace);
}

bool Registration::knowsNamespace(const std::string& nameSpace) const {
  return std::any_of(entries_.begin(), entries_.end(),
                     [&](const RegisteredClass& e) { return contains(e.namespaces, nameSpace); });
}

std::vector<std::string> Registration::classesIn(const std::string& nameSpace,
                                                 const std::string& type) const {
  std::vector<std::string> out;
  for (const auto& e : entries_) {
    if (contains(e.namespaces, nameSpace) && contains(e.types, type)) out.push_back(e.className);
  }
  return out;
}

}  // namespace nrv::host
