// PathText: parsing and printing object paths, values and assignments.
#include "host/PathText.h"

#include <strings.h>

#include <cctype>
#include <charconv>
#include <cstdlib>
#include <limits>
#include <unordered_map>
#include <unordered_set>

namespace nrv::host {

namespace {

bool isIdentStart(char c) { return std::isalpha(static_cast<unsigned char>(c)) || c == '_'; }
bool isIdentChar(char c) { return std::isalnum(static_cast<unsigned char>(c)) || c == '_'; }

bool isIdentifier(std::string_view s) {
  if (s.empty() || !isIdentStart(s[0])) return false;
  for (char c : s) {
    if (!isIdentChar(c)) return false;
  }
  return true;
}

bool isNameSpace(std::string_view s) {
  if (s.empty() || s.front() == '/' || s.back() == '/' || s.find("//") != std::string_view::npos) {
    return false;
  }
  for (char c : s) {
    if (!isIdentChar(c) && c != '/') return false;
  }
  return true;
}

std::string_view trim(std::string_view s) {
  while (!s.empty() && std::isspace(static_cast<unsigned char>(s.front()))) s.remove_prefix(1);
  while (!s.empty() && std::isspace(static_cast<unsigned char>(s.back()))) s.remove_suffix(1);
  return s;
}

std::string quote(const std::string& s) {
  std::string out = "\"";
  for (char c : s) {
    if (c == '"' || c == '\\') out += '\\';
    out += c;
  }
  out += '"';
  return out;
}

// Reads a quoted string starting at text[pos] == '"'; pos ends after the closing quote.
std::optional<std::string> readQuoted(std::string_view text, size_t& pos) {
  std::string out;
  for (++pos; pos < text.size(); ++pos) {
    const char c = text[pos];
    if (c == '\\') {
      if (++pos >= text.size()) return std::nullopt;
      out += text[pos];
    } else if (c == '"') {
      ++pos;
      return out;
    } else {
      out += c;
    }
  }
  return std::nullopt;
}

// Splits on top-level commas, keeping quoted commas and nested braces inside their element.
std::optional<std::vector<std::string_view>> splitList(std::string_view text) {
  std::vector<std::string_view> parts;
  size_t start = 0;
  int depth = 0;
  for (size_t i = 0; i < text.size(); ++i) {
    const char c = text[i];
    if (c == '"') {
      size_t p = i;
      if (!readQuoted(text, p)) return std::nullopt;
      i = p - 1;
    } else if (c == '{') {
      ++depth;
    } else if (c == '}') {
      --depth;
    } else if (c == ',' && depth == 0) {
      parts.push_back(trim(text.substr(start, i - start)));
      start = i + 1;
    }
  }
  parts.push_back(trim(text.substr(start)));
  return parts;
}

template <typename T>
bool parseNumber(std::string_view s, T& out) {
  if (!s.empty() && s.front() == '+') s.remove_prefix(1);
  const auto [ptr, ec] = std::from_chars(s.data(), s.data() + s.size(), out);
  return ec == std::errc() && ptr == s.data() + s.size() && !s.empty();
}

std::optional<Datum> integerLiteral(std::string_view s) {
  CMPISint64 v;
  if (parseNumber(s, v)) return Datum::signedInt(CMPI_sint64, v);
  CMPIUint64 u;
  if (parseNumber(s, u)) return Datum::unsignedInt(CMPI_uint64, u);
  return std::nullopt;
}

std::optional<Datum> realLiteral(std::string_view s) {
  double v;
  if (parseNumber(s, v)) return Datum::real(CMPI_real64, v);
  return std::nullopt;
}

std::variant<Datum, TextError> fail(std::string message) { return TextError{std::move(message)}; }

// The text of a value given either quoted or bare.
std::optional<std::string> unquoted(std::string_view text) {
  if (!text.empty() && text.front() == '"') {
    size_t pos = 0;
    auto s = readQuoted(text, pos);
    if (!s || pos != text.size()) return std::nullopt;
    return s;
  }
  return std::string(text);
}

struct IntRange {
  CMPIType type;
  bool isSigned;
  long long min;
  unsigned long long max;
};

constexpr IntRange kIntRanges[] = {
    {CMPI_uint8, false, 0, 0xffULL},
    {CMPI_uint16, false, 0, 0xffffULL},
    {CMPI_uint32, false, 0, 0xffffffffULL},
    {CMPI_uint64, false, 0, std::numeric_limits<unsigned long long>::max()},
    {CMPI_sint8, true, -128, 127},
    {CMPI_sint16, true, -32768, 32767},
    {CMPI_sint32, true, std::numeric_limits<int>::min(), std::numeric_limits<int>::max()},
    {CMPI_sint64, true, std::numeric_limits<long long>::min(),
     std::numeric_limits<long long>::max()},
};

std::variant<Datum, TextError> typedScalar(std::string_view text, CMPIType type,
                                           const KeySchema& schema = {}) {
  for (const auto& r : kIntRanges) {
    if (r.type != type) continue;
    if (r.isSigned) {
      CMPISint64 v;
      if (!parseNumber(text, v) || v < r.min || v > static_cast<long long>(r.max)) {
        return fail("bad " + typeName(type) + " value: " + std::string(text));
      }
      return Datum::signedInt(type, v);
    }
    CMPIUint64 v;
    if (!parseNumber(text, v) || v > r.max) {
      return fail("bad " + typeName(type) + " value: " + std::string(text));
    }
    return Datum::unsignedInt(type, v);
  }
  auto raw = unquoted(text);
  if (!raw) return fail("unterminated string: " + std::string(text));
  switch (type) {
    case CMPI_string: return Datum::string(*raw);
    case CMPI_boolean:
      if (strcasecmp(raw->c_str(), "true") == 0) return Datum::boolean(true);
      if (strcasecmp(raw->c_str(), "false") == 0) return Datum::boolean(false);
      return fail("bad boolean value: " + *raw);
    case CMPI_char16:
      if (raw->size() != 1) return fail("bad char16 value: " + *raw);
      return Datum::unsignedInt(CMPI_char16, static_cast<unsigned char>((*raw)[0]));
    case CMPI_real32:
    case CMPI_real64: {
      double v;
      if (!parseNumber(std::string_view(*raw), v)) return fail("bad real value: " + *raw);
      return Datum::real(type, v);
    }
    case CMPI_dateTime: {
      auto dt = DateTimeValue::parse(*raw);
      if (!dt) return fail("bad datetime value: " + *raw);
      return Datum::time(*dt);
    }
    case CMPI_ref: {
      auto path = parsePath(*raw, kDefaultNameSpace, schema);
      if (auto* e = std::get_if<TextError>(&path)) return *e;
      return Datum::reference(std::get<PathData>(std::move(path)));
    }
    default:
      return fail("unsupported type " + typeName(type));
  }
}

// The type of a typed key value `(type)value`, and the value text after it.
std::variant<std::pair<std::optional<CMPIType>, std::string_view>, TextError> typePrefix(
    std::string_view text) {
  if (text.empty() || text.front() != '(') return std::pair{std::optional<CMPIType>{}, text};
  const size_t close = text.find(')');
  if (close == std::string_view::npos) return TextError{"unterminated type in key value"};
  const std::string name(trim(text.substr(1, close - 1)));
  auto type = name == "reference" ? std::optional<CMPIType>(CMPI_ref) : typeFromName(name);
  if (!type || (*type & CMPI_ARRAY) != 0) return TextError{"bad key type: " + name};
  return std::pair{type, trim(text.substr(close + 1))};
}

// An untyped key value read by its literal form alone.
std::variant<Datum, TextError> literalKeyValue(std::string_view text) {
  if (text.front() == '"') {
    size_t pos = 0;
    auto s = readQuoted(text, pos);
    if (!s) return fail("unterminated string in key value");
    if (pos != text.size()) return fail("text after quoted key value: " + std::string(text));
    return Datum::string(std::move(*s));
  }
  if (strcasecmp(std::string(text).c_str(), "true") == 0) return Datum::boolean(true);
  if (strcasecmp(std::string(text).c_str(), "false") == 0) return Datum::boolean(false);
  if (auto i = integerLiteral(text)) return *i;
  if (auto r = realLiteral(text)) return *r;
  return fail("bad key value: " + std::string(text));
}

// A key value: of the declared type when the class is known, else of its typed form or its
// literal form.
std::variant<Datum, TextError> keyValue(std::string_view text, const KeyDecl* declared,
                                        const KeySchema& schema) {
  if (text.empty()) return fail("missing key value");
  auto prefixed = typePrefix(text);
  if (auto* e = std::get_if<TextError>(&prefixed)) return *e;
  auto [typed, body] = std::get<0>(prefixed);
  if (body.empty()) return fail("missing key value");
  if (declared != nullptr) {
    if (typed && *typed != declared->type) {
      return fail("key " + declared->name + " is of type " + typeName(declared->type));
    }
    auto value = typedScalar(body, declared->type, schema);
    if (auto* e = std::get_if<TextError>(&value)) {
      return fail("key " + declared->name + ": " + e->message);
    }
    return value;
  }
  if (typed) return typedScalar(body, *typed, schema);
  return literalKeyValue(body);
}

std::string formatReal(double v) {
  char buf[64];
  const auto [ptr, ec] = std::to_chars(buf, buf + sizeof buf, v);
  return ec == std::errc() ? std::string(buf, ptr) : std::string("0");
}

}  // namespace

std::variant<PathData, TextError> parsePath(std::string_view input,
                                            const std::string& defaultNameSpace,
                                            const KeySchema& schema) {
  std::string_view text = trim(input);
  if (text.empty()) return TextError{"empty object path"};
  PathData path;
  path.nameSpace = defaultNameSpace;
  const size_t stop = text.find_first_of(".\"=");
  const size_t colon = text.find(':');
  if (colon != std::string_view::npos && (stop == std::string_view::npos || colon < stop)) {
    const std::string_view ns = text.substr(0, colon);
    if (!isNameSpace(ns)) return TextError{"bad namespace: " + std::string(ns)};
    path.nameSpace = std::string(ns);
    text.remove_prefix(colon + 1);
  }
  const size_t dot = text.find('.');
  const std::string_view cls = text.substr(0, dot);
  if (!isIdentifier(cls)) return TextError{"bad class name: " + std::string(cls)};
  path.className = std::string(cls);
  if (dot == std::string_view::npos) return path;
  const std::string_view bindings = text.substr(dot + 1);
  if (bindings.empty()) return TextError{"missing key bindings after '.'"};
  auto parts = splitList(bindings);
  if (!parts) return TextError{"unterminated string in key bindings"};
  // The class's declared keys by lower-case name, when the schema knows the class.
  std::optional<std::unordered_map<std::string, KeyDecl>> declared;
  if (schema) {
    if (auto keys = schema(path.className)) {
      declared.emplace();
      for (auto& k : *keys) declared->emplace(lowerName(k.name), std::move(k));
    }
  }
  std::unordered_set<std::string> seen;
  for (std::string_view part : *parts) {
    const size_t eq = part.find('=');
    if (eq == std::string_view::npos) return TextError{"missing '=' in key binding: " + std::string(part)};
    const std::string_view name = trim(part.substr(0, eq));
    if (!isIdentifier(name)) return TextError{"bad key name: " + std::string(name)};
    const std::string low = lowerName(name);
    if (!seen.insert(low).second) return TextError{"duplicate key: " + std::string(name)};
    const KeyDecl* decl = nullptr;
    if (declared) {
      auto it = declared->find(low);
      if (it == declared->end()) {
        return TextError{"class " + path.className + " has no key " + std::string(name)};
      }
      decl = &it->second;
    }
    auto value = keyValue(trim(part.substr(eq + 1)), decl, schema);
    if (auto* e = std::get_if<TextError>(&value)) return *e;
    path.keys.emplace_back(std::string(name), std::get<Datum>(std::move(value)));
  }
  return path;
}

std::variant<Datum, TextError> parseValue(std::string_view input, std::optional<CMPIType> type) {
  const std::string_view text = trim(input);
  const bool braced = !text.empty() && text.front() == '{';
  if (braced || (type && (*type & CMPI_ARRAY) != 0)) {
    if (!braced || text.back() != '}') return fail("array value must be {v1,v2,...}");
    const std::string_view inner = trim(text.substr(1, text.size() - 2));
    std::vector<Datum> elements;
    std::optional<CMPIType> elementType;
    if (type) elementType = static_cast<CMPIType>(*type & ~CMPI_ARRAY);
    if (!inner.empty()) {
      auto parts = splitList(inner);
      if (!parts) return fail("unterminated string in array value");
      for (std::string_view part : *parts) {
        if (!part.empty() && part.front() == '{') return fail("nested arrays are not allowed");
        auto element = parseValue(part, elementType);
        if (auto* e = std::get_if<TextError>(&element)) return *e;
        Datum d = std::get<Datum>(std::move(element));
        if (elementType && d.type != *elementType) {
          return fail("mixed element types in array value");
        }
        elementType = d.type;
        elements.push_back(std::move(d));
      }
    }
    return Datum::arrayOf(elementType.value_or(CMPIType(CMPI_string)), std::move(elements));
  }
  if (type) return typedScalar(text, *type);
  if (text.empty()) return Datum::string("");
  if (text.front() == '"') {
    size_t pos = 0;
    auto s = readQuoted(text, pos);
    if (!s || pos != text.size()) return fail("bad quoted value: " + std::string(text));
    return Datum::string(std::move(*s));
  }
  if (strcasecmp(std::string(text).c_str(), "true") == 0) return Datum::boolean(true);
  if (strcasecmp(std::string(text).c_str(), "false") == 0) return Datum::boolean(false);
  if (auto i = integerLiteral(text)) return *i;
  if (auto r = realLiteral(text)) return *r;
  return Datum::string(std::string(text));
}

std::variant<Assignment, TextError> parseAssignment(std::string_view input) {
  const std::string_view text = trim(input);
  const size_t eq = text.find('=');
  if (eq == std::string_view::npos) return TextError{"expected Name=value: " + std::string(text)};
  std::string_view name = trim(text.substr(0, eq));
  Assignment a;
  const size_t colon = name.find(':');
  if (colon != std::string_view::npos) {
    const std::string type(trim(name.substr(colon + 1)));
    a.type = typeFromName(type);
    if (!a.type) return TextError{"unknown type: " + type};
    name = trim(name.substr(0, colon));
  }
  if (!isIdentifier(name)) return TextError{"bad name: " + std::string(name)};
  a.name = std::string(name);
  a.valueText = std::string(trim(text.substr(eq + 1)));
  return a;
}

std::optional<std::vector<std::string>> splitTopLevel(std::string_view text) {
  auto parts = splitList(text);
  if (!parts) return std::nullopt;
  return std::vector<std::string>(parts->begin(), parts->end());
}

std::string formatPath(const PathData& path) {
  std::string out;
  if (!path.nameSpace.empty()) out = path.nameSpace + ":";
  out += path.className;
  const char* sep = ".";
  for (const auto& [name, value] : path.keys) {
    out += sep;
    out += name + "=" + formatValue(value);
    sep = ",";
  }
  return out;
}

std::string formatValue(const Datum& v) {
  if (v.isNull) return "NULL";
  if (v.isArray()) {
    std::string out = "{";
    const char* sep = "";
    for (const auto& e : v.array()->elements) {
      out += sep + formatValue(e);
      sep = ", ";
    }
    return out + "}";
  }
  switch (v.type) {
    case CMPI_string: return quote(v.text);
    case CMPI_boolean: return v.scalar.boolean ? "true" : "false";
    case CMPI_char16: return quote(std::string(1, static_cast<char>(v.scalar.char16)));
    case CMPI_real32: return formatReal(v.scalar.real32);
    case CMPI_real64: return formatReal(v.scalar.real64);
    case CMPI_uint64: return std::to_string(v.scalar.uint64);
    case CMPI_dateTime: return quote(v.dateTime().text());
    case CMPI_ref: return quote(formatPath(*v.path()));
    case CMPI_instance: {
      std::string out = "instance of " + v.instance()->path.className + " {";
      for (const auto& [name, value] : v.instance()->properties) {
        out += " " + name + " = " + formatValue(value) + ";";
      }
      return out + " }";
    }
    case CMPI_ptr: return "<ptr>";
    default: return std::to_string(v.asInteger());
  }
}

}  // namespace nrv::host
