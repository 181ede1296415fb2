// Where the module's fixed system files really are.  Every fixed path
// ("/etc/...", "/var/log/...", "/opt/...") goes through system_path(), which
// prefixes it with $NRV_SYSROOT when that variable is set, so tests and the
// demo never touch the real system files.  A process running with raised
// privileges (set-user-ID, file capabilities) ignores the variable.
#pragma once

#include <string>

namespace cimple {

// Name of the relocating environment variable.
inline constexpr const char* kSysrootVariable = "NRV_SYSROOT";

// `fixed_path` (absolute) as it must be opened now: "$NRV_SYSROOT/etc/x" when
// the variable is set and non-empty, else the path unchanged.
std::string system_path(const char* fixed_path);

}  // namespace cimple
