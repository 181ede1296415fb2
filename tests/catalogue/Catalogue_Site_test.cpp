// The adapter catalogue of the sample site through the CIMOM stand-in: how
// many instances each class holds, that every path returned answers the same
// instance, the association walks from a card and from an FC port, and the
// two ways of finding the host system.
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "host/Host.h"
#include "host/PathText.h"

namespace {

using namespace nrv::host;

constexpr const char* kNs = "root/norvane";

// The sample site: card NV52C4213A07719 with two physical ports, each with a
// NIC, an iSCSI and an FCoE function; card NV41T5120A03342 with four NIC
// functions on four physical ports.  Five NIC functions have an IPv4 address
// (three static, two by DHCP), three a gateway; both iSCSI functions have
// an IP endpoint of their own and the iSCSI profiles.  The module makes the host.
const std::map<std::string, size_t> kSampleCounts = {
    {"NRVTAVO_RegisteredProfile", 16},
    {"NRVTAVO_ComputerSystemConformsToProfile", 11},
    {"NRVTAVO_ProviderConfigSetting", 3},
    {"NRVTAVO_SoftwareInstallationService", 1},
    {"NRVTAVO_SoftwareInstallationServiceCapabilities", 1},
    {"NRVTAVO_HostedInstallationService", 1},
    {"NRVTAVO_InstallServiceAffectsSystem", 1},
    {"NRVTAVO_InstallServiceConformsToProfile", 1},
    {"NRVTAVO_ElementCapabilities", 1},
    {"NRVTAVO_SoftwareIdentity", 5},  // provider, NIC and FCoE drivers, two chips' firmware
    {"NRVTAVO_InstalledSoftwareIdentity", 5},
    {"NRVTAVO_SoftwareConformsToProfile", 5},
    {"NRVTAVO_RecordLog", 2},
    {"NRVTAVO_EnabledRecordLogCapabilities", 1},
    {"NRVTAVO_RecordLogCapabilities", 2},
    {"NRVTAVO_RecordLogConformsToProfile", 2},
    {"NRVTAVO_ProviderUseOfLog", 2},
    {"NRVTAVO_Card", 2},
    {"NRVTAVO_ChassisContainsCard", 2},
    {"NRVTAVO_CardConformsToProfile", 6},
    {"NRVTAVO_PhysicalPackage", 2},
    {"NRVTAVO_Product", 2},
    {"NRVTAVO_ProductPhysicalComponentPhysicalPackage", 2},
    {"NRVTAVO_FlashImageSoftwareIdentity", 2},
    {"NRVTAVO_Chip", 2},
    {"NRVTAVO_CardContainsChip", 2},
    {"NRVTAVO_InstallServiceAffectsChip", 2},
    {"NRVTAVO_FirmwareElementSoftwareIdentity", 2},
    {"NRVTAVO_PhysicalConnector", 6},
    {"NRVTAVO_Container", 6},
    {"NRVTAVO_ConnectorDependsOnChip", 6},
    {"NRVTAVO_ProductPhysicalComponent", 6},
    {"NRVTAVO_PortController", 6},
    {"NRVTAVO_PortControllerSystemDevice", 6},
    {"NRVTAVO_CardRealizesPortController", 6},
    {"NRVTAVO_PortControllerRealizes", 6},
    {"NRVTAVO_PortControllerRealizesPhysicalPackage", 6},
    {"NRVTAVO_ProductPortControllerComponent", 6},
    {"NRVTAVO_PortControllerConformsToProfile", 6},
    {"NRVTAVO_ElementSoftwareIdentity", 6},
    {"NRVTAVO_TAVOPortFlashImageSoftwareIdentity", 6},
    {"NRVTAVO_EthernetPort", 8},  // six NIC and two iSCSI functions
    {"NRVTAVO_EthernetPortSystemDevice", 8},
    {"NRVTAVO_Realizes", 8},
    {"NRVTAVO_ControlledBy", 8},
    {"NRVTAVO_NICPortConformsToProfile", 6},
    {"NRVTAVO_EthernetPortSoftwareIdentity", 6},
    {"NRVTAVO_LANEndpoint", 6},
    {"NRVTAVO_EnabledLogicalElementCapabilities", 6},
    {"NRVTAVO_NICSAPImplementation", 6},
    {"NRVTAVO_HostedLANEndpoint", 6},
    {"NRVTAVO_EndpointCapabilities", 6},
    {"NRVTAVO_NICCapabilities", 6},
    {"NRVTAVO_VLANEndpoint", 0},  // no virtual NIC port
    {"NRVTAVO_PCIDevice", 10},
    {"NRVTAVO_ConcreteIdentity", 8},
    {"NRVTAVO_FCConcreteIdentity", 2},
    {"NRVTAVO_SystemDevice", 10},
    {"NRVTAVO_PCIElementConformsToProfile", 10},
    {"NRVTAVO_IPConfigurationService", 1},
    {"NRVTAVO_HostedIPConfigurationService", 1},
    {"NRVTAVO_IPProtocolEndpoint", 7},
    {"NRVTAVO_HostedIPProtocolEndpoint", 5},
    {"NRVTAVO_BindsToLANEndpoint", 5},
    {"NRVTAVO_IPProtocolEndpointSAPImplementation", 7},
    {"NRVTAVO_IPProtocolEndpointConformsToProfile", 5},
    {"NRVTAVO_EnabledLogicalIPProtocolEndpointCapabilities", 5},
    {"NRVTAVO_IPProtocolEndpointCapabilities", 5},
    {"NRVTAVO_IPConfigurationServiceAffectsElement", 7},
    {"NRVTAVO_IPAssignmentSettingData", 5},
    {"NRVTAVO_RemoteServiceAccessPoint", 3},  // the gateways; no WebLaunch file
    {"NRVTAVO_RemoteAccessAvailableToElement", 3},
    {"NRVTAVO_RemoteHostedAccessPoint", 3},
    {"NRVTAVO_StaticIPAssignmentSettingData", 3},
    {"NRVTAVO_IPProtocolEndpointIPAssignmentSettingData", 3},
    {"NRVTAVO_StaticIPProtocolEndpointIPAssignmentSettingData", 3},
    {"NRVTAVO_OrderedIPAssignmentSettingData", 3},
    {"NRVTAVO_FCWWNService", 1},
    {"NRVTAVO_HostedFCWWNService", 1},
    {"NRVTAVO_FCWWNServiceAffectsSystem", 1},
    {"NRVTAVO_DriverParameterService", 1},
    {"NRVTAVO_HostedDriverParameterService", 1},
    {"NRVTAVO_FCPort", 2},
    {"NRVTAVO_FCSystemDevice", 2},
    {"NRVTAVO_FCPortConformsToProfile", 2},
    {"NRVTAVO_FCPortSoftwareIdentity", 2},
    {"NRVTAVO_FCControlledBy", 2},
    {"NRVTAVO_FCRealizes", 2},
    {"NRVTAVO_HostedDependency", 2},
    {"NRVTAVO_FCWWNServiceAffectsFCPort", 2},
    {"NRVTAVO_DriverServiceAffectsElement", 2},
    {"NRVTAVO_FCPortStatistics", 2},
    {"NRVTAVO_ElementStatisticalData", 2},
    {"NRVTAVO_SCSIProtocolInitiatorEndpoint", 2},
    {"NRVTAVO_LocalHostedInitiatorAccessPoint", 2},
    {"NRVTAVO_DeviceSAPImplementation", 2},
    // The feature data.  Only the two SFP+ ports of the converged card have
    // a pluggable module (10GBASE-T ports have no SFF data).
    {"NRVTAVO_Transceiver", 2},
    {"NRVTAVO_TransceiverComponent", 2},
    {"NRVTAVO_VitalProductData", 10},  // one per PCI function
    {"NRVTAVO_ElementVPD", 10},
    {"NRVTAVO_FRUVitalProductData", 2},  // one per card
    {"NRVTAVO_FRUElementVPD", 2},
    // Four values of the four global parameters, and of the two local ones
    // of the first FCoE port; the second has none of its own.
    {"NRVTAVO_DriverParameterSettingData", 24},
    // The first FCoE port has two virtual ports, the second none.
    {"NRVTAVO_ResourcePool", 1},
    {"NRVTAVO_HostedResourcePool", 1},
    {"NRVTAVO_VirtualFCPort", 2},
    {"NRVTAVO_VPortHostedDependency", 2},
    {"NRVTAVO_ElementAllocatedFromPool", 2},
    // One service affecting both chips; the event-log modules of the chips:
    // FCoE, NIC and iSCSI on the converged card, NIC on the other.
    {"NRVTAVO_DumpService", 1},
    {"NRVTAVO_HostedDumpService", 1},
    {"NRVTAVO_DumpServiceAffectsElement", 2},
    {"NRVTAVO_ExtFATDumpData", 2},
    {"NRVTAVO_ElementExtFATDumpData", 2},
    {"NRVTAVO_ExtFATDumpAdvancedData", 4},
    {"NRVTAVO_ElementExtFATDumpAdvancedData", 4},
};


std::string text(const Datum* d) { return d && d->type == CMPI_string ? d->text : std::string(); }
const PathData& ref(const Datum* d) { return *d->path(); }

class CatalogueSite : public ::testing::Test {
 protected:
  static void TearDownTestSuite() { host_.reset(); }
  // One host (and one catalogue build) for the whole suite.
  Host& host() {
    if (!host_) host_ = std::make_unique<Host>(Host::defaultModulePath(), Host::Options{std::nullopt});
    return *host_;
  }
  std::vector<HostInstance> all(const std::string& name) {
    // The registered profiles live in the interop namespace, as a CIMOM
    // registers them; everything else in the module's own.
    Result r = host().enumerateInstances(name == "NRVTAVO_RegisteredProfile" ? "root/pg_interop" : kNs, name);
    EXPECT_TRUE(r.ok()) << name << ": " << r.errorText();
    return r.instances;
  }
  std::vector<std::string> far_classes(const PathData& from, const AssocFilter& filter = {}) {
    std::vector<std::string> names;
    for (const PathData& p : host().associatorNames(from, filter).paths) names.push_back(p.className);
    return names;
  }
  static std::unique_ptr<Host> host_;
};
std::unique_ptr<Host> CatalogueSite::host_;

TEST_F(CatalogueSite, EveryClassHoldsTheInstancesOfTheSampleSite) {
  for (const auto& [name, count] : kSampleCounts) EXPECT_EQ(all(name).size(), count) << name;
}

TEST_F(CatalogueSite, EveryReturnedPathAnswersTheSameInstance) {
  for (const auto& [name, count] : kSampleCounts) {
    for (const HostInstance& instance : all(name)) {
      Result one = host().getInstance(instance.path);
      ASSERT_TRUE(one.ok()) << formatPath(instance.path) << ": " << one.errorText();
      ASSERT_EQ(one.instances.size(), 1u);
      EXPECT_EQ(one.instances[0].path, instance.path) << name;
      EXPECT_EQ(one.instances[0].properties.size(), instance.properties.size()) << formatPath(instance.path);
    }
  }
}

TEST_F(CatalogueSite, TheModulesOwnHostAndChassisCarryEveryCard) {
  // Conformance names the profiles in the interop name space.
  for (const HostInstance& c : all("NRVTAVO_CardConformsToProfile"))
    EXPECT_EQ(ref(findNamed(c.properties, "ConformantStandard")).nameSpace, "root/pg_interop");
  const PathData chassis{kNs, "", "CIM_Chassis", {{"CreationClassName", Datum::string("CIM_Chassis")},
                                                  {"Tag", Datum::string("NRV TAVO:Chassis")}}};
  AssocFilter cards;
  cards.resultClass = "NRVTAVO_Card";
  EXPECT_EQ(host().associatorNames(chassis, cards).paths.size(), 2u);
}

// Asked from the interop namespace, a profile's conforming elements are
// named, fetched and referred to where they live: in the module's namespace.
TEST_F(CatalogueSite, FromAProfileTheWalkReachesTheCardsInTheModulesNamespace) {
  const PathData profile{"root/pg_interop", "", "NRVTAVO_RegisteredProfile",
                         {{"InstanceID", Datum::string("NRV:Physical Asset")}}};
  Result names = host().associatorNames(profile);
  ASSERT_TRUE(names.ok()) << names.errorText();
  size_t cards = 0;
  for (const PathData& end : names.paths) {
    EXPECT_EQ(end.nameSpace, kNs) << formatPath(end);
    cards += end.className == "NRVTAVO_Card";
  }
  EXPECT_EQ(cards, 2u);
  Result whole = host().associators(profile);
  ASSERT_TRUE(whole.ok()) << whole.errorText();
  cards = 0;
  for (const HostInstance& end : whole.instances) {
    if (end.path.className != "NRVTAVO_Card") continue;
    ++cards;
    EXPECT_EQ(end.path.nameSpace, kNs);
    EXPECT_NE(findNamed(end.properties, "SerialNumber"), nullptr);
  }
  EXPECT_EQ(cards, 2u);
  Result links = host().references(profile);
  ASSERT_FALSE(links.instances.empty()) << links.errorText();
  for (const HostInstance& link : links.instances)
    EXPECT_EQ(ref(findNamed(link.properties, "ManagedElement")).nameSpace, kNs) << formatPath(link.path);
}

TEST_F(CatalogueSite, FromACardTheWalkReachesChipPackageConnectorsAndPorts) {
  PathData card;
  for (const HostInstance& c : all("NRVTAVO_Card"))
    if (text(findNamed(c.properties, "SerialNumber")) == "NV52C4213A07719") card = c.path;
  ASSERT_FALSE(card.className.empty());
  const std::vector<std::string> near = far_classes(card);
  for (const char* expected : {"NRVTAVO_Chip", "NRVTAVO_PhysicalConnector", "NRVTAVO_PortController", "CIM_Chassis"})
    EXPECT_NE(std::find(near.begin(), near.end(), expected), near.end()) << expected;
  AssocFilter connectors;
  connectors.resultClass = "NRVTAVO_PhysicalConnector";
  Result connected = host().associators(card, connectors);
  ASSERT_EQ(connected.instances.size(), 2u);
  // References name the same ends as associators.
  size_t containers = 0;
  for (const PathData& p : host().referenceNames(card).paths) containers += p.className == "NRVTAVO_Container";
  EXPECT_EQ(containers, 2u);
  size_t contained = 0;
  for (const HostInstance& r : host().references(card).instances) contained += r.path.className == "NRVTAVO_Container";
  EXPECT_EQ(contained, 2u);
  // A port controller of the card leads on to its package and its ports.
  AssocFilter controllers;
  controllers.resultClass = "NRVTAVO_PortController";
  const std::vector<PathData> pcs = host().associatorNames(card, controllers).paths;
  ASSERT_EQ(pcs.size(), 2u);
  const std::vector<std::string> beyond = far_classes(pcs[0]);
  for (const char* expected : {"NRVTAVO_PhysicalPackage", "NRVTAVO_EthernetPort", "NRVTAVO_FCPort", "NRVTAVO_Product"})
    EXPECT_NE(std::find(beyond.begin(), beyond.end(), expected), beyond.end()) << expected;
}

TEST_F(CatalogueSite, FromAnFCPortTheWalkReachesStatisticsPCIDeviceAndWWNService) {
  const std::vector<HostInstance> ports = all("NRVTAVO_FCPort");
  ASSERT_EQ(ports.size(), 2u);
  const std::vector<std::string> near = far_classes(ports[0].path);
  for (const char* expected : {"NRVTAVO_FCPortStatistics", "NRVTAVO_PCIDevice", "NRVTAVO_FCWWNService",
                               "NRVTAVO_SCSIProtocolInitiatorEndpoint", "NRVTAVO_EthernetPort"})
    EXPECT_NE(std::find(near.begin(), near.end(), expected), near.end()) << expected;
  AssocFilter statistics;
  statistics.resultClass = "NRVTAVO_FCPortStatistics";
  Result stats = host().associators(ports[0].path, statistics);
  ASSERT_EQ(stats.instances.size(), 1u);
  EXPECT_EQ(text(findNamed(stats.instances[0].properties, "Description")), "Statistics for the FCOE port.");
  AssocFilter managed;
  managed.role = "ManagedElement";
  size_t statistical = 0;
  for (const PathData& p : host().referenceNames(ports[0].path, managed).paths)
    statistical += p.className == "NRVTAVO_ElementStatisticalData";
  EXPECT_EQ(statistical, 1u);
}

// Each association of the feature data, walked from every instance of its
// near end: associators, their names, references and their names, each
// filtered by class, find every instance of the association once.
TEST_F(CatalogueSite, TheFeatureDataIsReachedFromTheDevicesItDescribes) {
  struct Walk {
    const char* from;
    const char* to;
    const char* association;
  };
  const Walk kWalks[] = {
      {"NRVTAVO_Card", "NRVTAVO_FRUVitalProductData", "NRVTAVO_FRUElementVPD"},
      {"NRVTAVO_PCIDevice", "NRVTAVO_VitalProductData", "NRVTAVO_ElementVPD"},
      {"NRVTAVO_PortController", "NRVTAVO_Transceiver", "NRVTAVO_TransceiverComponent"},
      {"NRVTAVO_FCPort", "NRVTAVO_VirtualFCPort", "NRVTAVO_VPortHostedDependency"},
      {"NRVTAVO_ResourcePool", "NRVTAVO_VirtualFCPort", "NRVTAVO_ElementAllocatedFromPool"},
      {"NRVTAVO_Chip", "NRVTAVO_DumpService", "NRVTAVO_DumpServiceAffectsElement"},
      {"NRVTAVO_Chip", "NRVTAVO_ExtFATDumpData", "NRVTAVO_ElementExtFATDumpData"},
      {"NRVTAVO_Chip", "NRVTAVO_ExtFATDumpAdvancedData", "NRVTAVO_ElementExtFATDumpAdvancedData"},
  };
  for (const Walk& walk : kWalks) {
    AssocFilter far;
    far.resultClass = walk.to;
    far.assocClass = walk.association;
    AssocFilter links;
    links.resultClass = walk.association;
    size_t ai = 0, ain = 0, ri = 0, rin = 0;
    for (const HostInstance& from : all(walk.from)) {
      ai += host().associators(from.path, far).instances.size();
      ain += host().associatorNames(from.path, far).paths.size();
      for (const HostInstance& r : host().references(from.path, links).instances)
        ri += r.path.className == walk.association;
      for (const PathData& p : host().referenceNames(from.path, links).paths) rin += p.className == walk.association;
    }
    const size_t expected = kSampleCounts.at(walk.association);
    EXPECT_EQ(ai, expected) << walk.from << " -> " << walk.to;
    EXPECT_EQ(ain, expected) << walk.from << " -> " << walk.to;
    EXPECT_EQ(ri, expected) << walk.from << " -> " << walk.association;
    EXPECT_EQ(rin, expected) << walk.from << " -> " << walk.association;
  }
}

// The converged card's FRU data gives it its Tag (the FRU UUID) before the
// card map takes it: the card answers to that key, and leads to its FRU data.
TEST_F(CatalogueSite, ACardAnswersToTheTagItsFRUDataGaveIt) {
  const PathData card{kNs, "", "NRVTAVO_Card", {{"CreationClassName", Datum::string("NRVTAVO_Card")},
                                                {"Tag", Datum::string("6a1f0c4e9b2d4d7a8e1c55f3a0b2c719")}}};
  Result one = host().getInstance(card);
  ASSERT_TRUE(one.ok()) << one.errorText();
  ASSERT_EQ(one.instances.size(), 1u);
  EXPECT_EQ(text(findNamed(one.instances[0].properties, "SKU")), "FRU-5202C-03");
  EXPECT_EQ(text(findNamed(one.instances[0].properties, "NRVSerialNumber")), "NV52C4213A07719");
  AssocFilter fru;
  fru.resultClass = "NRVTAVO_FRUVitalProductData";
  EXPECT_EQ(host().associatorNames(card, fru).paths.size(), 1u);
  AssocFilter chips;
  chips.resultClass = "NRVTAVO_Chip";
  EXPECT_EQ(host().associatorNames(card, chips).paths.size(), 1u);
  // The serial number is no longer a key of that card.
  PathData by_serial = card;
  by_serial.keys[1].second = Datum::string("NV52C4213A07719");
  EXPECT_FALSE(host().getInstance(by_serial).ok());
}

TEST_F(CatalogueSite, PortsCarryTheirIdentitiesAndVNICPairs) {
  size_t with_channel = 0;
  for (const HostInstance& port : all("NRVTAVO_EthernetPort")) {
    const Datum* descriptions = findNamed(port.properties, "IdentifyingDescriptions");
    ASSERT_NE(descriptions, nullptr);
    std::vector<std::string> names;
    for (const Datum& d : descriptions->array()->elements) names.push_back(d.text);
    ASSERT_GE(names.size(), 3u) << formatPath(port.path);
    EXPECT_EQ(names[1], "SerialNumber:PhysicalPortNumber");
    if (names.size() == 3) continue;  // iSCSI functions come after the vNIC pass
    // The simulated library has no channel management: no virtual port number.
    ASSERT_EQ(names.size(), 5u) << formatPath(port.path);
    EXPECT_EQ(names[3], "vNIC");
    EXPECT_EQ(names[4], "PhysicalPortNumber");
    ++with_channel;
  }
  EXPECT_EQ(with_channel, 6u);
}

// With the platform's instrumentation answering in root/kvlhost the host and
// chassis are the platform's, and no computer-system conformance is made.
TEST(CatalogueWithPlatform, TheHostAndChassisComeFromThePlatform) {
  Host host(Host::defaultModulePath(), Host::Options{std::string(NRV_HOST_TEST_DATA) + "/platform.json"});
  Result cards = host.enumerateInstances(kNs, "NRVTAVO_ChassisContainsCard");
  ASSERT_TRUE(cards.ok()) << cards.errorText();
  ASSERT_EQ(cards.instances.size(), 2u);
  const Datum* group = findNamed(cards.instances[0].properties, "GroupComponent");
  ASSERT_NE(group, nullptr);
  EXPECT_EQ(ref(group).nameSpace, "root/kvlhost");
  EXPECT_EQ(ref(group).className, "KVLD_Chassis");
  EXPECT_TRUE(host.enumerateInstances(kNs, "NRVTAVO_ComputerSystemConformsToProfile").instances.empty());
  Result installed = host.enumerateInstances(kNs, "NRVTAVO_InstalledSoftwareIdentity");
  ASSERT_FALSE(installed.instances.empty());
  const Datum* system = findNamed(installed.instances[0].properties, "System");
  ASSERT_NE(system, nullptr);
  EXPECT_EQ(ref(system).className, "KVLD_ComputerSystem");
  EXPECT_EQ(ref(system).nameSpace, "root/kvlhost");
  EXPECT_EQ(text(findNamed(ref(system).keys, "Name")), "host1.example");
}

// Without the module's registration the host asks every association
// provider; the result class of a references request still names the one
// association class to ask.
TEST(CatalogueUnregistered, ReferencesKeepToTheirResultClass) {
  Host host(Host::defaultModulePath(), Host::Options{std::nullopt, std::string()});
  Result chips = host.enumerateInstanceNames(kNs, "NRVTAVO_Chip");
  ASSERT_TRUE(chips.ok()) << chips.errorText();
  ASSERT_FALSE(chips.paths.empty());
  AssocFilter contained;
  contained.resultClass = "NRVTAVO_CardContainsChip";
  const std::vector<PathData> names = host.referenceNames(chips.paths[0], contained).paths;
  ASSERT_EQ(names.size(), 1u);
  EXPECT_EQ(names[0].className, "NRVTAVO_CardContainsChip");
  EXPECT_EQ(host.references(chips.paths[0], contained).instances.size(), 1u);
}

}  // namespace

namespace {

// The platform's Base Server profile references every profile of the module
// but Profile Registration; without it there are no references.  Both ends
// are registered profiles, so the references live in the interop namespace.
TEST(CatalogueWithPlatform, TheBaseServerProfileReferencesTheModulesProfiles) {
  constexpr const char* kInterop = "root/pg_interop";
  {
    Host plain(Host::defaultModulePath(), Host::Options{std::nullopt});
    Result none = plain.enumerateInstances(kInterop, "NRVTAVO_BaseServerReferencedProfile");
    ASSERT_TRUE(none.ok()) << none.errorText();
    EXPECT_TRUE(none.instances.empty());
  }

  Host host(Host::defaultModulePath(),
            Host::Options{std::string(NRV_HOST_TEST_DATA) + "/platform_base_server.json"});
  Result refs = host.enumerateInstances(kInterop, "NRVTAVO_BaseServerReferencedProfile");
  ASSERT_TRUE(refs.ok()) << refs.errorText();
  ASSERT_EQ(refs.instances.size(), 16u);
  const PathData& base = ref(findNamed(refs.instances[0].properties, "Antecedent"));
  EXPECT_EQ(base.nameSpace, "root/pg_interop");
  EXPECT_EQ(text(findNamed(base.keys, "InstanceID")), "KVLD:Base Server");
  const PathData& first = ref(findNamed(refs.instances[0].properties, "Dependent"));
  EXPECT_EQ(text(findNamed(first.keys, "InstanceID")), "NRV:Ethernet Port");
  for (const HostInstance& r : refs.instances)
    EXPECT_NE(text(findNamed(ref(findNamed(r.properties, "Dependent")).keys, "InstanceID")), "NRV:Profile Registration");
}

}  // namespace
