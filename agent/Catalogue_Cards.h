// The physical side of the catalogue: one card (with its physical package,
// product and flash contents) per serial number, one chip per chip tag, and
// one connector and port controller per physical port, however many PCI
// functions share them.  The first function that names one makes it and its
// associations; later functions find it in the build's indexes.
//
// Contract: m_DataMutex held; build.host, build.chassis and the profiles of
// steps 4 and 11 made.  A null answer has been logged ("CreateTAVOCardInstance
// failed", "CreateTAVOChipInstance failed"); the caller skips the function.
#pragma once

#include "agent/Catalogue_Build.h"
#include "agent/Catalogue_Function.h"

namespace cimple {

Card_Entry* ensure_card(Catalogue_Build& build, const Function_View& function);
Chip_Entry* ensure_chip(Catalogue_Build& build, const Function_View& function, Card_Entry& card);
// `storage` names the profile a new port controller conforms to: Storage HBA
// for a port first seen through an FCoE function, else Host LAN Network Port.
// A refused conformance throws std::runtime_error when `strict` (the FCoE
// step ends the build on it).
Physical_Port_Entry* ensure_physical_port(Catalogue_Build& build, const Function_View& function, Card_Entry& card,
                                          Chip_Entry& chip, bool storage, bool strict);

}  // namespace cimple
