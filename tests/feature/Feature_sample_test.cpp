// The feature builders over the sample site: the instances, their keys and
// values, and the texts they log.
#include <cmath>

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

constexpr const char* kCard1 = "NV52C4213A07719";
constexpr const char* kCard2 = "NV41T5120A03342";

std::vector<std::string> texts(const Property<Array<String>>& array) {
  std::vector<std::string> out;
  if (!array.is_null())
    for (const String& s : array.value) out.push_back(s.str());
  return out;
}

template <class T>
std::vector<T> values(const Property<Array<T>>& array) {
  return array.is_null() ? std::vector<T>() : std::vector<T>(array.value.begin(), array.value.end());
}

// ---- Vital product data --------------------------------------------------------

TEST_F(FeatureTest, CardsTakeTheirFruDataAndEveryFunctionItsFirmwareDetailOnce) {
  runFeatures(agent());
  runFeatures(agent());  // a rebuild makes the same catalogue
  std::lock_guard<std::recursive_mutex> lock(data());
  ASSERT_EQ(catalogue().of<NRVTAVO_Card>().size(), 2u);
  const auto* card = findIn<NRVTAVO_Card>(catalogue().of<NRVTAVO_Card>(),
                                          [](const auto& c) { return textOf(c.NRVSerialNumber) == kCard1; });
  ASSERT_NE(card, nullptr);
  EXPECT_EQ(textOf(card->Manufacturer), "Norvane");
  EXPECT_EQ(textOf(card->SerialNumber), kCard1);
  EXPECT_EQ(textOf(card->PartNumber), "TV5202C-N1");
  EXPECT_EQ(textOf(card->SKU), "FRU-5202C-03");
  EXPECT_EQ(textOf(card->Tag), "6a1f0c4e9b2d4d7a8e1c55f3a0b2c719");
  EXPECT_EQ(textOf(card->Name), std::string("Norvane Ethernet Adapter ") + kCard1);

  const auto* fru = byInstanceID<NRVTAVO_FRUVitalProductData>(catalogue(), kCard1);
  ASSERT_NE(fru, nullptr);
  EXPECT_EQ(textOf(fru->ElementName), std::string("NRV TAVO FRU:") + kCard1);
  EXPECT_EQ(textOf(fru->ProductName), "TAVO 5202C Converged Network Adapter");
  EXPECT_EQ(textOf(fru->UUID), "6a1f0c4e9b2d4d7a8e1c55f3a0b2c719");
  EXPECT_EQ(textOf(fru->Date), "2425");
  EXPECT_EQ(textOf(fru->FRUNumber), "FRU-5202C-03");
  EXPECT_EQ(textOf(fru->CardFunction), "64");
  EXPECT_EQ(textOf(fru->RevisionID), "3");
  // Six functions, each listed once however often the card is merged.
  std::vector<std::string> asics;
  for (const Function& f : functions())
    if (f.serial == kCard1) asics.push_back(f.id);
  EXPECT_EQ(texts(fru->ASICId), asics);
  EXPECT_EQ(texts(fru->FRUFirmwareDetail),
            std::vector<std::string>(asics.size(), "A3,V:10.2.370.19,D:2025-06-17"));
  EXPECT_EQ(catalogue().of<NRVTAVO_FRUElementVPD>().size(), 2u);
  EXPECT_GT(capture.count("FRU VPD: skipping keyword ZQ"), 0);
}

TEST_F(FeatureTest, ACardWithoutSerialNumberIsNamedAsOnboardAdapterWithItsIndex) {
  runFeatures(agent());
  std::lock_guard<std::recursive_mutex> lock(data());
  const auto* card = findIn<NRVTAVO_Card>(catalogue().of<NRVTAVO_Card>(),
                                          [](const auto& c) { return textOf(c.NRVSerialNumber) == kCard2; });
  ASSERT_NE(card, nullptr);
  size_t index = 0;
  while (functions()[index].serial != kCard2) ++index;
  EXPECT_EQ(textOf(card->Name), "Norvane Ethernet Onboard Adapter " + std::to_string(index));
  EXPECT_TRUE(card->SerialNumber.is_null());
  const auto* fru = byInstanceID<NRVTAVO_FRUVitalProductData>(catalogue(), kCard2);
  ASSERT_NE(fru, nullptr);
  EXPECT_TRUE(fru->SerialNumber.is_null());

  NRV_FruRecord record;
  ASSERT_EQ(GetFRUVPD(functions()[index].id.c_str(), &record), 0u);
  EXPECT_EQ(NRV_FruRecord::text(record.FWVersion), "10.2.370.21");
  EXPECT_EQ(NRV_FruRecord::text(record.FWDate), "2025-07-02");
  EXPECT_EQ(GetFRUVPD(nullptr, &record), 4u);
  EXPECT_EQ(GetFRUVPD("0090", &record), 1u);
}

TEST_F(FeatureTest, ACardAlreadyInTheCardMapKeepsItsKey) {
  std::lock_guard<std::recursive_mutex> lock(data());
  Instance_Map& cards = catalogue().of<NRVTAVO_Card>();
  auto* card = static_cast<NRVTAVO_Card*>(cards[0]);
  const std::string serial = textOf(card->Tag);
  NRV_Vpd(catalogue()).UpdateFRUToCard(*card, "", functions()[0].id, 0);
  EXPECT_EQ(textOf(card->Tag), serial);
  EXPECT_EQ(textOf(card->SKU), "FRU-5202C-03");
  EXPECT_EQ(cards.find(card), 0);
  // Without an ASIC identifier the firmware detail is listed once.
  const auto* fru = byInstanceID<NRVTAVO_FRUVitalProductData>(catalogue(), serial);
  ASSERT_NE(fru, nullptr);
  EXPECT_EQ(texts(fru->FRUFirmwareDetail).size(), 1u);
  EXPECT_TRUE(fru->ASICId.is_null());
}

TEST_F(FeatureTest, FirmwareIdentitiesTakeVersionAndNameFromTheirAdaptersFru) {
  std::lock_guard<std::recursive_mutex> lock(data());
  NRV_Vpd vpd(catalogue());
  vpd.UpdateFRUToSoftwareInstance();
  const auto* firmware = byInstanceID<NRVTAVO_SoftwareIdentity>(catalogue(), std::string("NRV CNA Firmware:") + kCard1);
  ASSERT_NE(firmware, nullptr);
  EXPECT_EQ(textOf(firmware->VersionString), "10.2.370.19");
  EXPECT_EQ(firmware->RevisionNumber.value, 370);
  EXPECT_EQ(textOf(firmware->Name), std::string("Norvane Ethernet Adapter ") + kCard1 + " 10.2.370.19");
  firmware = byInstanceID<NRVTAVO_SoftwareIdentity>(catalogue(), std::string("NRV CNA Firmware:") + kCard2);
  ASSERT_NE(firmware, nullptr);
  EXPECT_EQ(textOf(firmware->VersionString), "10.2.370.21");

  std::string port, address;
  EXPECT_EQ(vpd.GetLogicalPortAddress(&port, 2, &address), 0u);
  EXPECT_EQ(port, "TAVO Port Controller:" + functions()[0].serial + ":" + std::to_string(functions()[0].physicalPort));
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
  ASSERT_NE(vpd, nullptr);
  EXPECT_EQ(textOf(vpd->PartNumber), "TV5202C-N1");
  EXPECT_EQ(textOf(vpd->ECLevel), "A03");
  EXPECT_EQ(textOf(vpd->ManufactureId), "1C7E");
  EXPECT_EQ(textOf(vpd->VPDSerialNumber), kCard1);
  EXPECT_EQ(textOf(vpd->FabricGeography), "XCNA");
  EXPECT_EQ(textOf(vpd->Location), "SLOT4");
  EXPECT_EQ(textOf(vpd->PCIGeography), "0000:04:00");
  EXPECT_EQ(textOf(vpd->ExtCapability), "ETH,ISCSI,FCOE");
  EXPECT_EQ(textOf(vpd->ProductName), "Norvane TAVO 5202C 2-port 10GbE Converged Network Adapter");
  EXPECT_EQ(textOf(vpd->FieldV1), "10.2.370.19");
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
  ASSERT_NE(pool, nullptr);
  EXPECT_EQ(pool->Capacity.value, 2u);
  EXPECT_EQ(pool->ResourceType.value, 10);
  EXPECT_FALSE(pool->Primordial.value);
  EXPECT_EQ(textOf(pool->PoolID), textOf(pool->InstanceID));
  EXPECT_EQ(catalogue().of<NRVTAVO_HostedResourcePool>().size(), 1u);
  const Instance_Map& vports = catalogue().of<NRVTAVO_VirtualFCPort>();
  ASSERT_EQ(vports.size(), 2u);
  const auto* vport = static_cast<const NRVTAVO_VirtualFCPort*>(vports[0]);
  EXPECT_EQ(textOf(vport->DeviceID), "10000090FA5C2EA2");
  EXPECT_EQ(textOf(vport->NodeWWN), "20000090FA5C2EA2");
  EXPECT_EQ(vport->PortFCId.value, 0x0a1b01u);
  EXPECT_EQ(textOf(vport->VPortName), "vport-db01-a");
  EXPECT_EQ(textOf(vport->SystemName), kHostName);
  EXPECT_EQ(textOf(vport->CreationClassName), "NRV_VirtualFCPort");
  const Instance_Map& hosting = catalogue().of<NRVTAVO_VPortHostedDependency>();
  ASSERT_EQ(hosting.size(), 2u);
  EXPECT_EQ(textOf(static_cast<const NRVTAVO_VPortHostedDependency*>(hosting[1])->Antecedent->DeviceID), fc1);
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
  ASSERT_NE(t, nullptr);
  EXPECT_EQ(textOf(t->InstanceID), fc1 + ":NS2506121187");
  EXPECT_EQ(textOf(t->Tag), textOf(t->InstanceID));
  EXPECT_EQ(textOf(t->Manufacturer), "NORVANE");
  EXPECT_EQ(textOf(t->PartNumber), "NV-SFP10G-SR");
  EXPECT_EQ(textOf(t->Version), "A");
  EXPECT_EQ(textOf(t->OUI), "00-90-fa");
  EXPECT_EQ(t->ManufactureDate.value.ascii(), "20250612000000.000000+000");
  EXPECT_EQ(t->Identifier.value, 3);
  EXPECT_EQ(t->Connector.value, 7);
  EXPECT_EQ(t->WaveLength.value, 850u);
  EXPECT_EQ(t->SFPStatus.value, 0u);
  EXPECT_FLOAT_EQ(t->Temperature.value, 38.5f);
  EXPECT_FLOAT_EQ(t->RxPower.value, 0.497f);
  EXPECT_EQ(textOf(t->TemperatureUnit), "Celsius");
  struct Expected {
    const Property<real32>& value;
    double expected;
  } const expected[] = {
      {t->TemperatureHighAlarm, 80},  {t->TemperatureLowAlarm, -5},    {t->TemperatureHighWarning, 75},
      {t->VoltageHighAlarm, 3.7},     {t->VoltageLowWarning, 3.0},     {t->CurrentHighAlarm, 15},
      {t->CurrentLowAlarm, 1},        {t->TxPowerHighAlarm, 1.2589},   {t->TxPowerLowWarning, 0.1259},
      {t->RxPowerHighWarning, 1.2589}, {t->RxPowerLowAlarm, 0.01},     {t->RxPowerLowWarning, 0.0158},
  };
  for (const Expected& e : expected) {
    EXPECT_FALSE(e.value.is_null());
    EXPECT_NEAR(e.value.value, e.expected, 1e-5);
  }
  EXPECT_TRUE(capture.contains("RM_GetSffData succesful"));
  EXPECT_TRUE(capture.contains("Temperature: 38.50  C"));

  // The second module runs hot and receives almost nothing: beyond its alarms.
  t = GetSffData(catalogue(), nth(kFCoEAdapterType, 1).id.c_str());
  ASSERT_NE(t, nullptr);
  EXPECT_EQ(t->ManufactureDate.value.ascii(), "19991231000000.000000+000");
  EXPECT_GT(t->Temperature.value, t->TemperatureHighAlarm.value);
  EXPECT_LT(t->RxPower.value, t->RxPowerLowAlarm.value);

  // A 10GBASE-T port has no module data.
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
  const char* order[] = {"NRV:FCoE Current Global Driver Parameter:log-verbose",
                         "NRV:FCoE Maximum Global Driver Parameter:log-verbose",
                         "NRV:FCoE Minimum Global Driver Parameter:log-verbose",
                         "NRV:FCoE Default Global Driver Parameter:log-verbose"};
  for (size_t i = 0; i < 4; ++i)
    EXPECT_EQ(textOf(static_cast<const NRVTAVO_DriverParameterSettingData*>(settings[i])->InstanceID), order[i]);
  const auto* global = byInstanceID<NRVTAVO_DriverParameterSettingData>(
      catalogue(), "NRV:FCoE Maximum Global Driver Parameter:devloss-tmo");
  ASSERT_NE(global, nullptr);
  EXPECT_EQ(global->Value.value, 255u);
  EXPECT_EQ(textOf(global->help), "Seconds before a lost remote port goes away");
  EXPECT_TRUE(global->ConfigurationName.is_null());
  const auto* fixed = byInstanceID<NRVTAVO_DriverParameterSettingData>(
      catalogue(), "NRV:FCoE Current Global Driver Parameter:link-speed");
  ASSERT_NE(fixed, nullptr);
  EXPECT_EQ(fixed->ChangeableType.value, 0);
  const auto* local = byInstanceID<NRVTAVO_DriverParameterSettingData>(
      catalogue(), "NRV:FCoE Current Local Driver Parameter:" + fc1 + ":lun-queue-depth");
  ASSERT_NE(local, nullptr);
  EXPECT_EQ(local->Value.value, 32u);
  EXPECT_EQ(textOf(local->ConfigurationName), "local");
  EXPECT_EQ(textOf(local->ElementName), fc1);
  EXPECT_EQ(textOf(static_cast<const NRVTAVO_DriverParameterSettingData*>(settings[17])->InstanceID),
            "NRV:FCoE Default Local Driver Parameter:" + fc1 + ":lun-queue-depth");
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
  const auto* service = static_cast<const NRVTAVO_DumpService*>(catalogue().of<NRVTAVO_DumpService>()[0]);
  EXPECT_EQ(textOf(service->Name), "NRVTAVO_DumpService");
  EXPECT_EQ(textOf(service->SystemName), kHostName);
  EXPECT_EQ(catalogue().of<NRVTAVO_HostedDumpService>().size(), 1u);
  EXPECT_EQ(catalogue().of<NRVTAVO_DumpServiceAffectsElement>().size(), 2u);

  const auto* data1 = byInstanceID<NRVTAVO_ExtFATDumpData>(catalogue(), std::string("NRV:TAVO ExtFATDumpData:") + kCard1);
  ASSERT_NE(data1, nullptr);
  EXPECT_EQ(data1->RetentionCount.value, 10u);
  EXPECT_EQ(textOf(data1->DumpDirectory), "/var/crash/norvane");
  ASSERT_EQ(catalogue().of<NRVTAVO_ElementExtFATDumpData>().size(), 2u);
  EXPECT_EQ(static_cast<const NRVTAVO_ElementExtFATDumpData*>(catalogue().of<NRVTAVO_ElementExtFATDumpData>()[0])
                ->IsCurrent.value,
            1);
  EXPECT_EQ(catalogue().of<NRVTAVO_ExtFATDumpAdvancedData>().size(), 4u);
  EXPECT_EQ(catalogue().of<NRVTAVO_ElementExtFATDumpAdvancedData>().size(), 4u);
  const auto* fcoe = byInstanceID<NRVTAVO_ExtFATDumpAdvancedData>(
      catalogue(), std::string("NRV:TAVO ExtFATDumpAdvancedData:") + kCard1 + ":FCoE");
  ASSERT_NE(fcoe, nullptr);
  EXPECT_EQ(textOf(fcoe->Description), "FCoE");
  EXPECT_EQ(texts(fcoe->Modes), (std::vector<std::string>{"ram", "uart"}));
  EXPECT_EQ(texts(fcoe->TraceLevel), (std::vector<std::string>{"info", "error"}));
  EXPECT_EQ(values(fcoe->PCIFuncMask), (std::vector<uint32>{0x3f, 0x3f}));
  const auto* nic = byInstanceID<NRVTAVO_ExtFATDumpAdvancedData>(
      catalogue(), std::string("NRV:TAVO ExtFATDumpAdvancedData:") + kCard2 + ":NIC");
  ASSERT_NE(nic, nullptr);
  EXPECT_EQ(texts(nic->Modes), (std::vector<std::string>{"ram", "nvram"}));
  EXPECT_EQ(texts(nic->TraceLevel), (std::vector<std::string>{"info", "fatal"}));
  EXPECT_EQ(values(nic->PortMask), (std::vector<uint32>{0xFFFFFFFF, 0xF}));
  const auto* silent = byInstanceID<NRVTAVO_ExtFATDumpAdvancedData>(
      catalogue(), std::string("NRV:TAVO ExtFATDumpAdvancedData:") + kCard1 + ":iSCSI");
  ASSERT_NE(silent, nullptr);
  EXPECT_TRUE(texts(silent->Modes).empty());
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
  EXPECT_TRUE(capture.contains("RetrieveDownNICPorts. "));
  EXPECT_TRUE(capture.contains("Dump Service/Chip class not exist, Cannot continue further"));
  dump.ClearDumpServiceClasses(NRV_Dump::kAll);
  EXPECT_TRUE(catalogue().of<NRVTAVO_DumpService>().empty());
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
