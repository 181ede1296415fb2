// The catalogue of sites whose management library fails in one creator, and
// of a host whose name does not resolve, each in an nrv-cim process of its
// own (the simulated library reads its site once per process): the build goes
// on and the catalogue lacks only what the failing call would have given.
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "tests/host/HostTestSupport.h"

namespace {

using nrv::host::test::runClient;

std::string sysroot() { return std::getenv("NRV_SYSROOT"); }

// The sample site with `faults`, written into the test's system root.
std::string site_with(const std::string& name, const nlohmann::json& faults) {
  std::ifstream in(NRV_SAMPLE_SITE);
  nlohmann::json site = nlohmann::json::parse(in);
  site["faults"] = faults;
  const std::string path = sysroot() + "/" + name + ".json";
  std::ofstream(path) << site.dump();
  return path;
}

struct Client {
  std::vector<std::string> env;
  // Instance paths of the class, one per line; -1 when the call failed.
  int count(const std::string& class_name) const {
    auto r = runClient({"ein", "root/norvane:" + class_name}, env);
    if (r.status != 0) return -1;
    int lines = 0;
    for (char c : r.out) lines += c == '\n';
    return lines;
  }
  std::string instances(const std::string& class_name) const {
    return runClient({"ei", "root/norvane:" + class_name}, env).out;
  }
};

struct Fault_Case {
  const char* name;
  const char* fault;  // JSON of one fault rule
  const char* shrinks;
  int left;           // instances of `shrinks` left
  const char* unchanged;
  int count;          // instances of `unchanged`, as without the fault
};

// One creator's library call failing; the FC port statistics and record logs
// (built late) show that the build went on.
const Fault_Case kFaults[] = {
    {"pci_registers", R"({"function": "RM_DiagReadPCIRegistersV2", "status": 5})", "NRVTAVO_PCIDevice", 0,
     "NRVTAVO_EthernetPort", 8},
    {"pci_registers_one", R"({"function": "RM_DiagReadPCIRegistersV2", "status": 5, "adapter": "10:00:00:90:fa:5c:2e:12"})",
     "NRVTAVO_FCConcreteIdentity", 1, "NRVTAVO_FCPort", 2},
    {"hba_attributes_one", R"({"function": "LRM_GetHBAAttributes", "status": 190, "adapter": "00:90:fa:71:b4:03:00:00"})",
     "NRVTAVO_EthernetPort", 7, "NRVTAVO_Card", 2},
    // The iSCSI functions' IP endpoints come from their network properties.
    {"port_attributes", R"({"function": "LRM_GetPortAttributes", "status": 5})", "NRVTAVO_IPProtocolEndpoint", 2,
     "NRVTAVO_FCPortStatistics", 2},
    {"beacon", R"({"function": "RM_DiagBeaconState", "status": 5})", "NRVTAVO_EthernetPort", 8, "NRVTAVO_RecordLog",
     2},
    {"versions", R"({"function": "RM_GetVersion", "status": 5})", "NRVTAVO_SoftwareIdentity", 5,
     "NRVTAVO_FCPortStatistics", 2},
};

TEST(CatalogueFaults, AFailingCreatorLeavesAPartialCatalogueAndTheBuildGoesOn) {
  for (const Fault_Case& c : kFaults) {
    SCOPED_TRACE(c.name);
    const Client client{{"NRV_SITE=" + site_with(c.name, nlohmann::json::array({nlohmann::json::parse(c.fault)}))}};
    EXPECT_EQ(client.count(c.shrinks), c.left);
    EXPECT_EQ(client.count(c.unchanged), c.count);
  }
}

TEST(CatalogueFaults, FailedVersionAndOSReadsLeaveTheProviderIdentityWithoutThem) {
  const Client client{{"NRV_SITE=" + site_with("identity", nlohmann::json::parse(R"([
      {"function": "RM_GetVersion", "status": 5}, {"function": "RM_TiroVersion", "status": 5},
      {"function": "LRM_GetServerAttributes", "status": 5}])"))}};
  const std::string identities = client.instances("NRVTAVO_SoftwareIdentity");
  EXPECT_NE(identities.find("Norvane CMPI TAVO Provider v10.2.107-7"), std::string::npos);
  EXPECT_EQ(identities.find("LibRMAPIVersion"), std::string::npos);
  EXPECT_EQ(identities.find("LibTIROVersion"), std::string::npos);
  EXPECT_EQ(identities.find("TargetOSTypes"), std::string::npos);
  const Client healthy{{"NRV_SITE=" NRV_SAMPLE_SITE}};
  EXPECT_NE(healthy.instances("NRVTAVO_SoftwareIdentity").find("LibRMAPIVersion"), std::string::npos);
}

TEST(CatalogueFaults, AnUnresolvableHostNameStillBuildsTheCatalogue) {
  // The module's default log, where the failure is told.
  std::filesystem::create_directories(sysroot() + "/opt/kelvar/platform/log");
  const Client client{{"LD_PRELOAD=" NRV_UNRESOLVABLE_HOST,
                       "ASAN_OPTIONS=detect_leaks=1:abort_on_error=0:verify_asan_link_order=0"}};
  EXPECT_EQ(client.count("NRVTAVO_Card"), 2);
  EXPECT_EQ(client.count("NRVTAVO_ComputerSystemConformsToProfile"), 11);
  std::ifstream log(sysroot() + "/opt/kelvar/platform/log/norvane_tavo_provider_ffdc.log");
  const std::string text((std::istreambuf_iterator<char>(log)), std::istreambuf_iterator<char>());
  EXPECT_NE(text.find("Error! gethostbyname() failed, using 'unknown' for IP address."), std::string::npos);
}

}  // namespace

namespace {

// nrv-cim's tree from the chassis: every card, chip, port controller and
// port of the sample site once, each indented under the object that led to it.
TEST(CatalogueTree, FromTheChassisEveryCardChipAndPortShowsOnce) {
  const std::string chassis = "root/norvane:CIM_Chassis.CreationClassName=\"CIM_Chassis\",Tag=\"NRV TAVO:Chassis\"";
  auto r = runClient({"tree", chassis,
                      "NRVTAVO_ChassisContainsCard,NRVTAVO_CardContainsChip,NRVTAVO_CardRealizesPortController,"
                      "NRVTAVO_ControlledBy,NRVTAVO_FCControlledBy"});
  ASSERT_EQ(r.status, 0) << r.err;
  auto count = [&](const std::string& what) {
    size_t n = 0;
    for (size_t at = r.out.find(what); at != std::string::npos; at = r.out.find(what, at + 1)) ++n;
    return n;
  };
  EXPECT_EQ(r.out.rfind("CIM_Chassis Tag=\"NRV TAVO:Chassis\"", 0), 0u) << r.out;
  EXPECT_EQ(count("] NRVTAVO_Card "), 2u) << r.out;
  EXPECT_EQ(count("] NRVTAVO_Chip "), 2u);
  EXPECT_EQ(count("] NRVTAVO_PortController "), 6u);
  EXPECT_EQ(count("] NRVTAVO_EthernetPort "), 8u);
  EXPECT_EQ(count("] NRVTAVO_FCPort "), 2u);
  EXPECT_NE(r.out.find("\n      [NRVTAVO_ControlledBy] NRVTAVO_EthernetPort "), std::string::npos) << r.out;
  // A bounded walk stops below the cards.
  auto shallow = runClient({"tree", chassis, "depth=1"});
  ASSERT_EQ(shallow.status, 0) << shallow.err;
  EXPECT_EQ(shallow.out.find("NRVTAVO_Chip"), std::string::npos) << shallow.out;
}

}  // namespace
