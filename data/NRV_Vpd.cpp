// FRU data into the card, the FRU instances and the firmware identities.
#include "data/NRV_Vpd.h"

#include <algorithm>

#include "access/NRV_Common.h"
#include "logging/Log.h"
#include "schema/NRVTAVO_ControlledBy.h"
#include "schema/NRVTAVO_ElementSoftwareIdentity.h"
#include "schema/NRVTAVO_EthernetPort.h"
#include "schema/NRVTAVO_FCControlledBy.h"
#include "schema/NRVTAVO_FCPort.h"
#include "schema/NRVTAVO_FRUElementVPD.h"
#include "schema/NRVTAVO_FRUVitalProductData.h"
#include "schema/NRVTAVO_PortController.h"
#include "schema/NRVTAVO_SoftwareIdentity.h"

namespace cimple {

namespace {

constexpr int kPortControllerAddress = 2;
constexpr uint16_t kFirmwareClassification = 10;

void setIfPresent(Property<String>& property, const std::string& value) {
  if (!value.empty()) property.set(String(value));
}

std::string cardFunction(const NRV_FruRecord& fru) {
  std::string text;
  CardFunctionText(fru.CF, text);
  return text;
}

bool lists(const Property<Array<String>>& array, const std::string& value) {
  if (array.is_null()) return false;
  return std::any_of(array.value.begin(), array.value.end(), [&](const String& s) { return s.view() == value; });
}

void append(Property<Array<String>>& array, const std::string& value) {
  if (array.is_null()) array.set(Array<String>());
  array.value.append(String(value));
}

// The DeviceID of the port that the association class A (port controller ->
// port) links to `controller`; "" when none does.
template <class A>
std::string controlledPort(NRV_Catalogue& catalogue, const Instance* controller) {
  const A* link = findIn<A>(catalogue.of<A>(), [&](const A& a) {
    return a.Antecedent != nullptr && a.Dependent != nullptr && key_eq(a.Antecedent, controller);
  });
  return link ? textOf(link->Dependent->DeviceID) : std::string();
}

}  // namespace

NRV_Vpd::NRV_Vpd(NRV_Catalogue& catalogue) : m_Catalogue(catalogue) { NRV_LOG(NRV_DBG, "NRV_Vpd::Constructor"); }

NRV_Vpd::~NRV_Vpd() { NRV_LOG(NRV_DBG, "NRV_Vpd::Destructor"); }

void NRV_Vpd::UpdateFRUToCard(NRVTAVO_Card& card, const std::string& asicId, const std::string& deviceId,
                              uint32_t index) {
  NRV_LOG(NRV_DBG, "NRV_Vpd::UpdateFRUToCard");
  if (textOf(card.SKU).empty()) {
    NRV_FruRecord fru;
    if (GetFRUVPD(deviceId.c_str(), &fru) != 0) {
      NRV_LOG(NRV_DBG, "Unable to get the FRU VPD for Card : %s ", textOf(card.Tag).c_str());
      return;
    }
    const std::string manufacturer = NRV_FruRecord::text(fru.MN);
    const std::string serial = NRV_FruRecord::text(fru.SN);
    setIfPresent(card.Manufacturer, manufacturer);
    setIfPresent(card.SerialNumber, serial);
    setIfPresent(card.PartNumber, NRV_FruRecord::text(fru.PN));
    setIfPresent(card.SKU, NRV_FruRecord::text(fru.FN));
    // The Tag is a key: changing it under the card map would lose the card
    // there, and a UUID another card already carries (blank or cloned FRU
    // data) would keep this card out of the map.
    const std::string uuid = NRV_FruRecord::text(fru.UU);
    const Instance_Map& cards = m_Catalogue.of<NRVTAVO_Card>();
    if (!findIn<NRVTAVO_Card>(cards, [&](const NRVTAVO_Card& c) { return &c == &card || textOf(c.Tag) == uuid; }))
      setIfPresent(card.Tag, uuid);
    if (!manufacturer.empty()) {
      char name[600];
      if (!serial.empty())
        snprintf(name, sizeof name, "%s %s Adapter %s", manufacturer.c_str(), cardFunction(fru).c_str(),
                 serial.c_str());
      else
        snprintf(name, sizeof name, "%s %s Onboard Adapter %u", manufacturer.c_str(), cardFunction(fru).c_str(),
                 index);
      card.Name.set(String(name));
    }
    createFruInstance(card, fru, asicId);
  }
  addFunctionToFru(card, asicId, deviceId);
}

void NRV_Vpd::createFruInstance(const NRVTAVO_Card& card, const NRV_FruRecord& fru, const std::string& asicId) {
  const std::string id = textOf(card.NRVSerialNumber);
  // A card whose FRU data lacks an FRU number keeps an empty SKU; its next
  // function must not try to publish the same FRU instance again.
  Instance_Map& frus = m_Catalogue.of<NRVTAVO_FRUVitalProductData>();
  if (findIn<NRVTAVO_FRUVitalProductData>(frus, [&](const auto& f) { return textOf(f.InstanceID) == id; })) return;
  auto* data = makeInstance<NRVTAVO_FRUVitalProductData>();
  data->InstanceID.set(String(id));
  data->ElementName.set(String("NRV TAVO FRU:" + id));
  setIfPresent(data->ProductName, NRV_FruRecord::text(fru.PA));
  setIfPresent(data->SerialNumber, NRV_FruRecord::text(fru.SN));
  setIfPresent(data->PartNumber, NRV_FruRecord::text(fru.PN));
  setIfPresent(data->Manufacturer, NRV_FruRecord::text(fru.MN));
  setIfPresent(data->Date, NRV_FruRecord::text(fru.DM));
  setIfPresent(data->UUID, NRV_FruRecord::text(fru.UU));
  setIfPresent(data->FRUNumber, NRV_FruRecord::text(fru.FN));
  append(data->FRUFirmwareDetail, NRV_FruRecord::text(fru.FW));
  data->CardFunction.set(String(std::to_string(fru.CF)));
  data->RevisionID.set(String(std::to_string(fru.RI)));
  if (!asicId.empty()) append(data->ASICId, asicId);
  if (!m_Catalogue.insert(data)) {
    NRV_LOG(NRV_CRIT, "Insert Failed : m_NRVTAVO_FRUVitalProductData_map");
    return;
  }
  if (!m_Catalogue.insert(makeAssociation<NRVTAVO_FRUElementVPD>(&card, data)))
    NRV_LOG(NRV_CRIT, "Insert Failed : NRVTAVO_FRUElementVPD");
}

void NRV_Vpd::addFunctionToFru(const NRVTAVO_Card& card, const std::string& asicId, const std::string& deviceId) {
  // Without an ASIC identifier there is nothing to tell this function's
  // detail apart from the one already listed.
  if (asicId.empty()) return;
  const std::string id = textOf(card.NRVSerialNumber);
  auto* data = findIn<NRVTAVO_FRUVitalProductData>(m_Catalogue.of<NRVTAVO_FRUVitalProductData>(),
                                                   [&](const auto& f) { return textOf(f.InstanceID) == id; });
  if (data == nullptr || lists(data->ASICId, asicId)) return;
  NRV_FruRecord fru;
  if (GetFRUVPD(deviceId.c_str(), &fru) != 0) return;
  append(data->FRUFirmwareDetail, NRV_FruRecord::text(fru.FW));
  append(data->ASICId, asicId);
}

uint32_t NRV_Vpd::GetLogicalPortAddress(std::string* portText, int kind, std::string* address) {
  if (address == nullptr) {
    NRV_LOG(NRV_ERR, "Invalid PortAddress");
    return kNrvNotFound;
  }
  if (kind != kPortControllerAddress || portText == nullptr) return kNrvNotFound;
  const Instance_Map& controllers = m_Catalogue.of<NRVTAVO_PortController>();
  if (portText->empty() && !controllers.empty())
    *portText = textOf(static_cast<const NRVTAVO_PortController*>(controllers[0])->DeviceID);
  const auto* controller = findIn<NRVTAVO_PortController>(
      controllers, [&](const NRVTAVO_PortController& pc) { return textOf(pc.DeviceID) == *portText; });
  if (controller == nullptr) return kNrvNotFound;
  std::string found = controlledPort<NRVTAVO_ControlledBy>(m_Catalogue, controller);
  if (found.empty()) found = controlledPort<NRVTAVO_FCControlledBy>(m_Catalogue, controller);
  if (found.empty()) return kNrvNotFound;
  *address = found;
  return 0;
}

void NRV_Vpd::UpdateFRUToSoftwareInstance() {
  NRV_LOG(NRV_DBG, "NRV_Vpd::UpdateFRUToSoftwareInstance");
  const Instance_Map& identities = m_Catalogue.of<NRVTAVO_SoftwareIdentity>();
  if (identities.empty()) {
    NRV_LOG(NRV_DBG, "No SoftwareIdentity instance to update the FRU Data");
    return;
  }
  const Instance_Map& links = m_Catalogue.of<NRVTAVO_ElementSoftwareIdentity>();
  for (size_t i = 0; i < identities.size(); ++i) {
    if (!is_subclass(&NRVTAVO_SoftwareIdentity::static_meta_class, identities[i]->meta_class)) {
      NRV_LOG(NRV_ERR, "Failed to map CIM_Softwareidentity Instance");
      continue;
    }
    auto* identity = static_cast<NRVTAVO_SoftwareIdentity*>(identities[i]);
    const auto& classes = identity->Classifications;
    if (classes.is_null() ||
        std::find(classes.value.begin(), classes.value.end(), kFirmwareClassification) == classes.value.end())
      continue;
    const auto* link = findIn<NRVTAVO_ElementSoftwareIdentity>(links, [&](const auto& l) {
      return l.Antecedent != nullptr && l.Dependent != nullptr && key_eq(l.Antecedent, identity);
    });
    if (link == nullptr) continue;
    std::string controller = textOf(link->Dependent->DeviceID);
    std::string address;
    NRV_FruRecord fru;
    if (GetLogicalPortAddress(&controller, kPortControllerAddress, &address) != 0 ||
        GetFRUVPD(address.c_str(), &fru) != 0)
      continue;
    const std::string version = NRV_FruRecord::text(fru.FWVersion);
    if (!version.empty()) {
      identity->VersionString.set(String(version));
      uint16_t major = 0, minor = 0, revision = 0, build = 0;
      parseDottedVersion(version.c_str(), &major, &minor, &revision, &build);
      identity->MajorVersion.set(major);
      identity->MinorVersion.set(minor);
      identity->RevisionNumber.set(revision);
      identity->BuildNumber.set(build);
    }
    identity->Name.set(String(NRV_FruRecord::text(fru.MN) + " " + cardFunction(fru) + " Adapter " +
                              NRV_FruRecord::text(fru.SN) + " " + version));
  }
}

}  // namespace cimple
