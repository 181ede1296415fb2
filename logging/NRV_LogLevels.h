// Names of the logger's levels as they appear in every trace-file line.
// Only the six defined levels have a name; anything else has none.
#pragma once

#include "logging/Log.h"

namespace cimple {

// Number of defined levels: NRV_INVALID..NRV_DBG.
inline constexpr int kNrvLevelCount = 6;

// "NRV_INVALID".."NRV_DBG" for a defined level, nullptr for any other value,
// so callers can never index past the table with a stray level.
constexpr const char* nrv_level_name(int level) {
  constexpr const char* kNames[kNrvLevelCount] = {
      "NRV_INVALID", "NRV_CRIT", "NRV_WARN", "NRV_ERR", "NRV_INFO", "NRV_DBG",
  };
  return (level >= 0 && level < kNrvLevelCount) ? kNames[level] : nullptr;
}

}  // namespace cimple
