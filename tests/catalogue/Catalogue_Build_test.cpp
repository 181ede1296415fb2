// The adapter catalogue's build on the agent itself, over the simulated
// sample site: the failures that end the build early (32769, what was built
// stays, the maps are still marked ready), and the texts of the association
// builder's refusals.
#include <gtest/gtest.h>

#include <atomic>

#include "AgentFixture.h"
#include "agent/Association_Builder.h"
#include "agent/Catalogue_Features.h"
#include "data/NRV_Data.h"
#include "derivedObjects/Catalogue_Provider.h"
#include "schema/Classes.h"

namespace nrv_test {
namespace {

using namespace cimple;

std::atomic<int> s_Result{-1};

void real_data(ProviderAgent& agent) { agent.m_pData->buildAdapterData(); }
void no_data(ProviderAgent& agent) { agent.m_pData.reset(); }
void update_and_keep_result(ProviderAgent& agent) { s_Result = agent.updateAdapterMaps(); }
void nothing(ProviderAgent&) {}

int failing_feature(Catalogue_Build&, const Function_View*) { return 7; }

class CatalogueBuild : public AgentTest {
 protected:
  // Loads providers of the classes read below with the given data step,
  // reads the record logs once (waiting for the maps) and answers their count.
  size_t build_with(void (*data)(ProviderAgent&)) {
    s_Result = -1;
    ProviderAgent::useBuilders({data, update_and_keep_result, nothing, nothing, nothing});
    EXPECT_EQ(logs->load(), LOAD_OK);
    EXPECT_EQ(chips->load(), LOAD_OK);
    EXPECT_EQ(wwn->load(), LOAD_OK);
    Collected read;
    EXPECT_EQ(logs->enumerate(read), ENUM_INSTANCES_OK);
    wait_fetch_idle(*ProviderAgent::peekInstance());
    return read.instances.size();
  }
  size_t count(ProviderSlot& slot) {
    Collected read;
    slot.enumerate(read);
    return read.instances.size();
  }
  void TearDown() override {
    logs.reset();
    chips.reset();
    wwn.reset();
    AgentTest::TearDown();
  }

  std::unique_ptr<ProviderSlot> logs = make_slot<Catalogue_Provider<NRVTAVO_RecordLog>, NRVTAVO_RecordLog>();
  std::unique_ptr<ProviderSlot> chips = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
  std::unique_ptr<ProviderSlot> wwn = make_slot<Catalogue_Provider<NRVTAVO_FCWWNService>, NRVTAVO_FCWWNService>();
};

TEST_F(CatalogueBuild, TheSampleSiteBuildsToTheEnd) {
  EXPECT_EQ(build_with(real_data), 2u);
  EXPECT_EQ(s_Result, 0);
  EXPECT_EQ(count(*chips), 2u);
  EXPECT_EQ(count(*wwn), 1u);
  EXPECT_TRUE(capture.contains("PERF: updateAdapterMaps: cleanExit"));
  EXPECT_TRUE(capture.contains("10GBaseT feature is either Not Supported/Failed to Create the feature"));
}

TEST_F(CatalogueBuild, AMissingDataSetEndsTheBuildAtTheFCoEStepKeepingWhatWasBuilt) {
  // The record logs (step 15) stay; the WWN service (step 16) never comes.
  EXPECT_EQ(build_with(no_data), 2u);
  EXPECT_EQ(s_Result, 32769);
  EXPECT_EQ(capture.count("Could not locate the data pointer for FCoE - Serious issue", NRV_CRIT), 1);
  EXPECT_EQ(count(*wwn), 0u);
  EXPECT_FALSE(capture.contains("PERF: updateAdapterMaps: cleanExit"));
  EXPECT_TRUE(ProviderAgent::peekInstance()->m_bIsAdapterMapsReady);
}

TEST_F(CatalogueBuild, AFailingISCSICatalogueEndsTheBuildAfterEverythingElse) {
  set_feature_builder(Feature::kIscsiCatalogue, failing_feature);
  EXPECT_EQ(build_with(real_data), 2u);
  set_feature_builder(Feature::kIscsiCatalogue, nullptr);
  EXPECT_EQ(s_Result, 32769);
  EXPECT_TRUE(capture.contains("iSCSI discovery failed"));
  EXPECT_EQ(count(*chips), 2u);
  EXPECT_EQ(count(*wwn), 1u);
}

// Every hook of the frame logs its failure text while no builder is
// installed, and again when its builder fails; the build goes on either way.
TEST_F(CatalogueBuild, EachFeatureHookLogsItsNotSupportedTextWithoutABuilder) {
  const std::pair<Feature, const char*> kHooks[] = {
      {Feature::kPhy, "10GBaseT feature is either Not Supported/Failed to Create the feature"},
      {Feature::kNicSettingService, "NIC Setting Service feature is either Not Supported/Failed to Create the feature"},
      {Feature::kNicDriverLog, "NIC driver log feature is either Not Supported/Failed to Create the feature"},
      {Feature::kNicCee, "CEE feature for NIC port is either Not Supported/Failed to Create the feature"},
      {Feature::kDownPorts, "Down Ethernet port feature is either Not Supported/Failed to Create the feature"},
      {Feature::kFcPfcThrottle, "PFC throttle feature is either Not Supported/Failed to Create the feature"},
      {Feature::kFcDriverLog, "FC driver log feature is either Not Supported/Failed to Create the feature"},
      {Feature::kFcFip, "FIP feature is either Not Supported/Failed to Create the feature"},
      {Feature::kFcCee, "CEE feature for FCoE port is either Not Supported/Failed to Create the feature"},
      {Feature::kDiagnostics, "Dignostic Test creation failed"},
      {Feature::kSrIov, "CreateNICSrIovClasses failed"},
      {Feature::kChannelManagement, "Updating MC parameters failed"},
      {Feature::kIscsiCatalogue, "iSCSI discovery failed"},
  };
  build_with(real_data);
  ProviderAgent& agent = *ProviderAgent::peekInstance();
  std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
  Catalogue_Build build(agent);
  for (const auto& [feature, text] : kHooks) {
    const Feature_Builder installed = feature_builder(feature);
    set_feature_builder(feature, nullptr);
    capture.reset();
    EXPECT_EQ(run_feature(build, feature), Feature_Result::kNotBuilt) << text;
    EXPECT_EQ(capture.count(text, NRV_DBG), 1) << text;
    set_feature_builder(feature, failing_feature);
    EXPECT_EQ(run_feature(build, feature), Feature_Result::kFailed) << text;
    EXPECT_EQ(capture.count(text, NRV_DBG), 2) << text;
    set_feature_builder(feature, installed);
  }
}

TEST_F(CatalogueBuild, TheAssociationBuilderRefusesMissingEndsAndDuplicates) {
  build_with(real_data);
  ProviderAgent& agent = *ProviderAgent::peekInstance();
  std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
  Catalogue_Build build(agent);
  Instance* service = agent.m_NRVTAVO_SoftwareInstallationService_map[0];
  Instance* caps = agent.m_NRVTAVO_SoftwareInstallationServiceCapabilities_map[0];
  capture.reset();
  EXPECT_EQ(associate<NRVTAVO_ElementCapabilities>(build, "label", service, nullptr), nullptr);
  EXPECT_EQ(capture.count("Wrong input to createAssoc_Service_Capability", NRV_CRIT), 1);
  // The build already linked these two.
  EXPECT_EQ(associate<NRVTAVO_ElementCapabilities>(build, "label", service, caps), nullptr);
  EXPECT_EQ(capture.count("Insert Failed", NRV_CRIT), 1);
  // Ends of the wrong class are refused before anything is made.
  EXPECT_EQ(associate<NRVTAVO_ElementCapabilities>(build, "label", caps, service), nullptr);
  EXPECT_EQ(capture.count("Could not create the instance of the Association class", NRV_CRIT), 1);
  EXPECT_EQ(agent.m_NRVTAVO_ElementCapabilities_map.size(), 1u);
  // Installed on the host with the label in the text.
  EXPECT_EQ(associate<NRVTAVO_InstalledSoftwareIdentity>(build, "driver x", nullptr, caps), nullptr);
  EXPECT_TRUE(capture.contains("Generating createTAVOInstalledSoftwareIdentity failed (driver x)"));
}

}  // namespace
}  // namespace nrv_test
