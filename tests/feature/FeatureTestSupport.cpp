#include "FeatureTestSupport.h"

#include <unistd.h>

#include <cctype>
#include <fstream>

#include "access/NRV_Dump.h"
#include "data/NRV_DriverParameters.h"
#include "data/NRV_PortVirtualization.h"
#include "data/NRV_Transceiver.h"
#include "data/NRV_VitalProductData.h"
#include "data/NRV_Vpd.h"
#include "schema/Classes.h"
#include "sim/SimSite.h"

namespace feature_test {

using namespace cimple;

namespace {

std::string sitePath() {
  const char* site = std::getenv("NRV_SITE");
  return site ? site : "";
}

template <class C>
C* make() {
  return makeInstance<C>();
}

void identify(Property<Array<String>>& descriptions, Property<Array<String>>& info,
              std::initializer_list<std::pair<const char*, std::string>> pairs) {
  Array<String> d, i;
  for (const auto& [description, value] : pairs) {
    d.append(description);
    i.append(String(value));
  }
  descriptions.set(d);
  info.set(i);
}

template <class Port>
Port* port(const CIM_ComputerSystem& host, const Function& f, const char* creationClass) {
  auto* p = make<Port>();
  p->SystemCreationClassName.set(host.CreationClassName.value);
  p->SystemName.set(host.Name.value);
  p->CreationClassName.set(creationClass);
  p->DeviceID.set(String(f.id));
  p->Name.set(String(f.id));
  return p;
}

// The instances the catalogue frame makes before the feature builders run.
void seedCatalogue(ProviderAgent& agent) {
  agent.clearAdapterMaps();
  Agent_Catalogue catalogue(agent);
  auto* host = make<CIM_ComputerSystem>();
  host->CreationClassName.set("CIM_ComputerSystem");
  host->Name.set(kHostName);
  catalogue.insert(host);
  const std::vector<Function> functions = functionsOf(*agent.m_pData);
  for (size_t i = 0; i < functions.size(); ++i) {
    const Function& f = functions[i];
    const Adapter& adapter = *agent.m_pData->getAdapters()[i];
    if (!findIn<NRVTAVO_Card>(catalogue.of<NRVTAVO_Card>(),
                              [&](const NRVTAVO_Card& c) { return textOf(c.NRVSerialNumber) == f.serial; })) {
      auto* card = make<NRVTAVO_Card>();
      card->Tag.set(String(f.serial));
      card->CreationClassName.set("NRVTAVO_Card");
      card->NRVSerialNumber.set(String(f.serial));
      catalogue.insert(card);
      auto* chip = make<NRVTAVO_Chip>();
      chip->Tag.set(String(f.chipTag));
      chip->CreationClassName.set("NRVTAVO_Chip");
      catalogue.insert(chip);
      auto* firmware = make<NRVTAVO_SoftwareIdentity>();
      firmware->InstanceID.set(String("NRV CNA Firmware:" + f.chipTag));
      firmware->Classifications.set(Array<uint16>{10});
      catalogue.insert(firmware);
    }
    const std::string controllerId = "TAVO Port Controller:" + f.serial + ":" + std::to_string(f.physicalPort);
    auto* controller = findIn<NRVTAVO_PortController>(
        catalogue.of<NRVTAVO_PortController>(), [&](const auto& pc) { return textOf(pc.DeviceID) == controllerId; });
    if (controller == nullptr) {
      controller = port<NRVTAVO_PortController>(*host, f, "NRVTAVO_PortController");
      controller->DeviceID.set(String(controllerId));
      catalogue.insert(controller);
      const Instance* firmware = byInstanceID<NRVTAVO_SoftwareIdentity>(catalogue, "NRV CNA Firmware:" + f.chipTag);
      catalogue.insert(makeAssociation<NRVTAVO_ElementSoftwareIdentity>(firmware, controller));
    }
    if (f.type == kFCoEAdapterType) {
      auto* fc = port<NRVTAVO_FCPort>(*host, f, "NRVTAVO_FCPort");
      identify(fc->IdentifyingDescriptions, fc->OtherIdentifyingInfo,
               {{"SerialNumber + Sub-AdapterID", f.chipTag},
                {"NORVANE:IEEE_ADDRESS", adapter.getAttributes()->text(531)}});
      catalogue.insert(fc);
      catalogue.insert(makeAssociation<NRVTAVO_FCControlledBy>(controller, fc));
    } else {
      auto* eth = port<NRVTAVO_EthernetPort>(*host, f, "NRVTAVO_EthernetPort");
      if (!adapter.getPorts().empty())
        eth->PermanentAddress.set(String(adapter.getPort(0)->getAttributes()->text(804)));
      identify(eth->IdentifyingDescriptions, eth->OtherIdentifyingInfo, {{"SerialNumber + Sub-AdapterID", f.chipTag}});
      catalogue.insert(eth);
      catalogue.insert(makeAssociation<NRVTAVO_ControlledBy>(controller, eth));
    }
  }
}

void nothing(ProviderAgent&) {}

}  // namespace

// The classes the feature builders fill.
#define FEATURE_CLASSES(X)                                                                                     \
  X(NRVTAVO_Card) X(NRVTAVO_FRUVitalProductData) X(NRVTAVO_FRUElementVPD) X(NRVTAVO_VitalProductData)           \
  X(NRVTAVO_ResourcePool) X(NRVTAVO_HostedResourcePool) X(NRVTAVO_VirtualFCPort)                               \
  X(NRVTAVO_VPortHostedDependency) X(NRVTAVO_ElementAllocatedFromPool) X(NRVTAVO_Transceiver)                  \
  X(NRVTAVO_DriverParameterSettingData) X(NRVTAVO_DumpService) X(NRVTAVO_HostedDumpService)                    \
  X(NRVTAVO_DumpServiceAffectsElement) X(NRVTAVO_ExtFATDumpData) X(NRVTAVO_ElementExtFATDumpData)              \
  X(NRVTAVO_ExtFATDumpAdvancedData) X(NRVTAVO_ElementExtFATDumpAdvancedData)

void runFeatures(ProviderAgent& agent) {
  std::lock_guard<std::recursive_mutex> lock(agent.m_DataMutex);
  Agent_Catalogue catalogue(agent);
#define FEATURE_CLEAR(C) catalogue.of<C>().clear();
  FEATURE_CLASSES(FEATURE_CLEAR)
#undef FEATURE_CLEAR
  const std::vector<Function> functions = functionsOf(*agent.m_pData);
  NRV_Vpd vpd(catalogue);
  for (uint32_t i = 0; i < functions.size(); ++i) {
    const Function& f = functions[i];
    auto* card = findIn<NRVTAVO_Card>(catalogue.of<NRVTAVO_Card>(),
                                      [&](const NRVTAVO_Card& c) { return textOf(c.NRVSerialNumber) == f.serial; });
    if (card != nullptr) {
      vpd.UpdateFRUToCard(*card, f.id, f.id, i);
      continue;
    }
    card = make<NRVTAVO_Card>();
    card->Tag.set(String(f.serial));
    card->CreationClassName.set("NRVTAVO_Card");
    card->NRVSerialNumber.set(String(f.serial));
    vpd.UpdateFRUToCard(*card, f.id, f.id, i);
    catalogue.insert(card);
  }
  for (const Function& f : functions) CreateVPD(catalogue, f.id.c_str());
  vpd.UpdateFRUToSoftwareInstance();
  NRV_PortVirtualization(catalogue).CreatePortVirtualizationClasses();
  for (const Function& f : functions) GetSffData(catalogue, f.id.c_str());
  bool global = true;
  for (const Function& f : functions)
    if (f.type == kFCoEAdapterType) {
      if (global) FCoEGetDriverParam(catalogue, f.id, true);
      global = false;
      FCoEGetDriverParam(catalogue, f.id, false);
    }
  NRV_Dump(catalogue).CreateDumpServiceClasses();
}

Snapshot snapshot(ProviderAgent& agent) {
  std::lock_guard<std::recursive_mutex> lock(agent.m_DataMutex);
  Agent_Catalogue catalogue(agent);
  Snapshot out;
  auto keys = [&](const char* name, const Instance_Map& map) {
    std::set<std::string>& set = out[name];
    for (size_t i = 0; i < map.size(); ++i) {
      std::string path;
      if (instance_to_model_path(map[i], path)) set.insert(path);
    }
  };
#define FEATURE_KEYS(C) keys(#C, catalogue.of<C>());
  FEATURE_CLASSES(FEATURE_KEYS)
#undef FEATURE_KEYS
  return out;
}

std::vector<Function> functionsOf(const Data& data) {
  std::vector<Function> out;
  for (const auto& adapter : data.getAdapters()) {
    Function f;
    f.type = adapter->getAdapterType();
    f.id = adapter->getIdentifierText();
    f.serial = adapter->getAttributes()->text(515);
    const std::string sub = adapter->getAttributes()->text(586);
    f.chipTag = sub.empty() ? f.serial : f.serial + ":" + sub;
    f.physicalPort = adapter->getAttributes()->integer(559);
    out.push_back(f);
  }
  return out;
}

nlohmann::json sampleSite() {
  std::ifstream in(sitePath());
  return nlohmann::json::parse(in);
}

void loadSite(const nlohmann::json& site) {
  const std::string path = nrv_test::sysroot() + "/feature_site_" + std::to_string(::getpid()) + ".json";
  std::ofstream(path) << site.dump(1);
  ASSERT_TRUE(nrvsim::SimSite::instance().reload(path)) << nrvsim::SimSite::instance().error();
  std::remove(path.c_str());
}

void addFault(nlohmann::json& site, const nlohmann::json& rule) { site["faults"].push_back(rule); }

std::string plainHex(const std::string& text) {
  std::string out;
  for (char c : text)
    if (std::isxdigit(static_cast<unsigned char>(c))) out += static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
  return out;
}

void FeatureTest::SetUp() {
  ASSERT_EQ(ProviderAgent::peekInstance(), nullptr);
  loadSite(sampleSite());
  // The real adapter data set; the seeded catalogue; no SAN.
  Catalogue_Builders builders = ProviderAgent::defaultBuilders();
  builders.update_adapter_maps = seedCatalogue;
  builders.build_san_data = builders.update_san_maps = builders.publish_san_maps = nothing;
  ProviderAgent::useBuilders(builders);
  ASSERT_TRUE(ProviderAgent::acquireLoaded());
  m_Agent = ProviderAgent::peekInstance();
  m_Agent->BuildCimpleInfo();
  { auto ready = m_Agent->waitForAdapterMaps(); }
  nrv_test::wait_fetch_idle(*m_Agent);
  m_Catalogue = std::make_unique<Agent_Catalogue>(*m_Agent);
  std::lock_guard<std::recursive_mutex> lock(data());
  m_Functions = functionsOf(*m_Agent->m_pData);
  ASSERT_FALSE(m_Functions.empty());
  capture.arm();
  capture.reset();
}

void FeatureTest::TearDown() {
  m_Catalogue.reset();
  while (ProviderAgent::refCount() > 0) ProviderAgent::releaseRef();
  ProviderAgent::useBuilders(ProviderAgent::defaultBuilders());
}

const Function& FeatureTest::nth(uint32_t type, size_t n) const {
  for (const Function& f : m_Functions)
    if (f.type == type && n-- == 0) return f;
  throw std::logic_error("the site has too few functions of that kind");
}

std::string text(const Instance* instance, const char* name) {
  const Meta_Property* mp = instance ? find_property(instance->meta_class, name) : nullptr;
  if (mp == nullptr || mp->type != STRING || is_array(mp)) return "<no such property>";
  const auto& p = *static_cast<const Property<String>*>(slot(instance, mp->offset));
  return p.is_null() ? "<null>" : p.value.str();
}

void expectTexts(const Instance* instance, std::initializer_list<std::pair<const char*, std::string>> expected) {
  ASSERT_NE(instance, nullptr);
  for (const auto& [name, value] : expected) EXPECT_EQ(text(instance, name), value) << name;
}

std::vector<std::string> texts(const Property<Array<String>>& array) {
  std::vector<std::string> out;
  if (!array.is_null())
    for (const String& s : array.value) out.push_back(s.str());
  return out;
}

}  // namespace feature_test
