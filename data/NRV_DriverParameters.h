// The FCoE driver's tunable parameters as NRVTAVO_DriverParameterSettingData
// instances of the catalogue: four per parameter (current, default, maximum,
// minimum value), for the driver as a whole (global) or for one FCoE port
// (local, ConfigurationName "local", ElementName the port's name).
//
// Contract: the catalogue's holder keeps it locked for the call.  Only the
// records the library handed over are read, whatever count it claims, and
// their texts never past their fields.  An instance whose key is taken is
// logged and dropped; the others are kept.
#pragma once

#include <stdint.h>

#include <string>
#include <vector>

#include "access/NRV_Catalogue.h"
#include "access/RM_SettingRecords.h"

namespace cimple {

// The four instances of each record, in the order they are inserted: global
// current, maximum, minimum, default; local current, default, maximum,
// minimum.  Owned by the caller.
std::vector<Instance*> driverParamInstances(const std::vector<RM_DRIVER_PARAM>& records,
                                            const std::string& portName, bool global);

// Reads the global (driver-wide) or the port's parameters of the FCoE port
// `portName` (16 hex digits) and inserts their instances.  0, kNrvFailure
// when the name does not convert, 1 when it names no local adapter, else the
// library's status (no instance then).
uint32_t FCoEGetDriverParam(NRV_Catalogue& catalogue, const std::string& portName, bool global);

}  // namespace cimple
