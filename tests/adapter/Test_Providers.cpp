#include "tests/adapter/Test_Providers.h"

#include <span>

#include "framework/Provider_Proc.h"

namespace test {

namespace {

Store* g_store = nullptr;

class Card_Provider : public Provider_Base {
 public:
  int load() { return ++store().loads, LOAD_OK; }
  int unload() { return ++store().unloads, UNLOAD_OK; }
  int get_instance(const Instance* model, Instance*& instance) { return store().cards.get_instance(model, instance); }
  int enum_instances(const Instance*, const Handler& handler) {
    if (store().card_enumeration_result != 0) return store().card_enumeration_result;
    return store().cards.enum_instances(handler);
  }
  int create_instance(Instance* instance) { return store().cards.create_instance(instance); }
  int delete_instance(const Instance* instance) { return store().cards.delete_instance(instance); }
  int modify_instance(const Instance* model, const Instance* instance) {
    return store().cards.modify_instance(model, instance);
  }
};

class Chip_Provider : public Provider_Base {
 public:
  int enum_instances(const Instance*, const Handler& handler) { return store().chips.enum_instances(handler); }
};

class Link_Provider : public Provider_Base {
 public:
  int enum_instances(const Instance*, const Handler& handler) { return store().links.enum_instances(handler); }
  int enum_associators(const Instance* source, const char*, const char*, const char*, const Handler& handler) {
    if (!store().associators_supported) return ENUM_ASSOCIATORS_UNSUPPORTED;
    for (size_t i = 0; i < store().links.size(); ++i) {
      auto* link = static_cast<NRVTAVO_CardContainsChip*>(store().links[i]);
      if (key_eq(link->GroupComponent, source)) handler(clone(store().chips.lookup(link->PartComponent)));
    }
    return ENUM_ASSOCIATORS_OK;
  }
};

class Service_Provider : public Provider_Base {
 public:
  int enum_instances(const Instance*, const Handler& handler) { return store().services.enum_instances(handler); }

  int RequestStateChange(const Instance*, Instance* record) {
    auto* call = static_cast<CIM_EnabledLogicalElement_RequestStateChange_method*>(record);
    store().requested_state_null = call->RequestedState.is_null();
    store().requested_state = call->RequestedState.value;
    store().timeout_null = call->TimeoutPeriod.is_null();
    auto* job = CIM_ConcreteJob::create();
    job->InstanceID.set("NRV:Job:1");
    call->Job = job;
    call->return_value.set(call->RequestedState.is_null() ? 32969 : 0);
    return INVOKE_METHOD_OK;
  }

  int SetCMBandwidths(const Instance*, Instance* record) {
    auto* call = static_cast<NRVTAVO_ChannelMgmtService_SetCMBandwidths_method*>(record);
    auto* target = static_cast<const NRVTAVO_ChannelSettingData*>(call->Target);
    store().target_name = target ? target->InstanceID.value.str() : "";
    std::string list;
    for (uint16 v : call->MinBWValues.value) list += (list.empty() ? "" : ",") + std::to_string(v);
    store().min_bandwidths = call->MinBWValues.is_null() ? "null" : list;
    call->return_value.set(4097);
    return INVOKE_METHOD_OK;
  }

  static std::span<const Method_Entry<Service_Provider>> methods() {
    static const Method_Entry<Service_Provider> kMethods[] = {
        {"RequestStateChange", &Service_Provider::RequestStateChange},
        {"SetCMBandwidths", &Service_Provider::SetCMBandwidths},
    };
    return kMethods;
  }
};

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
