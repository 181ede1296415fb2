// Comparisons of a built data set with what its site file describes, shared
// by the tests of the sample site and of the sites with injected faults.
#pragma once

#include <functional>
#include <set>
#include <string>
#include <vector>

#include "DataTestSupport.h"
#include "data/NRV_Data.h"

namespace nrv_data_test {

// Every function listed is an adapter of the right kind, name, number and
// identifier, in enumeration order (and no other adapter exists); each has one port named by its identifier
// whose attribute sets hold the site's values, except the adapters whose
// identifier is in `portless`, which have no ports.
void expectAdapters(const cimple::Data& data, const std::vector<Function>& functions,
                    const std::set<std::string>& portless = {});

// How one logical unit is expected to look after discovery.
enum class LunExpectation { kComplete, kNoInquiry, kNoCapacity };

// Every FCoE port holds one target per logical unit its function sees, in
// order, with the site's names, LUN, inquiry and capacity data; `expectation`
// says which parts a fault took away (empty: none).  Functions for which
// `scanned` answers false must have no targets (empty: all are scanned); NIC
// and iSCSI ports never have any.
void expectTargets(
    const cimple::Data& data, const std::vector<Function>& functions,
    const std::function<LunExpectation(const Function&, const Lun&)>& expectation =
        [](const Function&, const Lun&) { return LunExpectation::kComplete; },
    const std::function<bool(const Function&)>& scanned = [](const Function&) { return true; });

// The type the data set gives a site function kind.
uint32_t adapterTypeOf(const std::string& kind);

}  // namespace nrv_data_test
