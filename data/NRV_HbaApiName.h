// Finds the HBA API adapter whose port carries the world-wide port name by
// which the management library knows an FCoE function.
//
// Contract: opens and closes its own HBA API handles; never throws.
#pragma once

#include <string>

namespace cimple {

// The HBA API adapter name with a port whose world-wide port name, as 16
// upper-case hex digits, equals `identifierText`; "" when no port matches (a
// name that matched nothing must not lead target discovery to another
// adapter).
std::string findHbaApiAdapterName(const std::string& identifierText);

}  // namespace cimple
