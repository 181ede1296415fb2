// Helpers of the feature-builder tests: an agent over the simulated site whose
// adapter catalogue holds the instances the builders read (host system,
// cards, chips, ports, port controllers, firmware identities and their links,
// made from the adapter data set as the catalogue frame makes them), site
// copies with faults loaded into the simulator in-process, and text checks.
#pragma once

#include <gtest/gtest.h>

#include <map>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "../agent/AgentTestSupport.h"
#include "access/NRV_Catalogue.h"
#include "agent/Agent_Catalogue.h"
#include "data/NRV_Data.h"

namespace feature_test {

// The host system the seeded catalogue names.
inline constexpr const char* kHostName = "feature-host";

// What the seeded catalogue and the tests know of one function of the data set.
struct Function {
  uint32_t type = 0;        // cimple::AdapterType
  std::string id;           // identifier text (16 upper-case hex digits)
  std::string serial;       // the card's serial number
  std::string chipTag;      // serial[:sub-adapter]
  uint32_t physicalPort = 0;
};

// The functions of the agent's data set, in discovery order.
std::vector<Function> functionsOf(const cimple::Data& data);

nlohmann::json sampleSite();
// Loads `site` into the simulator of this process (a copy written to a file).
void loadSite(const nlohmann::json& site);
// Appends a fault rule to `site`.
void addFault(nlohmann::json& site, const nlohmann::json& rule);
// "10:00:00:90:fa:5c:2e:12" -> "10000090FA5C2E12".
std::string plainHex(const std::string& text);

// An agent built over the (reloaded) sample site with the seeded catalogue;
// tests lock data() while they run builders and read maps.
class FeatureTest : public ::testing::Test {
 protected:
  void SetUp() override;
  void TearDown() override;

  cimple::ProviderAgent& agent() { return *m_Agent; }
  cimple::Agent_Catalogue& catalogue() { return *m_Catalogue; }
  std::recursive_mutex& data() { return m_Agent->m_DataMutex; }
  const std::vector<Function>& functions() const { return m_Functions; }
  // The first function of `type` (cimple::AdapterType), or the n-th.
  const Function& nth(uint32_t type, size_t n = 0) const;

  nrv_test::LogCapture capture;

 private:
  cimple::ProviderAgent* m_Agent = nullptr;
  std::unique_ptr<cimple::Agent_Catalogue> m_Catalogue;
  std::vector<Function> m_Functions;
};

// Every feature builder over the seeded catalogue, in the order the adapter
// catalogue runs them, after emptying what they fill: the card VPD flow
// (cards found by serial number, made and merged for their first function),
// CreateVPD for each function, the firmware identities, port
// virtualization, transceivers, global (first FCoE port) and local driver
// parameters, and the dump service.  The agent's data lock is taken inside.
void runFeatures(cimple::ProviderAgent& agent);

// The keys (model paths) of every instance the feature builders make, by class.
using Snapshot = std::map<std::string, std::set<std::string>>;
Snapshot snapshot(cimple::ProviderAgent& agent);

// String property `name` of `instance` ("<null>" when null), and the check
// of several against their expected texts.
std::string text(const cimple::Instance* instance, const char* name);
void expectTexts(const cimple::Instance* instance,
                 std::initializer_list<std::pair<const char*, std::string>> expected);
// A string-array property as texts (none when null).
std::vector<std::string> texts(const cimple::Property<cimple::Array<cimple::String>>& array);

// The instance of map `C` whose InstanceID equals `key`, or null.
template <class C>
const C* byInstanceID(cimple::NRV_Catalogue& catalogue, const std::string& key) {
  return cimple::findIn<C>(catalogue.of<C>(), [&](const C& c) { return cimple::textOf(c.InstanceID) == key; });
}

}  // namespace feature_test
