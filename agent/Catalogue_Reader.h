// The provider side of the agent: taking and dropping the agent in a
// provider's load and unload, and the enumeration every catalogue-backed
// provider performs (wait for the catalogue, clone the class's map under the
// agent's locks, hand the clones over).
//
// Contract: none of these throws.  The enumeration always answers 0; it
// delivers either every instance of the map or, when the map holds two
// instances with equal keys or something fails, none.  The handler owns what
// it is given.
#pragma once

#include "agent/Catalogue_Maps.h"
#include "framework/Provider.h"

namespace cimple {

// getInstance, then LOAD_FAILED without a reference when the agent could not
// be constructed, else addRef and LOAD_OK.
int agent_load();
// Logs "<class>_Provider::unload()", releases the reference, answers UNLOAD_OK.
int agent_unload(const char* class_name);

using Map_Selector = Instance_Map& (*)(ProviderAgent& agent);

// The enumeration of the catalogue-backed provider of class `class_name`.
int enumerate_catalogue(const char* class_name, Map_Selector select, Catalogue catalogue, const Handler& handler);

}  // namespace cimple
