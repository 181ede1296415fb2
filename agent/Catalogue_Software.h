// Software identities of the catalogue: the provider itself (with the
// management libraries' versions and its target operating systems), the
// drivers of the NIC, FCoE and iSCSI functions, the firmware of each chip and
// the flash contents of each card; each installed on the host and conforming
// to its profile.
//
// Contract: m_DataMutex held.  Identities land in the SoftwareIdentity (or
// FlashImageSoftwareIdentity) map; a null answer has been logged.  A driver
// identity is made once per driver name and version and found again for every
// further function that runs the same driver.
#pragma once

#include "agent/Catalogue_Build.h"
#include "agent/Catalogue_Function.h"

namespace cimple {

// Step 9: the provider's identity, installed on the host and conforming to
// the Software profile; false ends the build.
bool create_provider_identity(Catalogue_Build& build);
// Fills TargetOSTypes (and TargetOperatingSystems for the other systems) of a
// software identity from the server's target operating-system text.
void setTargetOSTypes(Instance* identity);

enum class Driver_Kind : uint8_t { kNic, kFcoe, kIscsi };
Instance* create_driver_identity(Catalogue_Build& build, const Function_View& function, Driver_Kind kind);

// The firmware running on `chip`, linked to it.
Instance* create_firmware_identity(Catalogue_Build& build, const Function_View& function, Instance* chip);
// The flash contents of the function's card.
Instance* create_flash_image(Catalogue_Build& build, const Function_View& function);

}  // namespace cimple
