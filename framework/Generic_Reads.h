// The diagnostic switch NRV_GENERIC_READS: when set (to anything but "0" or
// ""), catalogue providers leave get-instance, references and associator
// names to the generic fallbacks, and associators fetch every far end from
// the CIMOM, as providers that only enumerate are served.  It lets the
// indexed answers be compared with the generic ones, result for result and
// time for time, in one process; read at every request.
#pragma once

#include <cstdlib>

namespace cimple {

inline bool generic_reads() {
  const char* value = std::getenv("NRV_GENERIC_READS");
  return value != nullptr && *value != '\0' && !(value[0] == '0' && value[1] == '\0');
}

}  // namespace cimple
