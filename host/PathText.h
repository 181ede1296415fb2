// PathText: the text forms a WBEM command line uses — object paths in the WBEM URI form of
// DSP0207 `namespace:Class.Key="value",Key2=3`, typed values and `Name=value` assignments.
//
// Contract: parsing never throws, and takes time linear in the text's length (times the
// nesting depth of reference keys); a malformed text yields an error message instead of a
// value. Printing a parsed path gives back an equivalent path (round trip, given the same key
// schema), keys in their given order.
#ifndef NRV_HOST_PATHTEXT_H
#define NRV_HOST_PATHTEXT_H

#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <variant>

#include "host/Datum.h"

namespace nrv::host {

inline constexpr const char* kDefaultNameSpace = "root/norvane";

struct TextError {
  std::string message;
};

// A key as its class declares it: name and CIM type (CMPI_ref for a reference).
struct KeyDecl {
  std::string name;
  CMPIType type = CMPI_string;
  std::string refClass;
};
// The keys a class declares; nullopt for a class the schema does not know.
using KeySchema = std::function<std::optional<std::vector<KeyDecl>>(const std::string& className)>;

// `[namespace:]Class[.Key=value{,Key=value}]`; the namespace defaults to `defaultNameSpace`.
// Untyped key values: "quoted" (\" and \\ escapes), true/false, integers (sint64, or uint64
// above its range), reals. Typed key values `(type)value`, type a CIM type name or
// "reference": `Left=(reference)"root/a:W.Id=\"x\""`.
// With a schema that knows the class, every key must be one the class declares, and untyped
// values take the declared type (a quoted path becomes a reference only for a reference key);
// without one, a quoted value is always a string.
std::variant<PathData, TextError> parsePath(std::string_view text,
                                            const std::string& defaultNameSpace =
                                                kDefaultNameSpace,
                                            const KeySchema& schema = {});

// One value; with `type` given the text is read as that CIM type ("uint16", "string[]",
// "datetime", "ref" ...), otherwise its literal form decides. Arrays are `{v1,v2}`.
std::variant<Datum, TextError> parseValue(std::string_view text,
                                          std::optional<CMPIType> type = std::nullopt);

// `Name=value` or `Name:type=value`.
struct Assignment {
  std::string name;
  std::optional<CMPIType> type;
  std::string valueText;
};
std::variant<Assignment, TextError> parseAssignment(std::string_view text);
// Splits "A=1,B=\"x,y\",C={1,2}" at its top-level commas; nullopt for an unterminated quote.
std::optional<std::vector<std::string>> splitTopLevel(std::string_view text);

std::string formatPath(const PathData& path);
// A value as it appears in MOF output and key bindings: strings and datetimes quoted and
// escaped, references as quoted paths, arrays as {a, b}, NULL for null.
std::string formatValue(const Datum& value);

}  // namespace nrv::host

#endif  // NRV_HOST_PATHTEXT_H
