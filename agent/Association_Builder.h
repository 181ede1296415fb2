// The one builder behind every association class of the adapter catalogue:
// associate<A>(build, label, first, second) links two instances through A,
// whose references (taken in declaration order from A's generated meta-data)
// receive shared key copies of the two ends, and inserts it into A's map.
// The few log texts that differ from the common ones live in one table in
// Association_Builder.cpp.
//
// Contract: m_DataMutex held (runs inside updateAdapterMaps).  Answers the
// association now owned by its map, or null after logging at NRV_CRIT: a
// missing end (the class's "wrong input" text), an end whose class does not
// fit the reference, or a refused insert (the class's insert-failure text).
// The ends are not changed and stay owned by their maps.
#pragma once

#include <string>

#include "agent/Catalogue_Build.h"

namespace cimple {

Instance* build_association(Catalogue_Build& build, Instance_Map& map, const Meta_Class* mc, const std::string& label,
                            const Instance* first, const Instance* second);

template <class A>
A* associate(Catalogue_Build& build, const std::string& label, const Instance* first, const Instance* second) {
  return static_cast<A*>(
      build_association(build, agent_map<A>(build.agent), &A::static_meta_class, label, first, second));
}

// The two single references of an association class, in declaration order
// (null when the class has fewer).
struct Association_Ends {
  const Meta_Reference* first = nullptr;
  const Meta_Reference* second = nullptr;
};
Association_Ends association_ends(const Meta_Class* mc);

}  // namespace cimple
