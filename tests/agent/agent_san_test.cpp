// The SAN catalogue over simulated sites with faults: each scenario runs the
// agent's own builders in a child process over the sample site changed as
// the row says, and checks what the catalogue holds afterwards.
#include <gtest/gtest.h>

#include <cstdlib>

#include "access/NRV_Common.h"
#include "access/NRV_MethodWrapper.h"
#include "logging/Log.h"
#include "san_test_support.h"
#include "schema/Classes.h"

namespace nrv_test {
namespace {

using namespace cimple;
using nlohmann::json;

const char kIscsiPort0[] = "0090FA5C2E110000";
const char kTapeTarget[] = "iqn.2003-10.com.quantum:scalar-i3.tl1";

json& iscsi_port1(json& site) { return site["cards"][0]["functions"][3]; }

struct Scenario {
  const char* name;
  json faults;
  void (*edit)(json& site);
  void (*check)(ProviderAgent& agent, const LogCapture& log);
};

// LUN 1 behind the first FCoE port: a disk on one target, a changer on the
// other.  Without an INQUIRY answer both are of unknown type: storage extents.
void check_inquiry_failed(ProviderAgent& agent, const LogCapture& log) {
  EXPECT_EQ(count<NRVTAVO_StorageVolume>(agent), 6u);
  EXPECT_EQ(count<NRVTAVO_StorageExtent>(agent), 10u);
  EXPECT_EQ(count<NRVTAVO_SCSIInitiatorTargetStorageVolumePath>(agent), 4u);
  EXPECT_EQ(count<NRVTAVO_SCSIInitiatorTargetStorageExtentPath>(agent), 5u);
  EXPECT_EQ(count<NRVTAVO_StorageExtentSystemDevice>(agent), 10u);
  // Two units of type 31 in the sample and the two that did not answer.
  EXPECT_EQ(log.count("Peripheral devices type is 0x1F"), 4);
}

void add_many_targets(json& site) {
  for (int i = 0; i < 200; ++i) {
    char name[64];
    snprintf(name, sizeof name, "iqn.2026-01.com.example:many.t%03d", i);
    iscsi_port1(site)["iscsi_targets"].push_back(
        {{"name", name}, {"portal", "10.20.41.200:3260"}, {"luns", json::array({{{"lun", 0}, {"type", 0}}})}});
  }
}

void check_many_targets(ProviderAgent& agent, const LogCapture& log) {
  EXPECT_EQ(count<NRVTAVO_iSCSITargetProtocolEndpoint>(agent), 204u);
  EXPECT_EQ(count<NRVTAVO_StorageVolume>(agent), 207u);
  EXPECT_FALSE(log.contains("ERROR: GetiSCSITargets Failed."));
}

// The first target listing sessions (two, of two connections each) loses
// them; its units stay, without a path, and every other target is whole.
void check_sessions_failed(ProviderAgent& agent, const LogCapture& log) {
  EXPECT_TRUE(log.contains("ERROR: RM_iSCSI_GetSessions() Failed."));
  EXPECT_EQ(count<NRVTAVO_iSCSISession>(agent), 2u);
  EXPECT_EQ(count<NRVTAVO_iSCSIConnection>(agent), 1u);
  EXPECT_EQ(count<NRVTAVO_iSCSIProtocolEndpoint>(agent), 1u);
  EXPECT_EQ(count<NRVTAVO_StorageVolume>(agent), 7u);
  EXPECT_EQ(count<NRVTAVO_iSCSIInitiatorTargetStorageVolumePath>(agent), 0u);
  EXPECT_EQ(count<NRVTAVO_iSCSIInitiatorTargetTapeDrivePath>(agent), 1u);
  EXPECT_EQ(count<NRVTAVO_iSCSITargetProtocolEndpoint>(agent), 4u);
}

// The tape library's target goes between two rebuilds: its tape, changer and
// enclosure, their paths, its session and connection go with it.
void check_target_removed(ProviderAgent& agent, const LogCapture&) {
  ASSERT_EQ(count<NRVTAVO_TapeDrive>(agent), 2u);
  HBA_NAME port{};
  ASSERT_EQ(string2HBAName(&port, kIscsiPort0), 1);
  ASSERT_EQ(NRV_MethodWrapper::RemoveTarget(port, kTapeTarget), 0u);
  rebuild_san(agent);
  EXPECT_EQ(count<NRVTAVO_TapeDrive>(agent), 1u);
  EXPECT_EQ(count<NRVTAVO_TapeDriveSystemDevice>(agent), 1u);
  EXPECT_EQ(count<NRVTAVO_iSCSIInitiatorTargetTapeDrivePath>(agent), 0u);
  EXPECT_EQ(count<NRVTAVO_iSCSIInitiatorTargetStorageExtentPath>(agent), 1u);
  EXPECT_EQ(count<NRVTAVO_iSCSIInitiatorTargetArbitraryLogicalUnitPath>(agent), 0u);
  EXPECT_EQ(count<NRVTAVO_StorageExtent>(agent), 8u);
  EXPECT_EQ(count<NRVTAVO_SCSIArbitraryLogicalUnit>(agent), 3u);
  EXPECT_EQ(count<NRVTAVO_iSCSISession>(agent), 3u);
  EXPECT_EQ(count<NRVTAVO_iSCSIConnection>(agent), 4u);
  EXPECT_EQ(count<NRVTAVO_iSCSITargetProtocolEndpoint>(agent), 3u);
  std::lock_guard<std::recursive_mutex> data(agent.m_DataMutex);
  const Instance_Map& targets = agent.m_NRVTAVO_iSCSITargetProtocolEndpoint_map;
  for (size_t i = 0; i < targets.size(); ++i)
    EXPECT_NE(static_cast<const NRVTAVO_iSCSITargetProtocolEndpoint*>(targets[i])->Identifier.value.str(),
              kTapeTarget);
}

// The first FCoE port's disk array is zoned to the second port too: its
// endpoint and its units stay one each, every unit gaining a second path.
void share_target(json& site) {
  json& functions = site["cards"][0]["functions"];
  functions[5]["targets"].push_back(functions[4]["targets"][0]);
}

void check_shared_target(ProviderAgent& agent, const LogCapture& log) {
  EXPECT_EQ(count<NRVTAVO_SCSIProtocolEndpoint>(agent), 3u);
  EXPECT_EQ(count<NRVTAVO_LocalHostedAccessPoint>(agent), 3u);
  EXPECT_EQ(count<NRVTAVO_StorageVolume>(agent), 7u);
  EXPECT_EQ(count<NRVTAVO_StorageVolumeSystemDevice>(agent), 7u);
  EXPECT_EQ(count<NRVTAVO_SCSIInitiatorTargetStorageVolumePath>(agent), 9u);
  EXPECT_EQ(count<NRVTAVO_SCSIArbitraryLogicalUnit>(agent), 4u);
  EXPECT_EQ(count<NRVTAVO_SCSIInitiatorTargetArbitraryLogicalUnitPath>(agent), 3u);
  EXPECT_FALSE(log.contains("Insert Failed : m_NRVTAVO_StorageVolume_map"));
}

const Scenario kScenarios[] = {
    {"inquiry fails",
     json::parse(R"([{"function": "HBA_SendScsiInquiry", "status": 1, "lun": 1,
                      "adapter": "10:00:00:90:fa:5c:2e:12"}])"),
     nullptr, check_inquiry_failed},
    {"inquiry answers check condition",
     json::parse(R"([{"function": "HBA_SendScsiInquiry", "status": 9, "lun": 1,
                      "adapter": "10:00:00:90:fa:5c:2e:12"}])"),
     nullptr, check_inquiry_failed},
    {"target list larger than the first buffer", json::array(), add_many_targets, check_many_targets},
    {"session listing fails", json::parse(R"([{"function": "RM_iSCSI_GetSessions", "status": 1, "call": 1}])"),
     nullptr, check_sessions_failed},
    {"target goes between rebuilds", json::array(), nullptr, check_target_removed},
    {"one target port behind two initiators", json::array(), share_target, check_shared_target},
};

TEST(SanCatalogueTest, FaultsStayWithTheirItem) {
  for (size_t i = 0; i < std::size(kScenarios); ++i) {
    const Scenario& s = kScenarios[i];
    SCOPED_TRACE(s.name);
    json site = sample_site();
    site["faults"] = s.faults;
    if (s.edit) s.edit(site);
    EXPECT_EQ(run_over_site(site, "SanCatalogueTest.DISABLED_Scenario", {"NRV_SAN_SCENARIO=" + std::to_string(i)}),
              0);
  }
}

TEST(SanCatalogueTest, DISABLED_Scenario) {
  const Scenario& s = kScenarios[std::atoi(std::getenv("NRV_SAN_SCENARIO"))];
  LogCapture log;
  auto slot = load_san_catalogue();
  ASSERT_NE(slot, nullptr);
  s.check(*ProviderAgent::peekInstance(), log);
  EXPECT_EQ(slot->unload(), UNLOAD_OK);
}

}  // namespace
}  // namespace nrv_test
