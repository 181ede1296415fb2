// NRVTAVO_BaseServerReferencedProfile: the platform's Base Server profile
// referencing each of the module's registered profiles.  Nothing is kept in
// the catalogue: every enumeration asks the platform for its profile (an
// up-call into "root/pg_interop") and builds the references afresh.
//
// Contract: without a platform Base Server profile the enumeration delivers
// nothing and succeeds.  Association requests fall back on the enumeration.
#pragma once

#include "agent/Catalogue_Reader.h"
#include "framework/Provider_Proc.h"

namespace cimple {

class NRVTAVO_BaseServerReferencedProfile_Provider : public Provider_Base {
 public:
  int load() { return agent_load(); }
  int unload() { return agent_unload("NRVTAVO_BaseServerReferencedProfile"); }
  int enum_instances(const Instance* model, const Handler& handler);
};

}  // namespace cimple
