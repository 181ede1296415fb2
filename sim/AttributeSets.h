// The attribute and statistics blobs the management library answers for one
// function: what RM_GetHBAAttributes, RM_GetPortAttributes / RM_GetPortState
// and RM_GetPortStatistics write.  Values come from the site model; a
// function's "hba_attributes" / "port_attributes" / "statistics" entries in
// the site override or add numbers.
#pragma once

#include <cstdint>
#include <vector>

#include "sim/SiteModel.h"

namespace nrvsim::rm {

std::vector<uint8_t> hba_attribute_blob(const Card& card, const Function& fn);
std::vector<uint8_t> port_attribute_blob(const Card& card, const Function& fn);
std::vector<uint8_t> port_statistics_blob(const Card& card, const Function& fn);

}  // namespace nrvsim::rm
