#include "agent/Catalogue_Cards.h"

#include <stdexcept>

#include "agent/Association_Builder.h"
#include "agent/Catalogue_Features.h"
#include "agent/Catalogue_Profiles.h"
#include "agent/Catalogue_Services.h"
#include "agent/Catalogue_Software.h"
#include "agent/ProviderAgent.h"
#include "schema/Classes.h"

namespace cimple {

namespace {

NRVTAVO_Card* make_card(const Function_View& fn) {
  const AdapterAttributes& a = fn.a;
  auto* card = NRVTAVO_Card::create(true);
  card->Tag.set(fn.serial());
  card->CreationClassName.set("NRVTAVO_Card");
  card->ElementName.set(format_text("NRV TAVO:%s:%s", fn.model().c_str(), fn.serial().c_str()));
  card->Name.set(fn.model());
  card->Model.set(fn.model());
  card->PartNumber.set(fn.model());
  card->SerialNumber.set(fn.serial());
  card->OtherIdentifyingInfo.set(fn.serial());
  card->NRVSerialNumber.set(fn.serial());
  card->Manufacturer.set(fn.manufacturer());
  card->Version.set(a.text(RM_HA_HARDWARE_VERSION));
  card->Description.set(fn.model_description());
  card->VendorSpecID.set(a.integer(RM_HA_VENDOR_SPECIFIC_ID));
  card->DeviceID.set(a.integer(RM_HA_DEVICE_ID));
  card->ModelID.set(a.integer(RM_HA_MODEL_ID));
  card->BoardTemperature.set(static_cast<sint32>(a.integer(RM_HA_BOARD_TEMPERATURE)));
  card->HostingBoard.set(false);
  card->PackageType.set(9);
  return card;
}

NRVTAVO_PhysicalPackage* make_package(const Function_View& fn) {
  auto* package = NRVTAVO_PhysicalPackage::create(true);
  package->Tag.set(fn.serial());
  package->CreationClassName.set("NRVTAVO_PhysicalPackage");
  package->ElementName.set(format_text("NRV TAVO Package:%s:%s", fn.model().c_str(), fn.serial().c_str()));
  package->Manufacturer.set(fn.manufacturer());
  package->Model.set(fn.model());
  package->SerialNumber.set(fn.serial());
  package->PartNumber.set(fn.model());
  package->Version.set(fn.a.text(RM_HA_HARDWARE_VERSION));
  package->PackageType.set(9);
  return package;
}

NRVTAVO_Product* make_product(const Function_View& fn) {
  auto* product = NRVTAVO_Product::create(true);
  product->Name.set(fn.model());
  product->IdentifyingNumber.set(fn.serial());
  product->Vendor.set(fn.manufacturer());
  product->Version.set(fn.a.text(RM_HA_HARDWARE_VERSION));
  product->ElementName.set(format_text("NRV TAVO Product:%s:%s", fn.model().c_str(), fn.serial().c_str()));
  product->Description.set(fn.model_description());
  return product;
}

NRVTAVO_Chip* make_chip(const Function_View& fn) {
  const uint32_t temperature = fn.a.integer(RM_HA_BOARD_TEMPERATURE);
  auto* chip = NRVTAVO_Chip::create(true);
  chip->Tag.set(fn.chip_tag());
  chip->CreationClassName.set("NRVTAVO_Chip");
  chip->ElementName.set(format_text("NRV TAVO ASIC:%s:%s", fn.model().c_str(), fn.serial().c_str()));
  chip->Name.set(fn.model());
  chip->Model.set(fn.model());
  chip->Manufacturer.set(fn.manufacturer());
  chip->Description.set(fn.model_description());
  chip->SerialNumber.set(fn.serial());
  chip->SubAdapterId.set(fn.sub_adapter());
  chip->OASCapability.set(0);
  chip->TemperatureUnit.set("Celsius");
  if (static_cast<sint32>(temperature) > 0) chip->BoardTemperature.set(static_cast<sint32>(temperature));
  return chip;
}

NRVTAVO_PhysicalConnector* make_connector(const Function_View& fn) {
  const uint32_t number = fn.physical_port();
  auto* connector = NRVTAVO_PhysicalConnector::create(true);
  connector->Tag.set(format_text("NRV TAVO Port:%s:Network Connector:%u", fn.serial().c_str(), number));
  connector->CreationClassName.set("NRVTAVO_PhysicalConnector");
  connector->ElementName.set(connector->Tag.value);
  connector->Name.set(format_text("LocalPhysicalPort:%u", number));
  connector->Manufacturer.set(fn.manufacturer());
  connector->SerialNumber.set(fn.serial());
  return connector;
}

NRVTAVO_PortController* make_controller(const Catalogue_Build& build, const Function_View& fn) {
  const uint32_t number = fn.physical_port();
  const Host_Keys host = host_keys(build);
  auto* controller = NRVTAVO_PortController::create(true);
  controller->SystemCreationClassName.set(host.creation_class_name);
  controller->SystemName.set(host.name);
  controller->CreationClassName.set("NRVTAVO_PortController");
  controller->DeviceID.set(format_text("TAVO Port Controller:%s:%u", fn.serial().c_str(), number));
  controller->ElementName.set(format_text("%s:%s:%u", fn.model().c_str(), fn.serial().c_str(), number));
  controller->ProtocolDescription.set("Multiple Protocols FCoE+NIC,iSCSI+NIC,NIC");
  controller->OtherIdentifyingInfo.set({String(fn.port_key())});
  controller->IdentifyingDescriptions.set({"SerialNumber:PhysicalPortNumber"});
  controller->PhyLinkDownReason.set(fn.p.integer(RM_PA_PHY_LINK_DOWN_REASON));
  controller->EnabledState.set(2);
  controller->OperationalStatus.set({2});
  return controller;
}

}  // namespace

Card_Entry* ensure_card(Catalogue_Build& build, const Function_View& fn) {
  NRV_LOG(NRV_DBG, "inside icard %zu", fn.index);
  auto [it, fresh] = build.cards.try_emplace(fn.serial());
  Card_Entry& entry = it->second;
  if (!fresh) {
    // A further function of the card adds its firmware detail to the card's FRU data.
    if (entry.card == nullptr) return nullptr;
    feature_update_fru_to_card(build.agent, entry.card, fn.chip_tag(), fn.name(), fn.index);
    return &entry;
  }
  NRV_LOG(NRV_DBG, "create icard instance %zu", fn.index);
  ProviderAgent& agent = build.agent;
  // The FRU data may give the card its final Tag (a key), so it is merged in
  // before the card map indexes the card by its keys.
  NRVTAVO_Card* card = make_card(fn);
  feature_update_fru_to_card(agent, card, fn.chip_tag(), fn.name(), fn.index);
  entry.card = insert_instance(agent, card, "Insert Failed : m_NRVTAVO_Card_map");
  if (entry.card == nullptr) {
    NRV_LOG(NRV_ERR, "CreateTAVOCardInstance failed");
    return nullptr;
  }
  const char* serial = fn.serial().c_str();
  associate<NRVTAVO_ChassisContainsCard>(build, serial, build.chassis, entry.card);
  associate<NRVTAVO_CardConformsToProfile>(build, format_text("TAVO Card %s, Access Points", serial),
                                           find_profile(agent, Profile::kAccessPoints), entry.card);
  associate<NRVTAVO_CardConformsToProfile>(build, format_text("TAVO Card %s, Host Discovered Resource", serial),
                                           find_profile(agent, Profile::kHostDiscoveredResources), entry.card);
  associate<NRVTAVO_CardConformsToProfile>(build, format_text("TAVO Card %s, Physical Asset", serial),
                                           find_profile(agent, Profile::kPhysicalAsset), entry.card);

  NRV_LOG(NRV_DBG, "inside Product %zu", fn.index);
  entry.package = insert_instance(agent, make_package(fn));
  entry.product = insert_instance(agent, make_product(fn));
  associate<NRVTAVO_ProductPhysicalComponentPhysicalPackage>(build, serial, entry.product, entry.package);
  entry.flash_image = create_flash_image(build, fn);
  return &entry;
}

Chip_Entry* ensure_chip(Catalogue_Build& build, const Function_View& fn, Card_Entry& card) {
  auto [it, fresh] = build.chips.try_emplace(fn.chip_tag());
  Chip_Entry& entry = it->second;
  if (!fresh) return entry.chip ? &entry : nullptr;
  entry.chip = insert_instance(build.agent, make_chip(fn), "Insert Failed : m_NRVTAVO_Chip_map");
  if (entry.chip == nullptr) {
    NRV_LOG(NRV_ERR, "CreateTAVOChipInstance failed");
    return nullptr;
  }
  associate<NRVTAVO_CardContainsChip>(build, fn.chip_tag(), card.card, entry.chip);
  associate<NRVTAVO_InstallServiceAffectsChip>(build, fn.chip_tag(), entry.chip, build.install_service);
  entry.firmware = create_firmware_identity(build, fn, entry.chip);
  return &entry;
}

Physical_Port_Entry* ensure_physical_port(Catalogue_Build& build, const Function_View& fn, Card_Entry& card,
                                          Chip_Entry& chip, bool storage, bool strict) {
  NRV_LOG(NRV_DBG, "inside Port controller %zu", fn.index);
  auto [it, fresh] = build.physical_ports.try_emplace(fn.port_key());
  Physical_Port_Entry& entry = it->second;
  if (!fresh) return entry.controller ? &entry : nullptr;
  ProviderAgent& agent = build.agent;
  const std::string label = fn.port_key();

  entry.connector = insert_instance(agent, make_connector(fn));
  associate<NRVTAVO_Container>(build, label, card.card, entry.connector);
  associate<NRVTAVO_ConnectorDependsOnChip>(build, label, entry.connector, chip.chip);
  associate<NRVTAVO_ProductPhysicalComponent>(build, label, card.product, entry.connector);

  NRV_LOG(NRV_DBG, "create Port controller instance %zu", fn.index);
  entry.controller = insert_instance(agent, make_controller(build, fn));
  if (entry.controller == nullptr) return nullptr;
  Instance* pc = entry.controller;
  associate<NRVTAVO_PortControllerSystemDevice>(build, label, build.host, pc);
  associate<NRVTAVO_CardRealizesPortController>(build, label, card.card, pc);
  associate<NRVTAVO_PortControllerRealizes>(build, label, entry.connector, pc);
  associate<NRVTAVO_PortControllerRealizesPhysicalPackage>(build, label, card.package, pc);
  associate<NRVTAVO_ProductPortControllerComponent>(build, label, card.product, pc);
  associate<NRVTAVO_TAVOPortFlashImageSoftwareIdentity>(build, label, card.flash_image, pc);
  if (auto* firmware = associate<NRVTAVO_ElementSoftwareIdentity>(build, label, chip.firmware, pc)) {
    // Current, default and installed, as the caller gives them, last first.
    firmware->ElementSoftwareStatus.set({2, 5, 6});
    firmware->UpgradeCondition.set(3);
  }
  const Profile profile = storage ? Profile::kStorageHBA : Profile::kHostLANNetworkPort;
  if (!associate<NRVTAVO_PortControllerConformsToProfile>(build, label, find_profile(agent, profile), pc) && strict)
    throw std::runtime_error("Insert Failed : m_NRVTAVO_PortControllerConformsToProfile_map");
  if (Instance* transceiver = feature_transceiver(agent, fn.name()))
    associate<NRVTAVO_TransceiverComponent>(build, label, pc, transceiver);
  return &entry;
}

}  // namespace cimple
