// Opens the HBA API, management and QoS libraries at run time and resolves
// the module's forwarders (one per library function, see RM_Api.h) lazily.
//
// Contract: process-wide state.  loadLibraries/loadLibrary/unloadLibraries are
// called by one thread at a time, and unloadLibraries only when no forwarder
// call is in flight (the agent joins its threads first).  Forwarders may run
// on any thread without a lock.  After unloadLibraries every cached function
// pointer is forgotten, so no forwarder ever calls into a closed library; the
// unavailability flags, however, keep their values for the life of the process.
#pragma once

#include <string>

namespace cimple {

class NRV_Runtime_Loader {
 public:
  // Library slots.
  enum Slot : int {
    kHbaApiSlot = 0,    // libHBAAPI.so.2, else libHBAAPI.so
    kLrmApiSlot = 1,    // liblrmapi.so, the primary management library
    kRmApiSlot = 2,     // librmapi.so, tried only when liblrmapi is missing
    kQosSlot = 3,       // the DOZER_ functions' library; nothing opens it
    kSlotCount = 4,
  };

  NRV_Runtime_Loader() = delete;

  // Opens the HBA API library and a management library.  Returns 0 when a
  // management library opened, 1 when neither did (the HBA API does not count).
  static int loadLibraries();

  // Opens "lib" + baseName (+ ".so" unless baseName starts with "HBA") into
  // `slot`.  Returns 1 when the slot holds a handle afterwards, 0 on failure
  // (logged "dlopen failed :%s").  An occupied slot is not opened again.
  static int loadLibrary(int slot, const char* baseName);

  // Closes every open slot (a failing dlclose is logged) and forgets every
  // resolved function.  Returns 0.
  static int unloadLibraries();

  // Inspection, for diagnostics and tests.
  static void* handle(int slot);
  static std::string fileName(int slot);   // "" when the slot is empty
  static bool isUnavailable(int slot);     // the slot's unavailability flag

  // The file name loadLibrary hands to the dynamic loader for `baseName`.
  static std::string libraryFileName(const char* baseName);
};

}  // namespace cimple
