// Datum: the host's own value model behind every CMPI object it hands out — typed values,
// object paths, instances and arrays held as plain C++ data, shared immutably between copies.
//
// Contract: a Datum is a value; copying it never copies referenced paths, instances or arrays
// (they are shared, read-only). Nothing here touches CMPI handles; conversion to and from CMPI
// lives in CmpiConvert.h.
#ifndef NRV_HOST_DATUM_H
#define NRV_HOST_DATUM_H

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "cmpidt.h"

namespace nrv::host {

struct PathData;
struct InstanceData;
struct ArrayData;

// A CIM datetime: a point in time (microseconds since 1970-01-01 UTC, plus the UTC offset it was
// written with) or an interval (microseconds).
struct DateTimeValue {
  CMPIUint64 micros = 0;
  bool interval = false;
  int utcOffsetMinutes = 0;

  // The 25-character CIM form, "yyyymmddhhmmss.mmmmmm+ooo" or "ddddddddhhmmss.mmmmmm:000".
  std::string text() const;
  static std::optional<DateTimeValue> parse(const std::string& text);
  static DateTimeValue now();
};

struct Datum {
 private:
  // A Datum is small (an instance holds one per property): the path, instance or array it
  // holds shares one pointer, and a datetime keeps its microseconds in `scalar`.
  enum class Held : std::uint8_t { Nothing, Path, Instance, Array };

 public:
  CMPIType type = CMPI_null;   // CMPI type code; CMPI_ARRAY is set for arrays
  bool isNull = true;

 private:
  // Packed beside the two above.
  Held held_ = Held::Nothing;
  bool interval_ = false;
  std::int16_t utcOffsetMinutes_ = 0;

 public:
  CMPIValue scalar{};          // numbers, boolean, char16, raw data pointer
  std::string text;            // CMPI_string

  static Datum null(CMPIType type);
  static Datum string(std::string value);
  static Datum boolean(bool value);
  static Datum unsignedInt(CMPIType type, CMPIUint64 value);
  static Datum signedInt(CMPIType type, CMPISint64 value);
  static Datum real(CMPIType type, double value);
  static Datum reference(PathData value);
  static Datum embedded(InstanceData value);
  // Shares the instance; it must not change while the Datum holds it.
  static Datum embedded(std::shared_ptr<const InstanceData> value);
  static Datum time(DateTimeValue value);
  static Datum arrayOf(CMPIType elementType, std::vector<Datum> elements);
  // Shares the array; it must not change while the Datum holds it.
  static Datum sharedArray(std::shared_ptr<const ArrayData> value);

  // Makes this a string in place (no Datum made and moved, as string() does).
  void setText(const char* value);

  // What a reference, an embedded instance or an array holds (nullptr for any other value);
  // it lives as long as this Datum or a copy of it.
  const PathData* path() const { return held_ == Held::Path ? static_cast<const PathData*>(object_.get()) : nullptr; }
  const InstanceData* instance() const {
    return held_ == Held::Instance ? static_cast<const InstanceData*>(object_.get()) : nullptr;
  }
  const ArrayData* array() const {
    return held_ == Held::Array ? static_cast<const ArrayData*>(object_.get()) : nullptr;
  }
  // True when no copy of this Datum shares what it holds.
  bool holdsAlone() const { return object_.use_count() == 1; }
  // A CMPI_dateTime's value.
  DateTimeValue dateTime() const { return DateTimeValue{scalar.uint64, interval_, utcOffsetMinutes_}; }

  bool isArray() const { return (type & CMPI_ARRAY) != 0; }
  // Integer view of any integer type (for tests and printing).
  CMPISint64 asInteger() const;
  bool operator==(const Datum& other) const;

 private:
  void hold(Held kind, std::shared_ptr<const void> object) {
    held_ = kind;
    object_ = std::move(object);
  }
  std::shared_ptr<const void> object_;
};

using NamedData = std::vector<std::pair<std::string, Datum>>;

// CIM names compare case-insensitively.
bool sameName(std::string_view a, std::string_view b);
// The name in lower case: the key under which to look a CIM name up.
std::string lowerName(std::string_view name);
const Datum* findNamed(const NamedData& list, std::string_view name);
// Replaces an entry of the same name in place, else appends.
void setNamed(NamedData& list, std::string_view name, Datum value);

struct PathData {
  std::string nameSpace;
  std::string host;
  std::string className;
  NamedData keys;
  bool operator==(const PathData& other) const;
};

struct InstanceData {
  PathData path;
  NamedData properties;
  // Property filter set through setPropertyFilter: names outside it are dropped on set.
  std::optional<std::vector<std::string>> filter;
  std::vector<std::string> filterKeys;

  bool admits(std::string_view name) const;
};

struct ArrayData {
  CMPIType elementType = CMPI_null;
  std::vector<Datum> elements;
};

// "uint16", "string[]", ... for a CMPI type code; "unknown" for codes outside the standard.
std::string typeName(CMPIType type);
std::optional<CMPIType> typeFromName(const std::string& name);

}  // namespace nrv::host

#endif  // NRV_HOST_DATUM_H
