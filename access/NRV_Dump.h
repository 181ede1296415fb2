// The dump-service part of the catalogue: the one NRVTAVO_DumpService of the
// host with its hosting and affected-element associations, and the extended
// FAT dump settings of every chip (NRVTAVO_ExtFATDumpData and one
// NRVTAVO_ExtFATDumpAdvancedData per firmware module) read from the adapter.
// Also the trace-level names the dump service speaks.
//
// Contract: the builders run with the catalogue's holder keeping it locked
// for the whole call and read the maps the adapter catalogue filled before:
// the host system, cards, chips and down Ethernet ports.  The service affects
// the chips (its affected-element association refers to a chip).  A chip's
// port is the first Ethernet port, else FC port, whose "SerialNumber +
// Sub-AdapterID" identifying text equals the chip's Tag: its DeviceID names the
// adapter to the management library, and its PermanentAddress (Ethernet) or
// "NORVANE:IEEE_ADDRESS" text (FC) is the chip's MAC address.  Failures are
// logged and drop only the instance they concern.
#pragma once

#include <stdint.h>

#include <string>

#include "access/NRV_Catalogue.h"

namespace cimple {

class NRV_Dump {
 public:
  // What ClearDumpServiceClasses empties.
  enum Kind : uint32_t {
    kDumpService = 1,     // DumpService, HostedDumpService, DumpServiceAffectsElement
    kExtFATSettings = 2,  // ExtFATDumpData, ElementExtFATDumpData and the advanced ones
    kAll = 3,
  };

  explicit NRV_Dump(NRV_Catalogue& catalogue);
  ~NRV_Dump();
  NRV_Dump(const NRV_Dump&) = delete;
  NRV_Dump& operator=(const NRV_Dump&) = delete;

  // The service, its associations and (rebuilt) the FAT dump settings.
  void CreateDumpServiceClasses();
  // 0; kNrvFailure without a service or chip, or when an insert is refused;
  // kNrvNotFound when a chip's event-log configuration could not be read.
  uint32_t CreateExtFATDumpSettingClasses();
  void ClearDumpServiceClasses(uint32_t kind);

  // "all" 2, "disable" 1, "enterfunction" 3, "verbose" 4, "info" 5, "test" 6,
  // "show" 7, "warning" 8, "error" 9, "fatal" 10, "always" 11, in any case
  // (at most 50 characters).  0 with `level` set, or kNrvNotFound with 99.
  static uint32_t TraceLevelFromName(const std::string& name, uint32_t& level);
  // The lower-case name of level 1 to 11; "" for any other.
  static std::string TraceLevelName(uint32_t level);

 private:
  // The service made now, or the one already in the map.
  Instance* ensureService();

  NRV_Catalogue& m_Catalogue;
};

}  // namespace cimple
