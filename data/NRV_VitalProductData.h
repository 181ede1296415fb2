// An adapter function's general vital product data as one
// NRVTAVO_VitalProductData instance of the catalogue (CreateVPD).
//
// Contract: the catalogue's holder keeps it locked for the call.  The new
// instance is keyed by the device identifier text (its InstanceID); the
// caller links it to its PCI device.  Keyword and value texts keep printable
// ASCII only; a keyword byte outside it is written as two hex digits (the
// identifier string's keyword reads "8282").
#pragma once

#include <stdint.h>

#include "access/NRV_Catalogue.h"

namespace cimple {

// 0; 1 when `deviceId` (16 hex digits) does not convert; else the library's
// status (no instance then).  An insert refused for a taken InstanceID is
// logged and answers 0: the data is in the catalogue already.
uint32_t CreateVPD(NRV_Catalogue& catalogue, const char* deviceId);

}  // namespace cimple
