#include "tests/adapter/Test_Providers.h"

#include "tests/adapter/Test_Provider_Classes.h"

namespace test {

namespace {

Store* g_store = nullptr;

#define TEST_PROVIDER(NAME, CLASS, PROVIDER)                                                               \
  CMPI_Static_Data NAME##_record;                                                                           \
  const Provider_Registration NAME##_registration = {kModuleName, #CLASS "_Provider", provider_proc<PROVIDER>, \
                                                     &CLASS::static_meta_class, nullptr};

TEST_PROVIDER(card, NRVTAVO_Card, Card_Provider)
TEST_PROVIDER(chip, NRVTAVO_Chip, Chip_Provider)
TEST_PROVIDER(link, NRVTAVO_CardContainsChip, Link_Provider)
TEST_PROVIDER(service, NRVTAVO_ChannelMgmtService, Service_Provider)

template <class T>
T* keyed(const char* tag, const char* class_name) {
  T* instance = T::create(true);
  instance->Tag.set(tag);
  instance->CreationClassName.set(class_name);
  return instance;
}

}  // namespace

Store& store() { return *g_store; }

void reset_store() {
  delete g_store;
  g_store = new Store;
}

NRVTAVO_Card* make_card(const char* tag, const char* model) {
  NRVTAVO_Card* card = keyed<NRVTAVO_Card>(tag, "NRVTAVO_Card");
  card->Model.set(model);
  card->Manufacturer.set("Norvane");
  card->Name.set(std::string("Card ") + tag);
  card->PoweredOn.set(true);
  return card;
}

NRVTAVO_Chip* make_chip(const char* tag) {
  NRVTAVO_Chip* chip = keyed<NRVTAVO_Chip>(tag, "NRVTAVO_Chip");
  chip->Name.set(std::string("Chip ") + tag);
  return chip;
}

NRVTAVO_CardContainsChip* make_link(const char* card_tag, const char* chip_tag) {
  auto* link = NRVTAVO_CardContainsChip::create(true);
  NRVTAVO_Card* card = keyed<NRVTAVO_Card>(card_tag, "NRVTAVO_Card");
  NRVTAVO_Chip* chip = keyed<NRVTAVO_Chip>(chip_tag, "NRVTAVO_Chip");
  set_null_flags(card, false, true, 1);
  set_null_flags(chip, false, true, 1);
  link->GroupComponent = card;
  link->PartComponent = chip;
  link->LocationWithinContainer.set("slot");
  return link;
}

NRVTAVO_ChannelMgmtService* make_service(const char* name) {
  auto* service = NRVTAVO_ChannelMgmtService::create(true);
  service->SystemCreationClassName.set("CIM_ComputerSystem");
  service->SystemName.set("host");
  service->CreationClassName.set("NRVTAVO_ChannelMgmtService");
  service->Name.set(name);
  return service;
}

Provider_Slot card_slot() { return {&card_registration, &card_record}; }
Provider_Slot chip_slot() { return {&chip_registration, &chip_record}; }
Provider_Slot link_slot() { return {&link_registration, &link_record}; }
Provider_Slot service_slot() { return {&service_registration, &service_record}; }

}  // namespace test
