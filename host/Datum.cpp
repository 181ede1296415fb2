// Datum: value construction, comparison, named lists, CIM datetime text and type names.
#include "host/Datum.h"

#include <strings.h>
#include <sys/time.h>

#include <cctype>
#include <cstdio>
#include <cstring>

namespace nrv::host {

namespace {

constexpr CMPIUint64 kMicrosPerSecond = 1000000ULL;
constexpr CMPIUint64 kMicrosPerDay = 86400ULL * kMicrosPerSecond;

// Days since 1970-01-01 of a proleptic Gregorian date (H. Hinnant's algorithm).
long long daysFromCivil(long long y, unsigned m, unsigned d) {
  y -= m <= 2;
  const long long era = (y >= 0 ? y : y - 399) / 400;
  const unsigned yoe = static_cast<unsigned>(y - era * 400);
  const unsigned doy = (153 * (m + (m > 2 ? -3 : 9)) + 2) / 5 + d - 1;
  const unsigned doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
  return era * 146097 + static_cast<long long>(doe) - 719468;
}

void civilFromDays(long long z, long long& y, unsigned& m, unsigned& d) {
  z += 719468;
  const long long era = (z >= 0 ? z : z - 146096) / 146097;
  const unsigned doe = static_cast<unsigned>(z - era * 146097);
  const unsigned yoe = (doe - doe / 1460 + doe / 36524 - doe / 146096) / 365;
  y = static_cast<long long>(yoe) + era * 400;
  const unsigned doy = doe - (365 * yoe + yoe / 4 - yoe / 100);
  const unsigned mp = (5 * doy + 2) / 153;
  d = doy - (153 * mp + 2) / 5 + 1;
  m = mp < 10 ? mp + 3 : mp - 9;
  y += m <= 2;
}

bool digits(const std::string& s, size_t at, size_t n, unsigned long long& out) {
  out = 0;
  for (size_t i = at; i < at + n; ++i) {
    if (s[i] < '0' || s[i] > '9') return false;
    out = out * 10 + static_cast<unsigned>(s[i] - '0');
  }
  return true;
}

struct TypeNameEntry {
  CMPIType type;
  const char* name;
};

constexpr TypeNameEntry kTypeNames[] = {
    {CMPI_boolean, "boolean"}, {CMPI_char16, "char16"},     {CMPI_real32, "real32"},
    {CMPI_real64, "real64"},   {CMPI_uint8, "uint8"},       {CMPI_uint16, "uint16"},
    {CMPI_uint32, "uint32"},   {CMPI_uint64, "uint64"},     {CMPI_sint8, "sint8"},
    {CMPI_sint16, "sint16"},   {CMPI_sint32, "sint32"},     {CMPI_sint64, "sint64"},
    {CMPI_string, "string"},   {CMPI_dateTime, "datetime"}, {CMPI_ref, "ref"},
    {CMPI_instance, "instance"}, {CMPI_chars, "chars"},     {CMPI_ptr, "ptr"},
    {CMPI_null, "null"},
};

}  // namespace

std::string DateTimeValue::text() const {
  char buf[96];
  if (interval) {
    const CMPIUint64 days = micros / kMicrosPerDay;
    CMPIUint64 rest = micros % kMicrosPerDay;
    const CMPIUint64 us = rest % kMicrosPerSecond;
    rest /= kMicrosPerSecond;
    std::snprintf(buf, sizeof buf, "%08llu%02llu%02llu%02llu.%06llu:000",
                  static_cast<unsigned long long>(days % 100000000ULL),
                  static_cast<unsigned long long>(rest / 3600),
                  static_cast<unsigned long long>((rest / 60) % 60),
                  static_cast<unsigned long long>(rest % 60), static_cast<unsigned long long>(us));
    return buf;
  }
  long long local = static_cast<long long>(micros) + utcOffsetMinutes * 60LL * 1000000LL;
  int offsetMinutes = utcOffsetMinutes;
  if (local < 0) {  // an offset before the epoch: show the time in UTC instead
    local = static_cast<long long>(micros);
    offsetMinutes = 0;
  }
  const long long secs = local / 1000000LL;
  const long long us = local % 1000000LL;
  long long y;
  unsigned m, d;
  civilFromDays(secs / 86400, y, m, d);
  const long long sod = secs % 86400;
  const int off = (offsetMinutes < 0 ? -offsetMinutes : offsetMinutes) % 1000;
  std::snprintf(buf, sizeof buf, "%04lld%02u%02u%02lld%02lld%02lld.%06lld%c%03d", y % 10000, m, d,
                sod / 3600, (sod / 60) % 60, sod % 60, us, offsetMinutes < 0 ? '-' : '+', off);
  return buf;
}

std::optional<DateTimeValue> DateTimeValue::parse(const std::string& s) {
  if (s.size() != 25 || s[14] != '.') return std::nullopt;
  unsigned long long a, h, mi, se, us, tail;
  if (!digits(s, 8, 2, h) || !digits(s, 10, 2, mi) || !digits(s, 12, 2, se) ||
      !digits(s, 15, 6, us) || !digits(s, 22, 3, tail)) {
    return std::nullopt;
  }
  if (h > 23 || mi > 59 || se > 60) return std::nullopt;
  DateTimeValue v;
  const CMPIUint64 dayMicros = ((h * 60 + mi) * 60 + se) * kMicrosPerSecond + us;
  if (s[21] == ':') {
    if (!digits(s, 0, 8, a) || tail != 0) return std::nullopt;
    v.interval = true;
    v.micros = a * kMicrosPerDay + dayMicros;
    return v;
  }
  if (s[21] != '+' && s[21] != '-') return std::nullopt;
  unsigned long long y, mo, d;
  if (!digits(s, 0, 4, y) || !digits(s, 4, 2, mo) || !digits(s, 6, 2, d)) return std::nullopt;
  if (mo < 1 || mo > 12 || d < 1 || d > 31 || y < 1970) return std::nullopt;
  v.utcOffsetMinutes = static_cast<int>(tail) * (s[21] == '-' ? -1 : 1);
  const long long days = daysFromCivil(static_cast<long long>(y), static_cast<unsigned>(mo),
                                       static_cast<unsigned>(d));
  const long long utc = days * static_cast<long long>(kMicrosPerDay) +
                        static_cast<long long>(dayMicros) -
                        v.utcOffsetMinutes * 60LL * 1000000LL;
  if (utc < 0) return std::nullopt;
  v.micros = static_cast<CMPIUint64>(utc);
  return v;
}

DateTimeValue DateTimeValue::now() {
  timeval tv{};
  gettimeofday(&tv, nullptr);
  DateTimeValue v;
  v.micros = static_cast<CMPIUint64>(tv.tv_sec) * kMicrosPerSecond +
             static_cast<CMPIUint64>(tv.tv_usec);
  return v;
}

Datum Datum::null(CMPIType type) {
  Datum d;
  d.type = type;
  return d;
}

Datum Datum::string(std::string value) {
  Datum d;
  d.type = CMPI_string;
  d.isNull = false;
  d.text = std::move(value);
  return d;
}

Datum Datum::boolean(bool value) {
  Datum d;
  d.type = CMPI_boolean;
  d.isNull = false;
  d.scalar.boolean = value ? 1 : 0;
  return d;
}

Datum Datum::unsignedInt(CMPIType type, CMPIUint64 value) {
  Datum d;
  d.type = type;
  d.isNull = false;
  switch (type) {
    case CMPI_uint8: d.scalar.uint8 = static_cast<CMPIUint8>(value); break;
    case CMPI_uint16: d.scalar.uint16 = static_cast<CMPIUint16>(value); break;
    case CMPI_uint32: d.scalar.uint32 = static_cast<CMPIUint32>(value); break;
    case CMPI_char16: d.scalar.char16 = static_cast<CMPIChar16>(value); break;
    default: d.scalar.uint64 = value; break;
  }
  return d;
}

Datum Datum::signedInt(CMPIType type, CMPISint64 value) {
  Datum d;
  d.type = type;
  d.isNull = false;
  switch (type) {
    case CMPI_sint8: d.scalar.sint8 = static_cast<CMPISint8>(value); break;
    case CMPI_sint16: d.scalar.sint16 = static_cast<CMPISint16>(value); break;
    case CMPI_sint32: d.scalar.sint32 = static_cast<CMPISint32>(value); break;
    default: d.scalar.sint64 = value; break;
  }
  return d;
}

Datum Datum::real(CMPIType type, double value) {
  Datum d;
  d.type = type;
  d.isNull = false;
  if (type == CMPI_real32) {
    d.scalar.real32 = static_cast<CMPIReal32>(value);
  } else {
    d.scalar.real64 = value;
  }
  return d;
}

Datum Datum::reference(PathData value) {
  Datum d;
  d.type = CMPI_ref;
  d.isNull = false;
  d.hold(Held::Path, std::make_shared<const PathData>(std::move(value)));
  return d;
}

Datum Datum::embedded(InstanceData value) { return embedded(std::make_shared<InstanceData>(std::move(value))); }

Datum Datum::embedded(std::shared_ptr<const InstanceData> value) {
  Datum d;
  d.type = CMPI_instance;
  d.isNull = false;
  d.hold(Held::Instance, std::move(value));
  return d;
}

Datum Datum::time(DateTimeValue value) {
  Datum d;
  d.type = CMPI_dateTime;
  d.isNull = false;
  d.scalar.uint64 = value.micros;
  d.interval_ = value.interval;
  d.utcOffsetMinutes_ = static_cast<std::int16_t>(value.utcOffsetMinutes);
  return d;
}

Datum Datum::arrayOf(CMPIType elementType, std::vector<Datum> elements) {
  Datum d;
  d.type = static_cast<CMPIType>(elementType | CMPI_ARRAY);
  d.isNull = false;
  auto data = std::make_shared<ArrayData>();
  data->elementType = elementType;
  data->elements = std::move(elements);
  d.hold(Held::Array, std::move(data));
  return d;
}

Datum Datum::sharedArray(std::shared_ptr<const ArrayData> value) {
  Datum d;
  d.type = static_cast<CMPIType>(value->elementType | CMPI_ARRAY);
  d.isNull = false;
  d.hold(Held::Array, std::move(value));
  return d;
}

void Datum::setText(const char* value) {
  type = CMPI_string;
  isNull = false;
  text.assign(value);
  hold(Held::Nothing, nullptr);
}

CMPISint64 Datum::asInteger() const {
  switch (type) {
    case CMPI_boolean: return scalar.boolean;
    case CMPI_char16: return scalar.char16;
    case CMPI_uint8: return scalar.uint8;
    case CMPI_uint16: return scalar.uint16;
    case CMPI_uint32: return scalar.uint32;
    case CMPI_uint64: return static_cast<CMPISint64>(scalar.uint64);
    case CMPI_sint8: return scalar.sint8;
    case CMPI_sint16: return scalar.sint16;
    case CMPI_sint32: return scalar.sint32;
    case CMPI_sint64: return scalar.sint64;
    default: return 0;
  }
}

bool Datum::operator==(const Datum& o) const {
  if (type != o.type || isNull != o.isNull) return false;
  if (isNull) return true;
  if (isArray()) {
    if (array()->elements.size() != o.array()->elements.size()) return false;
    for (size_t i = 0; i < array()->elements.size(); ++i) {
      if (!(array()->elements[i] == o.array()->elements[i])) return false;
    }
    return true;
  }
  switch (type) {
    case CMPI_string: return text == o.text;
    case CMPI_dateTime:
      return scalar.uint64 == o.scalar.uint64 && interval_ == o.interval_;
    case CMPI_ref: return *path() == *o.path();
    case CMPI_instance:
      return instance()->path == o.instance()->path &&
             instance()->properties == o.instance()->properties;
    case CMPI_real32: return scalar.real32 == o.scalar.real32;
    case CMPI_real64: return scalar.real64 == o.scalar.real64;
    case CMPI_ptr: return scalar.dataPtr.ptr == o.scalar.dataPtr.ptr;
    default: return asInteger() == o.asInteger();
  }
}

bool sameName(std::string_view a, std::string_view b) {
  // Most names that differ differ in length or in their first letter.
  return a.size() == b.size() && (a.empty() || std::tolower(static_cast<unsigned char>(a[0])) ==
                                                   std::tolower(static_cast<unsigned char>(b[0]))) &&
         strncasecmp(a.data(), b.data(), a.size()) == 0;
}

std::string lowerName(std::string_view name) {
  std::string out(name);
  for (char& c : out) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
  return out;
}

const Datum* findNamed(const NamedData& list, std::string_view name) {
  for (const auto& [n, v] : list) {
    if (sameName(n, name)) return &v;
  }
  return nullptr;
}

void setNamed(NamedData& list, std::string_view name, Datum value) {
  for (auto& [n, v] : list) {
    if (sameName(n, name)) {
      v = std::move(value);
      return;
    }
  }
  list.emplace_back(std::string(name), std::move(value));
}

bool PathData::operator==(const PathData& o) const {
  if (!sameName(className, o.className) || nameSpace != o.nameSpace) return false;
  if (keys.size() != o.keys.size()) return false;
  for (const auto& [n, v] : keys) {
    const Datum* other = findNamed(o.keys, n);
    if (other == nullptr || !(*other == v)) return false;
  }
  return true;
}

bool InstanceData::admits(std::string_view name) const {
  if (!filter) return true;
  for (const auto& n : *filter) {
    if (sameName(n, name)) return true;
  }
  for (const auto& n : filterKeys) {
    if (sameName(n, name)) return true;
  }
  return false;
}

std::string typeName(CMPIType type) {
  const bool isArray = (type & CMPI_ARRAY) != 0;
  const CMPIType base = static_cast<CMPIType>(type & ~CMPI_ARRAY);
  for (const auto& e : kTypeNames) {
    if (e.type == base) return std::string(e.name) + (isArray ? "[]" : "");
  }
  return "unknown";
}

std::optional<CMPIType> typeFromName(const std::string& name) {
  std::string base = name;
  CMPIType arrayBit = 0;
  if (base.size() > 2 && base.compare(base.size() - 2, 2, "[]") == 0) {
    base.resize(base.size() - 2);
    arrayBit = CMPI_ARRAY;
  }
  for (const auto& e : kTypeNames) {
    if (e.type != CMPI_null && e.type != CMPI_ptr && e.type != CMPI_chars &&
        strcasecmp(e.name, base.c_str()) == 0) {
      return static_cast<CMPIType>(e.type | arrayBit);
    }
  }
  return std::nullopt;
}

}  // namespace nrv::host
