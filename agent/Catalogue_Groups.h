// The catalogue's maps grouped by who empties them and when: the adapter
// groups (clearAdapterMaps, in this order), the two SAN groups (clearSANMaps)
// and the survivors, which no rebuild empties (diagnostic jobs and records,
// iSCSI setting service and statistics data: their owners empty them).
//
// Each list is an X-macro over the instance struct names (a map is named
// m_<struct>_map), generated from schema/provider_lists.txt; the generator
// refuses lists in which a map is in no group or in two.
#pragma once

#include "schema/CatalogueGroups.h"
