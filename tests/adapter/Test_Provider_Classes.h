// The provider classes of the test provider set (see Test_Providers.h), apart
// so that a test module can register them with the module entry macros.
// Every operation works on store(), which must exist (reset_store) first.
#pragma once

#include <span>
#include <stdexcept>

#include "framework/Provider_Proc.h"
#include "tests/adapter/Test_Providers.h"

namespace test {

// The store, after throwing when the test asked every operation to.
inline Store& serving_store() {
  if (store().throw_in_operations) throw std::runtime_error("test provider fault");
  return store();
}

class Card_Provider : public Provider_Base {
 public:
  int load() { return ++store().loads, LOAD_OK; }
  int unload() { return ++store().unloads, UNLOAD_OK; }
  int get_instance(const Instance* model, Instance*& instance) {
    return serving_store().cards.get_instance(model, instance);
  }
  int enum_instances(const Instance*, const Handler& handler) {
    if (serving_store().card_enumeration_result != 0) return store().card_enumeration_result;
    return store().cards.enum_instances(handler);
  }
  int create_instance(Instance* instance) { return serving_store().cards.create_instance(instance); }
  int delete_instance(const Instance* instance) { return serving_store().cards.delete_instance(instance); }
  int modify_instance(const Instance* model, const Instance* instance) {
    return serving_store().cards.modify_instance(model, instance);
  }
};

class Chip_Provider : public Provider_Base {
 public:
  int enum_instances(const Instance*, const Handler& handler) { return store().chips.enum_instances(handler); }
};

class Link_Provider : public Provider_Base {
 public:
  int enum_instances(const Instance*, const Handler& handler) { return serving_store().links.enum_instances(handler); }
  int enum_associators(const Instance* source, const char*, const char*, const char*, const Handler& handler) {
    if (!serving_store().associators_supported) return ENUM_ASSOCIATORS_UNSUPPORTED;
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
    serving_store();
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
    serving_store();
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

class Job_Provider : public Provider_Base {
 public:
  int get_instance(const Instance* model, Instance*& instance) { return store().jobs.get_instance(model, instance); }
  int enum_instances(const Instance*, const Handler& handler) { return store().jobs.enum_instances(handler); }
  int create_instance(Instance* instance) { return store().jobs.create_instance(instance); }
};

class Capabilities_Provider : public Provider_Base {
 public:
  // Each template comes back as a goal, its ElementName prefixed "goal: ".
  int CreateGoalSettings(const Instance*, Instance* record) {
    auto* call = static_cast<CIM_Capabilities_CreateGoalSettings_method*>(record);
    Array<Instance*> goals;
    for (Instance* setting : call->TemplateGoalSettings) {
      Instance* goal = clone(setting);
      if (is_subclass(&CIM_SettingData::static_meta_class, goal->meta_class)) {
        auto* data = static_cast<CIM_SettingData*>(goal);
        data->ElementName.set("goal: " + data->ElementName.value.str());
      }
      goals.append(goal);
      unref(goal);
    }
    call->SupportedGoalSettings = goals;
    call->return_value.set(0);
    return INVOKE_METHOD_OK;
  }

  static std::span<const Method_Entry<Capabilities_Provider>> methods() {
    static const Method_Entry<Capabilities_Provider> kMethods[] = {
        {"CreateGoalSettings", &Capabilities_Provider::CreateGoalSettings}};
    return kMethods;
  }
};

}  // namespace test
