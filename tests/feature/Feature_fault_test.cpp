// Each management call of the feature builders failing in turn (one fault
// rule of the simulator per row): the failure is logged and takes away only
// the instances it concerns; every other instance of the catalogue is the
// same as over the unfaulted site.
#include <algorithm>

#include "FeatureTestSupport.h"
#include "schema/Classes.h"

namespace feature_test {
namespace {

using namespace cimple;

// Which functions a row's fault is addressed to.
enum class Target { FirstFcoe, FirstNic, Card2, Any };

struct Fault_Row {
  const char* name;
  const char* function;
  Target target;
  // Class and the part of the key its dropped instances carry ("" : none dropped).
  std::vector<std::pair<const char*, std::string>> dropped;
  const char* message;  // a message the failure logs
};

// Key fragments, filled in from the site when the rows run.
constexpr const char* kFirstFcoe = "@fcoe";
constexpr const char* kFirstNic = "@nic";
constexpr const char* kCard2 = "NV41T5120A03342";
constexpr const char* kCard1 = "NV52C4213A07719";

const Fault_Row kRows[] = {
    {"FruVpd", "LRM_GetVPDV2", Target::Card2,
     // The card is still made, but keyed by its serial number instead of its FRU UUID.
     {{"NRVTAVO_FRUVitalProductData", kCard2}, {"NRVTAVO_FRUElementVPD", kCard2},
      {"NRVTAVO_Card", "0b77e2a41c9f4e03a5d2c1e6f0a43342"}},
     "Unable to get the FRU VPD for Card : NV41T5120A03342 "},
    {"GeneralVpd", "LRM_GetVPD", Target::FirstNic, {{"NRVTAVO_VitalProductData", kFirstNic}},
     "ERROR: RM_GetVPD call failed : 5"},
    {"VirtualPortList", "LRM_VPList", Target::FirstFcoe,
     {{"NRVTAVO_ResourcePool", kFirstFcoe}, {"NRVTAVO_HostedResourcePool", kFirstFcoe},
      {"NRVTAVO_VirtualFCPort", "10000090FA5C2EA"}, {"NRVTAVO_VPortHostedDependency", kFirstFcoe},
      {"NRVTAVO_ElementAllocatedFromPool", kFirstFcoe}},
     "NRVTAVO_PortVirtualization::Failure in listing vports for port: 10000090FA5C2E12, Rm Error: 5"},
    {"VirtualPortAttributes", "LRM_VPGetAttributes", Target::FirstFcoe, {},
     "NRVTAVO_PortVirtualization::Failure in listing vports information for port: 10000090FA5C2EA2, Rm Error: 5"},
    {"SffData", "RM_GetSffData", Target::FirstFcoe, {{"NRVTAVO_Transceiver", kFirstFcoe}},
     "Unable to obtain transceiver data for this host bus adapter."},
    {"GlobalDriverParameters", "LRM_GetDriverParamsGlobal", Target::Any,
     {{"NRVTAVO_DriverParameterSettingData", "Global"}},
     "ERROR: nrvcimGetDriverParamsGlobal: RM_GetDriverParamsGlobal call failed (b) (5)"},
    {"LocalDriverParameters", "LRM_GetDriverParams", Target::FirstFcoe,
     {{"NRVTAVO_DriverParameterSettingData", "Local"}},
     "ERROR: nrvcimGetDriverParams: RM_GetDriverParams call failed (b) (5)"},
    {"EventLogConfiguration", "LRM_Get_VG_EventLogConfigDataAll", Target::FirstNic,
     {{"NRVTAVO_ExtFATDumpAdvancedData", kCard1}, {"NRVTAVO_ElementExtFATDumpAdvancedData", kCard1}},
     "Failed to get the ExtFATDump settings for chip : NV52C4213A07719 , exited with the error code 5 "},
    {"DumpDirectory", "LRM_GetDumpDirectoryA", Target::FirstNic, {}, "Failed to get the Dump Directory"},
    {"RetentionCount", "LRM_GetDumpRetentionCount", Target::FirstNic, {}, "Failed to get the Retention Count"},
    // A port the library no longer owns: every operation that checks it first.
    {"LocalAdapterCheck", "RM_IsLocalHBA", Target::FirstFcoe,
     {{"NRVTAVO_VitalProductData", kFirstFcoe}, {"NRVTAVO_ResourcePool", kFirstFcoe},
      {"NRVTAVO_HostedResourcePool", kFirstFcoe}, {"NRVTAVO_VirtualFCPort", "10000090FA5C2EA"},
      {"NRVTAVO_VPortHostedDependency", kFirstFcoe}, {"NRVTAVO_ElementAllocatedFromPool", kFirstFcoe},
      {"NRVTAVO_DriverParameterSettingData", "NRV:FCoE"}},
     "HBA IS NOT LOCAL"},
};

class FaultedFeatures : public FeatureTest, public ::testing::WithParamInterface<Fault_Row> {
 protected:
  std::vector<std::string> addressees(Target target) const {
    switch (target) {
      case Target::FirstFcoe: return {nth(kFCoEAdapterType).id};
      case Target::FirstNic: return {nth(kNICAdapterType).id};
      case Target::Any: return {""};
      case Target::Card2: {
        std::vector<std::string> ids;
        for (const Function& f : functions())
          if (f.serial == kCard2) ids.push_back(f.id);
        return ids;
      }
    }
    return {};
  }

  std::string fragment(const std::string& key) const {
    if (key == kFirstFcoe) return nth(kFCoEAdapterType).id;
    if (key == kFirstNic) return nth(kNICAdapterType).id;
    return key;
  }
};

TEST_P(FaultedFeatures, TakeAwayOnlyTheirOwnInstances) {
  const Fault_Row& row = GetParam();
  runFeatures(agent());
  const Snapshot before = snapshot(agent());

  nlohmann::json site = sampleSite();
  for (const std::string& id : addressees(row.target)) {
    nlohmann::json rule = {{"function", row.function}, {"status", 5}};
    if (!id.empty()) rule["adapter"] = id;
    addFault(site, rule);
  }
  loadSite(site);
  capture.reset();
  runFeatures(agent());
  const Snapshot after = snapshot(agent());

  EXPECT_GT(capture.count(row.message), 0) << row.message;
  for (const auto& [droppedClass, key] : row.dropped) {
    const std::set<std::string>& keys = before.at(droppedClass);
    EXPECT_TRUE(std::any_of(keys.begin(), keys.end(),
                            [&](const std::string& k) { return k.find(fragment(key)) != std::string::npos; }))
        << droppedClass << " had nothing to lose";
  }
  for (const auto& [cls, keys] : before) {
    std::string fragmentDropped;
    for (const auto& [droppedClass, key] : row.dropped)
      if (cls == droppedClass) fragmentDropped = fragment(key);
    for (const std::string& key : keys) {
      const bool dropped = !fragmentDropped.empty() && key.find(fragmentDropped) != std::string::npos;
      EXPECT_EQ(after.at(cls).count(key), dropped ? 0u : 1u) << cls << ": " << key;
    }
    if (fragmentDropped.empty()) {
      EXPECT_EQ(after.at(cls).size(), keys.size()) << cls;
    }
  }
}

INSTANTIATE_TEST_SUITE_P(EachCall, FaultedFeatures, ::testing::ValuesIn(kRows),
                         [](const ::testing::TestParamInfo<Fault_Row>& info) { return info.param.name; });

}  // namespace
}  // namespace feature_test
