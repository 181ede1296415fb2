// What the SAN catalogue tests share: a site derived from the sample site
// (with its faults and additions) run in a child process of its own, since
// the simulator reads its site once per process, and counting a class's map.
#pragma once

#include <mutex>
#include <nlohmann/json.hpp>
#include <string>

#include "AgentTestSupport.h"
#include "agent/Catalogue_Maps.h"

namespace nrv_test {

// The sample site as JSON.
nlohmann::json sample_site();

// Writes `site` into the test's system root and runs the disabled test
// `child` in a child process over it, with `env` added; the child's exit code.
int run_over_site(const nlohmann::json& site, const std::string& child, const std::vector<std::string>& env = {});

// Loads a SAN provider with the agent's own builders and waits for the first
// full catalogue; the provider is unloaded (and the agent released) by the
// returned slot's owner.
std::unique_ptr<ProviderSlot> load_san_catalogue();

// Rebuilds the SAN part of the catalogue and waits for it.
void rebuild_san(cimple::ProviderAgent& agent);

template <class C>
size_t count(cimple::ProviderAgent& agent) {
  std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
  return cimple::agent_map<C>(agent).size();
}

}  // namespace nrv_test
