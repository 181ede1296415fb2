// Reads a site description (JSON, format in sim/README.md) into a Site and
// its fault rules.  A malformed file is refused as a whole with one message
// naming the JSON path at fault; nothing here throws to the caller.
#pragma once

#include <string>
#include <vector>

#include "sim/FaultPlan.h"
#include "sim/SiteModel.h"

namespace nrvsim {

struct LoadedSite {
  Site site;
  std::vector<FaultRule> faults;
};

struct LoadResult {
  bool ok = false;
  std::string error;  // "<file>: <json path>: <reason>" when !ok
  LoadedSite loaded;
};

LoadResult load_site_text(const std::string& text, const std::string& origin);
LoadResult load_site_file(const std::string& path);

}  // namespace nrvsim
