// PathText: the text forms a WBEM command line uses — object paths
// `namespace:Class.Key="value",Key2=3`, typed values and `Name=value` assignments.
//
// Contract: parsing never throws; a malformed text yields an error message instead of a value.
// Printing a parsed path gives back an equivalent path (round trip), keys in their given order.
#ifndef NRV_HOST_PATHTEXT_H
#define NRV_HOST_PATHTEXT_H

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

// `[namespace:]Class[.Key=value{,Key=value}]`; the namespace defaults to `defaultNameSpace`.
// Key values: "quoted string" (\" and \\ escapes; a quoted full object path becomes a
// reference), true/false, integers (sint64, or uint64 above its range), reals.
std::variant<PathData, TextError> parsePath(std::string_view text,
                                            const std::string& defaultNameSpace =
                                                kDefaultNameSpace);

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
