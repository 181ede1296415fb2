// The feature builders over the sample site: the instances, their keys and
// values, and the texts they log.
#include "FeatureTestSupport.h"
#include "access/NRV_Common.h"
#include "access/NRV_Dump.h"
#include "data/NRV_DriverParameters.h"
#include "data/NRV_PortVirtualization.h"
#include "data/NRV_Transceiver.h"
#include "data/NRV_VitalProductData.h"
#include "data/NRV_Vpd.h"
#include "logging/Log.h"
#include "schema/Classes.h"

namespace feature_test {
namespace {

using namespace cimple;

const std::string kCard1 = "NV52C4213A07719", kCard2 = "NV41T5120A03342";

const NRVTAVO_Card* cardOf(NRV_Catalogue& catalogue, const std::string& serial) {
  return findIn<NRVTAVO_Card>(catalogue.of<NRVTAVO_Card>(),
                              [&](const auto& c) { return textOf(c.NRVSerialNumber) == serial; });
}

// ---- Vital product data --------------------------------------------------------

TEST_F(FeatureTest, CardsTakeTheirFruDataAndEveryFunctionItsFirmwareDetailOnce) {
  runFeatures(agent());
  runFeatures(agent());  // a rebuild makes the same catalogue
  std::lock_guard<std::recursive_mutex> lock(data());
  ASSERT_EQ(catalogue().of<NRVTAVO_Card>().size(), 2u);
  expectTexts(cardOf(catalogue(), kCard1),
              {{"Manufacturer", "Norvane"}, {"SerialNumber", kCard1}, {"PartNumber", "TV5202C-N1"},
               {"SKU", "FRU-5202C-03"}, {"Tag", "6a1f0c4e9b2d4d7a8e1c55f3a0b2c719"},
               {"Name", "Norvane Ethernet Adapter " + kCard1}});
  const auto* fru = byInstanceID<NRVTAVO_FRUVitalProductData>(catalogue(), kCard1);
  expectTexts(fru, {{"ElementName", "NRV TAVO FRU:" + kCard1}, {"ProductName", "TAVO 5202C Converged Network Adapter"},
                    {"UUID", "6a1f0c4e9b2d4d7a8e1c55f3a0b2c719"}, {"Date", "2425"}, {"FRUNumber", "FRU-5202C-03"},
                    {"CardFunction", "64"}, {"RevisionID", "3"}});
  // Six functions, each listed once however often the card is merged.
  std::vector<std::string> asics;
  for (const Function& f : functions())
    if (f.serial == kCard1) asics.push_back(f.id);
  EXPECT_EQ(texts(fru->ASICId), asics);
  EXPECT_EQ(texts(fru->FRUFirmwareDetail), std::vector<std::string>(asics.size(), "A3,V:10.2.370.19,D:2025-06-17"));
  EXPECT_EQ(catalogue().of<NRVTAVO_FRUElementVPD>().size(), 2u);
  EXPECT_GT(capture.count("FRU VPD: skipping keyword ZQ"), 0);

  // The card without a serial number in its FRU data.
  size_t index = 0;
  while (functions()[index].serial != kCard2) ++index;
  expectTexts(cardOf(catalogue(), kCard2),
              {{"Name", "Norvane Ethernet Onboard Adapter " + std::to_string(index)}, {"SerialNumber", "<null>"}});
  expectTexts(byInstanceID<NRVTAVO_FRUVitalProductData>(catalogue(), kCard2), {{"SerialNumber", "<null>"}});
  NRV_FruRecord record;
  ASSERT_EQ(GetFRUVPD(functions()[index].id.c_str(), &record), 0u);
  EXPECT_EQ(NRV_FruRecord::text(record.FWVersion), "10.2.370.21");
  EXPECT_EQ(NRV_FruRecord::text(record.FWDate), "2025-07-02");
  EXPECT_EQ(GetFRUVPD(nullptr, &record), 4u);
  EXPECT_EQ(GetFRUVPD("0090", &record), 1u);
}

TEST_F(FeatureTest, FruDataWithoutAnFruNumberIsPublishedOncePerCard) {
  nlohmann::json site = sampleSite();
  nlohmann::json& fru = site["cards"][0]["fru"];
  fru.erase(std::find_if(fru.begin(), fru.end(), [](const nlohmann::json& e) { return e[0] == "FN"; }));
  loadSite(site);
  runFeatures(agent());
  std::lock_guard<std::recursive_mutex> lock(data());
  EXPECT_EQ(catalogue().of<NRVTAVO_FRUVitalProductData>().size(), 2u);
  EXPECT_EQ(catalogue().of<NRVTAVO_FRUElementVPD>().size(), 2u);
  EXPECT_EQ(capture.count("Insert Failed : m_NRVTAVO_FRUVitalProductData_map"), 0);
  const auto* record = byInstanceID<NRVTAVO_FRUVitalProductData>(catalogue(), kCard1);
  expectTexts(record, {{"FRUNumber", "<null>"}});
  EXPECT_EQ(texts(record->ASICId).size(), 6u);
}

TEST_F(FeatureTest, TwoCardsWithOneFruUuidAreBothKeptEachWithItsOwnFruLink) {
  nlohmann::json site = sampleSite();
  site["cards"][1]["fru"] = site["cards"][0]["fru"];
  loadSite(site);
  runFeatures(agent());
  std::lock_guard<std::recursive_mutex> lock(data());
  ASSERT_EQ(catalogue().of<NRVTAVO_Card>().size(), 2u);
  expectTexts(cardOf(catalogue(), kCard1), {{"Tag", "6a1f0c4e9b2d4d7a8e1c55f3a0b2c719"}});
  expectTexts(cardOf(catalogue(), kCard2), {{"Tag", kCard2}});
  const Instance_Map& links = catalogue().of<NRVTAVO_FRUElementVPD>();
  ASSERT_EQ(links.size(), 2u);
  for (size_t i = 0; i < links.size(); ++i) {
    const auto* link = static_cast<const NRVTAVO_FRUElementVPD*>(links[i]);
    // An association keeps its ends' keys only: the card is the map's.
    const auto* card = static_cast<const NRVTAVO_Card*>(catalogue().of<NRVTAVO_Card>().lookup(link->ManagedElement));
    ASSERT_NE(card, nullptr);
    EXPECT_EQ(textOf(card->NRVSerialNumber), textOf(link->SettingData->InstanceID));
  }
}

TEST_F(FeatureTest, ACardAlreadyInTheCardMapKeepsItsKey) {
  std::lock_guard<std::recursive_mutex> lock(data());
  Instance_Map& cards = catalogue().of<NRVTAVO_Card>();
  auto* card = static_cast<NRVTAVO_Card*>(cards[0]);
  NRV_Vpd(catalogue()).UpdateFRUToCard(*card, "", functions()[0].id, 0);
  expectTexts(card, {{"Tag", kCard1}, {"SKU", "FRU-5202C-03"}});
  EXPECT_EQ(cards.find(card), 0);
  // Without an ASIC identifier the firmware detail is listed once.
  const auto* fru = byInstanceID<NRVTAVO_FRUVitalProductData>(catalogue(), kCard1);
  ASSERT_NE(fru, nullptr);
  EXPECT_EQ(texts(fru->FRUFirmwareDetail).size(), 1u);
  EXPECT_TRUE(fru->ASICId.is_null());
}

TEST_F(FeatureTest, FirmwareIdentitiesTakeVersionAndNameFromTheirAdaptersFru) {
  std::lock_guard<std::recursive_mutex> lock(data());
  NRV_Vpd vpd(catalogue());
  vpd.UpdateFRUToSoftwareInstance();
  const auto* firmware = byInstanceID<NRVTAVO_SoftwareIdentity>(catalogue(), "NRV CNA Firmware:" + kCard1);
  expectTexts(firmware, {{"VersionString", "10.2.370.19"}, {"Name", "Norvane Ethernet Adapter " + kCard1 + " 10.2.370.19"}});
  EXPECT_EQ(firmware->RevisionNumber.value, 370);
  expectTexts(byInstanceID<NRVTAVO_SoftwareIdentity>(catalogue(), "NRV CNA Firmware:" + kCard2),
              {{"VersionString", "10.2.370.21"}});

  std::string port, address;
  EXPECT_EQ(vpd.GetLogicalPortAddress(&port, 2, &address), 0u);
  EXPECT_EQ(port, "TAVO Port Controller:" + kCard1 + ":" + std::to_string(functions()[0].physicalPort));
  EXPECT_EQ(address, functions()[0].id);
  port = "TAVO Port Controller:none:9";
  EXPECT_EQ(vpd.GetLogicalPortAddress(&port, 2, &address), kNrvNotFound);
  EXPECT_EQ(vpd.GetLogicalPortAddress(&port, 1, &address), kNrvNotFound);
  EXPECT_EQ(vpd.GetLogicalPortAddress(&port, 2, nullptr), kNrvNotFound);
  EXPECT_EQ(capture.count("Invalid PortAddress", NRV_ERR), 1);
}

TEST_F(FeatureTest, GeneralVpdFillsItsPropertiesAndTagsTheRest) {
  std::lock_guard<std::recursive_mutex> lock(data());
  const std::string id = functions()[0].id;
  ASSERT_EQ(CreateVPD(catalogue(), id.c_str()), 0u);
  const auto* vpd = byInstanceID<NRVTAVO_VitalProductData>(catalogue(), id);
  expectTexts(vpd, {{"PartNumber", "TV5202C-N1"}, {"ECLevel", "A03"}, {"ManufactureId", "1C7E"},
                    {"VPDSerialNumber", kCard1}, {"FabricGeography", "XCNA"}, {"Location", "SLOT4"},
                    {"PCIGeography", "0000:04:00"}, {"ExtCapability", "ETH,ISCSI,FCOE"}, {"FieldV1", "10.2.370.19"},
                    {"ProductName", "Norvane TAVO 5202C 2-port 10GbE Converged Network Adapter"}});
  EXPECT_EQ(texts(vpd->VPDTags), (std::vector<std::string>{"8282", "V0", "V1", "VB"}));
  EXPECT_EQ(texts(vpd->VPDTagValues)[3], "Norvane");
  EXPECT_TRUE(capture.contains("VPD:PN"));
  // The same function again: refused by the map, and said so.
  EXPECT_EQ(CreateVPD(catalogue(), id.c_str()), 0u);
  EXPECT_EQ(capture.count("Insert Failed : m_NRVTAVO_VitalProductData_map", NRV_CRIT), 1);
  EXPECT_EQ(CreateVPD(catalogue(), "12"), 1u);
}

// ---- Port virtualization ---------------------------------------------------------

TEST_F(FeatureTest, VirtualPortsComeFromTheirPoolOnlyWhereThePortHasThem) {
  const std::string fc1 = nth(kFCoEAdapterType, 0).id, fc2 = nth(kFCoEAdapterType, 1).id;
  std::lock_guard<std::recursive_mutex> lock(data());
  NRV_PortVirtualization virtualization(catalogue());
  for (int pass = 0; pass < 2; ++pass) ASSERT_EQ(virtualization.CreatePortVirtualizationClasses(), 0u);
  ASSERT_EQ(catalogue().of<NRVTAVO_ResourcePool>().size(), 1u);
  const auto* pool = byInstanceID<NRVTAVO_ResourcePool>(catalogue(), "NRV:Resource Pool:" + fc1);
  expectTexts(pool, {{"PoolID", "NRV:Resource Pool:" + fc1}, {"ElementName", "NRV:Resource Pool:" + fc1}});
  EXPECT_EQ(pool->Capacity.value, 2u);
  EXPECT_EQ(pool->ResourceType.value, 10);
  EXPECT_EQ(catalogue().of<NRVTAVO_HostedResourcePool>().size(), 1u);
  const Instance_Map& vports = catalogue().of<NRVTAVO_VirtualFCPort>();
  ASSERT_EQ(vports.size(), 2u);
  expectTexts(vports[0], {{"DeviceID", "10000090FA5C2EA2"}, {"NodeWWN", "20000090FA5C2EA2"},
                          {"VPortName", "vport-db01-a"}, {"SystemName", kHostName},
                          {"CreationClassName", "NRV_VirtualFCPort"}});
  EXPECT_EQ(static_cast<const NRVTAVO_VirtualFCPort*>(vports[0])->PortFCId.value, 0x0a1b01u);
  const Instance_Map& hosting = catalogue().of<NRVTAVO_VPortHostedDependency>();
  ASSERT_EQ(hosting.size(), 2u);
  expectTexts(static_cast<const NRVTAVO_VPortHostedDependency*>(hosting[1])->Antecedent, {{"DeviceID", fc1}});
  EXPECT_EQ(catalogue().of<NRVTAVO_ElementAllocatedFromPool>().size(), 2u);
  EXPECT_EQ(capture.count("Need not create any resource pools since no vports exist for FCport: " + fc2), 2);

  catalogue().of<NRVTAVO_FCPort>().clear();
  EXPECT_EQ(virtualization.CreatePortVirtualizationClasses(), NRV_PortVirtualization::kNoPhysicalPort);
  EXPECT_TRUE(catalogue().of<NRVTAVO_VirtualFCPort>().empty());
  EXPECT_TRUE(capture.contains("Unable to create the Port Virtualization classes, No Physical Port(FCoE) exists"));
}

// ---- Transceivers -----------------------------------------------------------------

TEST_F(FeatureTest, OpticalModulesGiveReadingsAndThresholdsInTheirUnits) {
  std::lock_guard<std::recursive_mutex> lock(data());
  const std::string fc1 = nth(kFCoEAdapterType, 0).id;
  const NRVTAVO_Transceiver* t = GetSffData(catalogue(), fc1.c_str());
  expectTexts(t, {{"InstanceID", fc1 + ":NS2506121187"}, {"Tag", fc1 + ":NS2506121187"}, {"Manufacturer", "NORVANE"},
                  {"PartNumber", "NV-SFP10G-SR"}, {"Version", "A"}, {"OUI", "00-90-fa"}, {"TemperatureUnit", "Celsius"}});
  EXPECT_EQ(t->ManufactureDate.value.ascii(), "20250612000000.000000+000");
  EXPECT_EQ(t->Connector.value, 7);
  EXPECT_EQ(t->WaveLength.value, 850u);
  EXPECT_EQ(t->SFPStatus.value, 0u);
  const std::pair<const Property<real32>&, double> values[] = {
      {t->Temperature, 38.5},         {t->RxPower, 0.497},           {t->TemperatureHighAlarm, 80},
      {t->TemperatureLowAlarm, -5},   {t->TemperatureHighWarning, 75}, {t->VoltageHighAlarm, 3.7},
      {t->VoltageLowWarning, 3.0},    {t->CurrentHighAlarm, 15},     {t->CurrentLowAlarm, 1},
      {t->TxPowerHighAlarm, 1.2589},  {t->TxPowerLowWarning, 0.1259}, {t->RxPowerLowAlarm, 0.01},
  };
  for (const auto& [value, expected] : values) EXPECT_NEAR(value.value, expected, 1e-5);
  EXPECT_TRUE(capture.contains("Temperature: 38.50  C"));

  // The second module runs hot and receives almost nothing: beyond its alarms.
  t = GetSffData(catalogue(), nth(kFCoEAdapterType, 1).id.c_str());
  ASSERT_NE(t, nullptr);
  EXPECT_EQ(t->ManufactureDate.value.ascii(), "19991231000000.000000+000");
  EXPECT_GT(t->Temperature.value, t->TemperatureHighAlarm.value);
  EXPECT_LT(t->RxPower.value, t->RxPowerLowAlarm.value);

  // A 10GBASE-T port has no module data; a module asked for twice is refused.
  EXPECT_EQ(GetSffData(catalogue(), functions().back().id.c_str()), nullptr);
  EXPECT_TRUE(capture.contains("Unable to obtain transceiver data for this host bus adapter."));
  EXPECT_EQ(GetSffData(catalogue(), fc1.c_str()), nullptr);
  EXPECT_EQ(capture.count("Insert Failed : m_CIM_PhysicalComponent_map ", NRV_CRIT), 1);
  EXPECT_EQ(catalogue().of<NRVTAVO_Transceiver>().size(), 2u);
}

// ---- Driver parameters --------------------------------------------------------------

TEST_F(FeatureTest, DriverParametersGiveFourInstancesEachGloballyAndPerPort) {
  const std::string fc1 = nth(kFCoEAdapterType, 0).id, fc2 = nth(kFCoEAdapterType, 1).id;
  std::lock_guard<std::recursive_mutex> lock(data());
  ASSERT_EQ(FCoEGetDriverParam(catalogue(), fc1, true), 0u);
  ASSERT_EQ(FCoEGetDriverParam(catalogue(), fc1, false), 0u);
  ASSERT_EQ(FCoEGetDriverParam(catalogue(), fc2, false), 0u);
  const Instance_Map& settings = catalogue().of<NRVTAVO_DriverParameterSettingData>();
  ASSERT_EQ(settings.size(), 4u * 4 + 2u * 4);
  const char* kinds[] = {"Current Global", "Maximum Global", "Minimum Global", "Default Global"};
  for (size_t i = 0; i < 4; ++i)
    expectTexts(settings[i], {{"InstanceID", std::string("NRV:FCoE ") + kinds[i] + " Driver Parameter:log-verbose"}});
  const auto* global = byInstanceID<NRVTAVO_DriverParameterSettingData>(
      catalogue(), "NRV:FCoE Maximum Global Driver Parameter:devloss-tmo");
  expectTexts(global, {{"help", "Seconds before a lost remote port goes away"}, {"ConfigurationName", "<null>"}});
  EXPECT_EQ(global->Value.value, 255u);
  EXPECT_EQ(byInstanceID<NRVTAVO_DriverParameterSettingData>(catalogue(),
                                                              "NRV:FCoE Current Global Driver Parameter:link-speed")
                ->ChangeableType.value,
            0);
  const std::string local = "Local Driver Parameter:" + fc1 + ":lun-queue-depth";
  const auto* current = byInstanceID<NRVTAVO_DriverParameterSettingData>(catalogue(), "NRV:FCoE Current " + local);
  expectTexts(current, {{"ConfigurationName", "local"}, {"ElementName", fc1}});
  EXPECT_EQ(current->Value.value, 32u);
  expectTexts(settings[17], {{"InstanceID", "NRV:FCoE Default " + local}});
  EXPECT_TRUE(capture.contains("number of driver parameters 0"));
  // Asked again, every instance is refused as a duplicate.
  ASSERT_EQ(FCoEGetDriverParam(catalogue(), fc2, true), 0u);
  EXPECT_EQ(capture.count("Insert Failed : m_NRVTAVO_DriverParameterSettingData_map", NRV_CRIT), 16);
  EXPECT_EQ(FCoEGetDriverParam(catalogue(), "10000090", true), kNrvFailure);
}

TEST_F(FeatureTest, SixtyGlobalParametersAreAskedForTwiceAndAllPublished) {
  nlohmann::json site = sampleSite();
  nlohmann::json& params = site["library"]["driver_params"];
  params = nlohmann::json::array();
  for (int i = 0; i < 60; ++i) params.push_back({{"name", "param-" + std::to_string(i)}, {"max", 9}});
  loadSite(site);
  std::lock_guard<std::recursive_mutex> lock(data());
  ASSERT_EQ(FCoEGetDriverParam(catalogue(), nth(kFCoEAdapterType).id, true), 0u);
  EXPECT_EQ(catalogue().of<NRVTAVO_DriverParameterSettingData>().size(), 240u);
  EXPECT_TRUE(capture.contains("RM_GetDriverParamsGlobal: status=7"));
  EXPECT_TRUE(capture.contains("number of driver parameters 60"));
}

// ---- Dump service ----------------------------------------------------------------------

TEST_F(FeatureTest, DumpServiceAffectsEveryChipAndCarriesTheirFatDumpSettings) {
  std::lock_guard<std::recursive_mutex> lock(data());
  NRV_Dump(catalogue()).CreateDumpServiceClasses();
  ASSERT_EQ(catalogue().of<NRVTAVO_DumpService>().size(), 1u);
  expectTexts(catalogue().of<NRVTAVO_DumpService>()[0], {{"Name", "NRVTAVO_DumpService"}, {"SystemName", kHostName}});
  EXPECT_EQ(catalogue().of<NRVTAVO_HostedDumpService>().size(), 1u);
  EXPECT_EQ(catalogue().of<NRVTAVO_DumpServiceAffectsElement>().size(), 2u);

  const auto* data1 = byInstanceID<NRVTAVO_ExtFATDumpData>(catalogue(), "NRV:TAVO ExtFATDumpData:" + kCard1);
  expectTexts(data1, {{"DumpDirectory", "/var/crash/norvane"}});
  EXPECT_EQ(data1->RetentionCount.value, 10u);
  const Instance_Map& links = catalogue().of<NRVTAVO_ElementExtFATDumpData>();
  ASSERT_EQ(links.size(), 2u);
  EXPECT_EQ(static_cast<const NRVTAVO_ElementExtFATDumpData*>(links[0])->IsCurrent.value, 1);
  EXPECT_EQ(catalogue().of<NRVTAVO_ExtFATDumpAdvancedData>().size(), 4u);
  EXPECT_EQ(catalogue().of<NRVTAVO_ElementExtFATDumpAdvancedData>().size(), 4u);
  const std::string advanced = "NRV:TAVO ExtFATDumpAdvancedData:";
  const auto* fcoe = byInstanceID<NRVTAVO_ExtFATDumpAdvancedData>(catalogue(), advanced + kCard1 + ":FCoE");
  expectTexts(fcoe, {{"Description", "FCoE"}});
  EXPECT_EQ(texts(fcoe->Modes), (std::vector<std::string>{"ram", "uart"}));
  EXPECT_EQ(texts(fcoe->TraceLevel), (std::vector<std::string>{"info", "error"}));
  EXPECT_EQ(fcoe->PCIFuncMask.value[1], 0x3fu);
  const auto* nic = byInstanceID<NRVTAVO_ExtFATDumpAdvancedData>(catalogue(), advanced + kCard2 + ":NIC");
  ASSERT_NE(nic, nullptr);
  EXPECT_EQ(texts(nic->TraceLevel), (std::vector<std::string>{"info", "fatal"}));
  EXPECT_EQ(nic->PortMask.value[1], 0xFu);
  EXPECT_TRUE(texts(byInstanceID<NRVTAVO_ExtFATDumpAdvancedData>(catalogue(), advanced + kCard1 + ":iSCSI")->Modes)
                  .empty());
}

TEST_F(FeatureTest, DumpServiceWithOnlyDownPortsHasNoAffectedElements) {
  std::lock_guard<std::recursive_mutex> lock(data());
  NRV_Dump dump(catalogue());
  catalogue().of<NRVTAVO_Chip>().clear();
  dump.CreateDumpServiceClasses();
  EXPECT_TRUE(catalogue().of<NRVTAVO_DumpService>().empty());
  EXPECT_TRUE(capture.contains("Unable to create the TAVO Dump service, No Card/Logical Port exist"));

  auto* down = makeInstance<NRVTAVO_DownEthernetPort>();
  down->DeviceID.set("0090FA71B4030000");
  catalogue().insert(down);
  dump.CreateDumpServiceClasses();
  EXPECT_EQ(catalogue().of<NRVTAVO_DumpService>().size(), 1u);
  EXPECT_EQ(catalogue().of<NRVTAVO_HostedDumpService>().size(), 1u);
  EXPECT_TRUE(catalogue().of<NRVTAVO_DumpServiceAffectsElement>().empty());
  EXPECT_TRUE(capture.contains("Dump Service/Chip class not exist, Cannot continue further"));
  dump.ClearDumpServiceClasses(NRV_Dump::kAll);
  EXPECT_TRUE(catalogue().of<NRVTAVO_DumpService>().empty());

  // A library that cannot list the dead ports gets no service for them.
  nlohmann::json site = sampleSite();
  addFault(site, {{"function", "RM_ListDeadNicPorts"}, {"status", 5}});
  loadSite(site);
  dump.CreateDumpServiceClasses();
  EXPECT_TRUE(catalogue().of<NRVTAVO_DumpService>().empty());
  EXPECT_TRUE(capture.contains("CreateDumpServiceClasses::Failure In Getting Dead NIC Ports. Rm Error: [ 5 ]"));
}

TEST(TraceLevels, NamesAndNumbersBothWays) {
  uint32_t level = 0;
  const char* names[] = {"disable", "all", "enterfunction", "verbose", "info", "test",
                         "show",    "warning", "error",     "fatal",   "always"};
  for (uint32_t n = 1; n <= 11; ++n) {
    EXPECT_EQ(NRV_Dump::TraceLevelName(n), names[n - 1]);
    EXPECT_EQ(NRV_Dump::TraceLevelFromName(names[n - 1], level), 0u);
    EXPECT_EQ(level, n);
  }
  EXPECT_EQ(NRV_Dump::TraceLevelFromName("Disable", level), 0u);
  EXPECT_EQ(NRV_Dump::TraceLevelFromName("loud", level), kNrvNotFound);
  EXPECT_EQ(level, 99u);
  EXPECT_EQ(NRV_Dump::TraceLevelFromName(std::string(51, 'a'), level), kNrvNotFound);
  EXPECT_EQ(NRV_Dump::TraceLevelName(12), "");
}

}  // namespace
}  // namespace feature_test
