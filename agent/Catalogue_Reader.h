// The provider side of the agent: taking and dropping the agent in a
// provider's load and unload, and the reads every catalogue-backed provider
// performs (wait for the catalogue, read the class's map under the agent's
// locks, hand out clones, or for a class published whole its instances
// themselves): the enumeration, and the get-instance, references and
// associator names that answer from the map's key and reference indexes
// what an enumeration would have answered.
//
// Contract: none of these throws.  The enumeration always answers 0; it
// delivers either every instance of the map or, when the map holds two
// instances with equal keys or something fails, none.  The handler owns a
// reference to what it is given and changes a shared instance only through
// `writable`.  The other reads answer as the enumeration-based fallbacks do:
// not found (get) or an empty success when nothing matches or reading fails.
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

// Where a provider's reads come from: its class's map, the catalogue it waits
// for, and for the six refreshing classes the refresh (null for the others).
struct Catalogue_Source {
  const char* class_name;
  Map_Selector select;
  Catalogue catalogue;
  const Status_Refresh* refresh = nullptr;
  const char* source = nullptr;  // the refreshing provider's source file
};

// Get instance by a look-up of the model's keys: GET_INSTANCE_OK and a clone,
// or GET_INSTANCE_NOT_FOUND.
int get_catalogue_instance(const Catalogue_Source& from, const Instance* model, Instance*& instance);
// References and associator names of an association class, in map order.
int catalogue_references(const Catalogue_Source& from, const Instance* source, const char* role,
                         const Handler& handler);
int catalogue_associator_names(const Catalogue_Source& from, const Instance* source, const char* result_class,
                               const char* role, const char* result_role, const Handler& handler);

// The enumeration of an adapter-catalogue provider that refreshes first.
// Nothing is delivered when the agent is not loaded ("RM Init failed for
// <source>").  Locks, in order: adapter data ready, adapter maps ready,
// m_DataMutex, the provider's own mutex (for the refresh only).
int enumerate_refreshed(const char* class_name, const char* source, Map_Selector select, Status_Refresh refresh,
                        const Handler& handler);

}  // namespace cimple
