// A port's pluggable module as one NRVTAVO_Transceiver of the catalogue:
// vendor identity, manufacture date, identifier bytes, live diagnostic
// readings and alarm and warning thresholds in SFF-8472 units (GetSffData).
//
// Contract: the catalogue's holder keeps it locked for the call.  The record
// is read whole and never past its 948 bytes; a text field is read up to its
// terminator or the next field, a reading that is not a finite number stays
// null, and a date code that is not a calendar date leaves ManufactureDate
// null.
#pragma once

#include <stdint.h>

#include "access/NRV_Catalogue.h"
#include "access/RM_Types.h"
#include "schema/NRVTAVO_Transceiver.h"

namespace cimple {

// The transceiver instance described by an SFF record of RM_SFF_DATA_SIZE
// bytes, for the function `deviceId`; owned by the caller.
NRVTAVO_Transceiver* transceiverFromSff(const uint8_t* record, const char* deviceId);

// Reads the SFF record of the function `deviceId` (16 hex digits) and inserts
// its transceiver; answers the instance (held by the transceiver map), or
// null when the name does not convert, the library has no data for the port
// (10GBASE-T ports have none) or the insert is refused.
NRVTAVO_Transceiver* GetSffData(NRV_Catalogue& catalogue, const char* deviceId);

}  // namespace cimple
