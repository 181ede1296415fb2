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

#include <mutex>

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

// What a refreshing provider runs on its map before it copies it: the
// refresh operation, under the provider's own recursive mutex (which the
// caller keeps alive for the life of the module).
struct Status_Refresh {
  void (*run)(ProviderAgent& agent);
  std::recursive_mutex* own;
};

// The enumeration of an adapter-catalogue provider that refreshes first.
// Nothing is delivered when the agent is not loaded ("RM Init failed for
// <source>").  Locks, in order: adapter data ready, adapter maps ready,
// m_DataMutex, the provider's own mutex (for the refresh only).
int enumerate_refreshed(const char* class_name, const char* source, Map_Selector select, Status_Refresh refresh,
                        const Handler& handler);

}  // namespace cimple
