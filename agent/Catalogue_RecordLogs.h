// The provider's record logs (its own log and the management-interface
// library's log) with their capabilities, the Record Log profile and their
// use by the provider's software identity.
//
// Contract: m_DataMutex held; build.host and build.provider_identity made.
// False (after its message) ends the build: a log that cannot be made, or a
// missing Profile Registration profile or provider identity.
#pragma once

#include "agent/Catalogue_Build.h"

namespace cimple {

bool create_record_logs(Catalogue_Build& build);

}  // namespace cimple
